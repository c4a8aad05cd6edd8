#include "output/pocket_result_file.h"

#include <charconv>
#include <cstdio>

#include "output/fixed_format.h"
#include "output/lost_output.h"
#include "output/outline_check.h"
#include "output/outline_list.h"
#include "output/outline_writer.h"
#include "output/output_file.h"

namespace pc {

namespace {

void writeHeaderLine(OutputFile& file) {
  char* p = file.reserve(4 * kMaxFixedFieldChars);
  p = formatFixed3(p, kSeparatorValue, 10);
  p = formatInteger(p, 0, 10);
  p = formatInteger(p, 0, 10);
  p = formatInteger(p, 0, 6);
  *p++ = '\n';
  file.commit(p);
}

void closeOrLose(OutputFile& file) {
  if (!file.close()) reportLostOutput(kPocketResultFileName, kPocketResultFileMode);
}

}  // namespace

namespace {

constexpr std::size_t kResultLineChars = 36;

// A right-aligned field: blanks, then a number that fills the rest.
template <typename T>
bool parseField(std::string_view field, T& value) {
  const std::size_t first = field.find_first_not_of(' ');
  if (first == std::string_view::npos) return false;
  const char* end = field.data() + field.size();
  const auto [stop, error] = std::from_chars(field.data() + first, end, value);
  return error == std::errc{} && stop == end;
}

}  // namespace

bool parseResultLine(std::string_view line, bool firstLine, ResultLine& out, std::string& expected) {
  if (!line.empty() && line.back() == '\r') line.remove_suffix(1);
  if (line.size() != kResultLineChars) {
    expected = "a line of 36 characters (fields of 10, 10, 10 and 6), found " + std::to_string(line.size());
    return false;
  }
  if (firstLine) {
    std::int32_t a = -1, b = -1, c = -1;
    double mark = 0.0;
    if (!parseField(line.substr(0, 10), mark) || mark != 99999.0 || !parseField(line.substr(10, 10), a) ||
        !parseField(line.substr(20, 10), b) || !parseField(line.substr(30, 6), c) || a != 0 || b != 0 || c != 0) {
      expected = "the header line 99999.000 0 0 0";
      return false;
    }
    out = ResultLine{ResultLineKind::Header, mark, 0.0, 0.0, 0};
    return true;
  }
  if (!parseField(line.substr(0, 10), out.x) || !parseField(line.substr(10, 10), out.y) ||
      !parseField(line.substr(20, 10), out.z) || !parseField(line.substr(30, 6), out.code)) {
    expected = "three numbers of 10 characters and a code of 6";
    return false;
  }
  switch (out.code) {
    case kPointLineCode: out.kind = ResultLineKind::Point; return true;
    case kSeparatorLineCode: out.kind = ResultLineKind::Separator; return true;
    case kPocketEndCode: out.kind = ResultLineKind::PocketEnd; return true;
    default: break;
  }
  expected = "the code -1003 (point), 9999 (separator) or -1004 (pocket end), found " + std::to_string(out.code);
  return false;
}

int writePocketResultFile(const CheckedArray<Pocket*>& pockets) {
  if (pockets.count < 1) return 0;
  CheckedArray<Point> outline = makeOutlineList(pockets);

  std::printf("\n");
  std::printf(" OUTPUT : %s\n", kPocketResultFileName);
  OutputFile file;
  if (!file.open(kPocketResultFileName, kPocketResultFileMode)) {
    reportLostOutput(kPocketResultFileName, kPocketResultFileMode);
  }
  writeHeaderLine(file);

  SeparatorState state;
  const bool checked = writeCheckedOutlines(pockets, outline, [&](float z) {
    writeOutlinePoints(file, outline.data, outline.count, z, kPointLineCode, state);
    writeResultLine(file, kSeparatorValue, kSeparatorValue, kSeparatorValue, kPocketEndCode);
  });
  closeOrLose(file);
  return checked ? 0 : -1;
}

}  // namespace pc
