#include "env/work_zone.h"

#include <cctype>

#include "env/diagnostic_channels.h"
#include "env/env_testing.h"
#include "env/path_expander.h"
#include "env/zone_number.h"
#include "platform/platform.h"

namespace pc {

namespace {

constexpr std::size_t kDirectoryBufferSize = 524;

// Decided once per process (single-threaded: plain flags are the guard).
struct WorkZoneState {
  std::optional<std::string> zoneNumber;
  std::optional<std::string> directory;
  // Set while the directory is being decided: a $TMP met in TRXZONE, TRXCONF
  // or TRXTMP themselves is undefined instead of starting over for ever.
  bool deciding = false;
};
WorkZoneState state;

class DecidingGuard {
 public:
  DecidingGuard() { state.deciding = true; }
  ~DecidingGuard() { state.deciding = false; }
  DecidingGuard(const DecidingGuard&) = delete;
  DecidingGuard& operator=(const DecidingGuard&) = delete;
};

bool sameText(std::string_view a, std::string_view b) {
  if (a.size() != b.size()) return false;
  for (std::size_t i = 0; i < a.size(); ++i) {
    if (std::tolower(static_cast<unsigned char>(a[i])) != std::tolower(static_cast<unsigned char>(b[i]))) {
      return false;
    }
  }
  return true;
}

// "$TRXTMP/<number>", expanded. A failed expansion is not kept: the next
// $TMP reference tries again (with the number already known).
std::optional<std::string> directoryName(const std::string& number) {
  const std::string pattern = "$TRXTMP/" + number;
  if (pattern.size() >= kDirectoryBufferSize) return std::nullopt;
  char buffer[kDirectoryBufferSize];
  pattern.copy(buffer, pattern.size());
  buffer[pattern.size()] = '\0';
  if (expandNameInPlace(buffer, sizeof buffer) != EXPAND_OK) return std::nullopt;
  const std::string name = buffer;
  // An empty TRXTMP would put the directory at the root of the file system.
  if (name == std::string(1, platform::nativeSeparator()) + number) return std::nullopt;
  return name;
}

}  // namespace

std::optional<std::string> temporaryDirectory() {
  if (auto fixed = platform::getEnv("TRXTMPDIR")) return fixed;
  if (state.deciding) return std::nullopt;
  if (!state.directory) {
    const DecidingGuard guard;
    if (!state.zoneNumber) state.zoneNumber = zoneNumber();
    if (!state.zoneNumber) return std::nullopt;
    state.directory = directoryName(*state.zoneNumber);
    if (!state.directory) return std::nullopt;
  }
  // Checked at every reference: a directory removed during the run is made
  // again.
  if (!isDirectory(*state.directory) && makeDirectories(*state.directory) != 0) {
    fatal("Could not create temporary directory '" + *state.directory + "'");
    return std::nullopt;
  }
  return state.directory;
}

std::optional<std::string> installationFromExecutable(std::string_view executable,
                                                      std::string_view platformDirectory) {
  std::string path(executable);
  for (char& c : path) {
    if (c == '\\') c = '/';
  }
  const std::string_view expected[] = {{}, platformDirectory, "exe"};
  for (std::string_view component : expected) {
    const std::size_t cut = path.rfind('/');
    if (cut == std::string::npos) return std::nullopt;
    const std::string_view last = std::string_view(path).substr(cut + 1);
    if (last.empty() || (!component.empty() && !sameText(last, component))) return std::nullopt;
    path.resize(cut);
  }
  return path;
}

std::optional<std::string> installationDirectory(bool publish) {
  if (auto home = platform::getEnv("TRXHOME")) return home;
  std::optional<std::string> value = platform::getEnv("TRXHOME_LS");
  if (!value) {
    const auto executable = platform::executablePath();
    if (!executable) return std::nullopt;
    value = installationFromExecutable(*executable, platform::platformDirectoryName());
    if (!value) return std::nullopt;
  }
  if (publish) platform::setEnv("TRXHOME", *value);
  return value;
}

namespace env_testing {
void resetWorkZone() { state = WorkZoneState{}; }
}  // namespace env_testing

}  // namespace pc
