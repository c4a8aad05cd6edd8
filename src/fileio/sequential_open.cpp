// Opening numbered-unit files by a name written with path variables.
//
// Error codes of opensq:
//   0  success
//   1  the name is empty (modes 2 and 3), or the open itself failed
//   2  mode 2: the existing file could not be deleted
//   3  mode 1: the file does not exist, or the name is empty
//   4  mode 3: positioning at the end failed
//   5  modes 1 and 2: positioning at the start failed
#include "fileio/sequential_open.h"

#include <array>
#include <climits>
#include <cstdint>
#include <string>

#include "env/fixed_field.h"
#include "env/path_expander.h"
#include "fileio/record_runtime.h"
#include "fileio/runtime_fatal.h"
#include "platform/platform.h"

namespace pc::fileio {

namespace {

constexpr std::size_t kNameField = 512;
constexpr std::size_t kDeleteField = 511;
// Names are cut to this many characters in fatal reports.
constexpr std::size_t kReportedName = 64;

enum OpenCode { kOk = 0, kOpenFailed = 1, kDeleteFailed = 2, kMissing = 3, kAppendFailed = 4, kRewindFailed = 5 };

struct Expanded {
  int code = EXPAND_OK;
  std::string name;
};

Expanded expandForSearch(std::string_view name) {
  std::array<char, kNameField> field;
  field.fill(' ');
  Expanded result;
  result.code = expandFileName(name, field);
  result.name = std::string(fieldText(std::string_view(field.data(), field.size())));
  return result;
}

std::string reportedName(const std::string& name) {
  return std::string(fieldText(std::string_view(name).substr(0, kReportedName)));
}

// The mode's absolute value, kept in range for a report of any int.
int modeMagnitude(int mode) {
  const std::int64_t m = mode < 0 ? -static_cast<std::int64_t>(mode) : mode;
  return m > INT_MAX ? INT_MAX : static_cast<int>(m);
}

// Reads to the end of a formatted unit and steps back before it, so that the
// next write appends.
int positionAtEnd(int unit) {
  std::string record;
  while (readTextRecord(unit, record) == kIoOk) {
  }
  return backspaceUnit(unit) == kIoOk ? kOk : kAppendFailed;
}

int openFormatted(int unit, const std::string& name, int m) {
  if (name.empty()) return m == 1 ? kMissing : kOpenFailed;
  const bool existed = namedFileExists(name);
  if (m == 1 && !existed) return kMissing;
  const UnitUse use = m == 1 ? UnitUse::Read : UnitUse::ReadWrite;
  if (openUnit(unit, name, OpenDisposition::Unknown, FileForm::Formatted, use) != kIoOk) return kOpenFailed;
  if (m == 3) return positionAtEnd(unit);
  if (m == 2 && existed) {
    if (closeUnit(unit, true) != kIoOk) return kDeleteFailed;
    if (openUnit(unit, name, OpenDisposition::New, FileForm::Formatted) != kIoOk) return kOpenFailed;
  }
  return rewindUnit(unit) == kIoOk ? kOk : kRewindFailed;
}

}  // namespace

int freeUnit() {
  for (int unit = 3; unit < INT_MAX; ++unit) {
    if (!isUnitOpen(unit)) return unit;
  }
  return -1;
}

bool filePresent(std::string_view name) { return expandForSearch(name).code == EXPAND_OK; }

int opensq(int unit, std::string_view name, int mode) {
  const Expanded expanded = expandForSearch(name);
  const int m = modeMagnitude(mode);
  if (m < 1 || m > 3) {
    fatalError("opensq(" + reportedName(expanded.name) + ")", "mode=%", m);
  }
  const int code = openFormatted(unit, expanded.name, m);
  if (code == kOk) return kOk;
  if (mode < 0) {
    // The values go into the fixed part only: a '%' in the name stays a '%'.
    const int values[] = {m, code};
    const std::string message =
        "Fichier " + reportedName(expanded.name) + fatalMessageText(" iomode= %, err= %", values);
    fatalErrorValues("opensq", message, {});
  }
  if (isUnitOpen(unit)) closeUnit(unit);
  return code;
}

int openUnformatted(int unit, std::string_view name, int mode, RefusedOpen onRefusal) {
  const Expanded expanded = expandForSearch(name);
  int status = kIoOk;
  if (mode == 2) {
    // A name that did not expand (undefined variable, bad syntax) has no file
    // to replace: nothing is created, and the caller sees the code.
    if (expanded.code != EXPAND_OK && expanded.code != EXPAND_NOT_FOUND) return expanded.code;
    deleteFile(expanded.name);
    status = openUnit(unit, expanded.name, OpenDisposition::New, FileForm::Unformatted);
  } else {
    if (expanded.code != EXPAND_OK) return expanded.code;
    status = openUnit(unit, expanded.name, OpenDisposition::Old, FileForm::Unformatted, UnitUse::Read);
  }
  if (status != kIoOk && onRefusal == RefusedOpen::ReturnStatus) return status;
  if (status != kIoOk) {
    // The name was good but the system refused the file: the run cannot go on.
    const int values[] = {mode, status};
    const std::string message =
        "Fichier " + reportedName(expanded.name) + fatalMessageText(" iomode= %, err= %", values);
    fatalErrorValues("openUnformatted", message, {});
  }
  return expanded.code;
}

int deleteFile(std::string_view name) {
  std::array<char, kDeleteField> field;
  field.fill(' ');
  const int code = expandPath(name, field);
  std::string target(fieldText(std::string_view(field.data(), field.size())));
  if (target.find(',') != std::string::npos) {
    const Expanded again = expandForSearch(target);
    if (again.code != EXPAND_OK) return again.code;
    target = again.name;
  } else if (code != EXPAND_OK && code != EXPAND_UNDEFINED) {
    return code;
  }
  while (!target.empty() && static_cast<unsigned char>(target.back()) <= 0x20) target.pop_back();
  return platform::removeFile(target) ? EXPAND_OK : EXPAND_NOT_FOUND;
}

}  // namespace pc::fileio
