// The layers of the configuration: the installation's own file, then the
// files of the ?ENV directories, the first directory of the list last so
// that it has the last word.
#include "env/configuration_loader.h"

#include <array>
#include <optional>
#include <unordered_set>
#include <vector>

#include "env/configuration_loader_internal.h"
#include "env/configuration_loader_syntax.h"
#include "env/diagnostic_channels.h"
#include "env/path_expander.h"
#include "env/reference_scanner.h"
#include "env/separators.h"
#include "env/work_zone.h"
#include "platform/platform.h"

namespace pc {

namespace {

enum class LoadState { NotLoaded, Loading, Loaded };
LoadState loadState = LoadState::NotLoaded;

constexpr const char* configurationFileName = "environ.cfg";

std::optional<ConfigurationValue> configurationLookup(std::string_view section, std::string_view key) {
  MessageTable* table = tableBeingRead();
  if (table == nullptr) {
    // A lookup made while the layers are being loaded never starts the
    // loading again: it sees the table as loaded so far.
    if (loadState == LoadState::NotLoaded) loadEnvironment();
    table = environmentTable();
  }
  const int number = findSection(table, section);
  if (number < 0) return std::nullopt;
  return lookupWithOrigin(table, number, key);
}

// Expands `text` with normalised separators into a result as long as it
// needs to be (a long ?ENV list passes any fixed buffer). A failure is
// reported as expandName reports it.
int expandToNeed(const std::string& text, std::string& result) {
  const int code = substituteReferences(text, result);
  if (isHardExpansionError(code)) {
    result.clear();
    std::array<char, 4096> report;
    expandName(text.c_str(), report.data(), report.size());
    return code;
  }
  normaliseSeparators(result);
  return code;
}

// The directories of ?ENV; nullopt (after the fatal message) when it
// cannot be expanded.
std::optional<std::vector<std::string>> environmentDirectories() {
  std::string list;
  if (expandToNeed("?ENV", list) != EXPAND_OK) {
    fatal("Error evaluation '?ENV' path\n");
    return std::nullopt;
  }
  return splitDirectoryList(list, platform::nativeSeparator());
}

// Loads one directory's file; false when the loading has to stop.
bool loadDirectory(const std::string& directory) {
  const std::string file = directory + configurationFileName;
  trace("loading configuration file '" + file + "'");
  const LoadOutcome outcome = loadMessagesFile(environmentTable(), file.c_str());
  if (outcome.gaveUp) return false;  // the table keeps what it had
  environmentTable() = outcome.table;
  if (outcome.table == nullptr) {
    fatal("Error loading '" + file + "'\n");
    return false;
  }
  return true;
}

// The entries that tell the files which platform they are read on.
void setProgramEntries() {
  MessageTable* table = environmentTable();
  const int section = findSection(table, "var");
  if (section < 0) return;
  const bool previous = setParameterMode(false);
  set_parameter(table, section, std::string(platform::platformConfigurationVariable()) + " = 1");
  set_parameter(table, section, "PC = 1");
  setParameterMode(previous);
}

bool loadLayers() {
  const std::optional<std::string> home = installationDirectory(true);
  if (!home) {
    fatal("The environment variable 'TRXHOME' is not defined\n");
    return false;
  }
  const std::string configuration = configurationDirectoryOf(*home, platform::nativeSeparator());
  if (!loadDirectory(configuration)) return false;
  std::unordered_set<std::string> loaded{foldedText(configuration)};
  setProgramEntries();

  std::optional<std::vector<std::string>> list = environmentDirectories();
  if (!list) return false;
  // The directories just before the configuration directory, as long as
  // they lie inside it, and the first one outside it.
  if (list->size() >= 2) {
    for (std::size_t i = list->size() - 1; i-- > 0;) {
      const std::string& directory = (*list)[i];
      if (!loadDirectory(directory)) return false;
      loaded.insert(foldedText(directory));
      if (!sameTextIgnoringCase(std::string_view(directory).substr(0, configuration.size()), configuration)) break;
    }
  }

  // The files just loaded may have changed the list.
  list = environmentDirectories();
  if (!list) return false;
  while (!list->empty() && loaded.count(foldedText(list->back())) != 0) list->pop_back();
  std::string joined;
  for (const std::string& directory : *list) {
    if (!joined.empty()) joined += ',';
    joined += directory;
  }
  environmentTable() = loadConfigurationList(environmentTable(), joined, configurationFileName);
  return true;
}

}  // namespace

MessageTable*& tableBeingRead() {
  static MessageTable* table = nullptr;
  return table;
}

void installConfigurationLoader() { setConfigurationLookup(configurationLookup); }

void loadEnvironment() {
  if (loadState != LoadState::NotLoaded) return;
  loadState = LoadState::Loading;
  trace("LOADING ENVIRONMENT FILES ....");
  const bool loaded = loadLayers();
  loadState = LoadState::Loaded;
  if (loaded) trace("LOADING ENVIRONMENT FILES ....done.");
}

void loadConfigurationDirectory(const std::string& directory) { loadDirectory(directory); }

MessageTable* loadConfigurationList(MessageTable* table, std::string_view directoryList, std::string_view fileName) {
  std::string list;
  expandToNeed(std::string(directoryList), list);  // a list that fails to expand names no file
  std::string name;
  if (isHardExpansionError(expandToNeed(std::string(fileName), name))) name = fileName;
  for (const std::string& file : listFilesFromEnd(list, name, platform::nativeSeparator())) {
    trace("Overloading '" + file + "'\n");
    const LoadOutcome outcome = loadMessagesFile(table, file.c_str());
    if (outcome.gaveUp) break;
    table = outcome.table;
  }
  return table != nullptr ? table : createTable();
}

namespace env_testing {
void resetConfigurationLoader() {
  destroyTable(environmentTable());
  environmentTable() = nullptr;
  loadState = LoadState::NotLoaded;
}
}  // namespace env_testing

}  // namespace pc
