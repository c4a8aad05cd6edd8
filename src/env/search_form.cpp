#include "env/search_form.h"

#include "env/path_expander.h"
#include "env/reference_scanner.h"
#include "env/separators.h"
#include "env/work_zone.h"

namespace pc {

namespace {

bool isBlankByte(char c) {
  const auto b = static_cast<unsigned char>(c);
  return b >= 0x01 && b <= 0x20;
}

std::string candidate(const std::string& directory, const std::string& file) {
  std::string name = directory.empty() ? file : directory + "/" + file;
  normaliseSeparators(name);
  return name;
}

}  // namespace

std::vector<std::string> splitDirectoryList(std::string_view list) {
  std::vector<std::string> entries;
  std::size_t start = 0;
  while (start <= list.size()) {
    std::size_t end = list.find_first_of(";,", start);
    if (end == std::string_view::npos) end = list.size();
    std::size_t first = start;
    std::size_t last = end;
    while (first < last && isBlankByte(list[first])) ++first;
    while (last > first && isBlankByte(list[last - 1])) --last;
    // A piece of blanks only is as empty as no piece: it must not turn into
    // a search of the current directory.
    if (last > first) entries.emplace_back(list.substr(first, last - first));
    start = end + 1;
  }
  return entries;
}

int expandSearchForm(std::string_view name, std::string& result) {
  result.clear();
  if (name.empty()) return EXPAND_NOT_FOUND;

  std::string_view listPart;
  std::string_view filePart = name;
  const std::size_t sigil = name.find('?');
  if (sigil != std::string_view::npos) {
    const std::size_t separator = name.find_first_of("/\\", sigil + 1);
    if (separator == std::string_view::npos) return EXPAND_INVALID_ARGUMENT;
    listPart = name.substr(0, separator);
    filePart = name.substr(separator + 1);
  }

  std::string list;
  int code = substituteReferences(listPart, list);
  if (code != EXPAND_OK) return code;
  std::string file;
  code = substituteReferences(filePart, file);
  if (code != EXPAND_OK) return code;
  normaliseSeparators(file);

  std::vector<std::string> directories = splitDirectoryList(list);
  if (directories.empty()) directories.emplace_back();
  for (const std::string& directory : directories) {
    std::string path = candidate(directory, file);
    if (isExistingFile(path) || isExistingDirectory(path)) {
      result = std::move(path);
      return EXPAND_OK;
    }
  }
  // The first directory is where a caller that creates the file puts it.
  result = candidate(directories.front(), file);
  return EXPAND_NOT_FOUND;
}

}  // namespace pc
