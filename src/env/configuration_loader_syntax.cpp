#include "env/configuration_loader_syntax.h"

namespace pc {

namespace {

bool startsWith(std::string_view text, std::string_view prefix) { return text.substr(0, prefix.size()) == prefix; }

bool isNameByte(char c) {
  const auto byte = static_cast<unsigned char>(c);
  return byte >= 0x21 && byte <= 0x7F;
}

std::string_view skipBlanks(std::string_view text) {
  std::size_t start = 0;
  while (start < text.size() && isConfigurationBlank(text[start])) ++start;
  return text.substr(start);
}

// The run of name bytes at the start of `text`, removed from it.
std::string_view takeWord(std::string_view& text) {
  std::size_t end = 0;
  while (end < text.size() && isNameByte(text[end])) ++end;
  const std::string_view word = text.substr(0, end);
  text.remove_prefix(end);
  return word;
}

// Trimmed of 0x01 to 0x20 only: a NUL cannot reach here from a line.
std::string_view trimPiece(std::string_view piece) { return stripConfigurationBlanks(piece); }

char fold(char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c; }

}  // namespace

std::string_view stripConfigurationBlanks(std::string_view text) {
  text = skipBlanks(text);
  std::size_t end = text.size();
  while (end > 0 && isConfigurationBlank(text[end - 1])) --end;
  return text.substr(0, end);
}

void cutComment(std::string& line) {
  std::size_t write = 0;
  for (std::size_t read = 0; read < line.size(); ++read) {
    if (line[read] == '#') {
      if (read + 1 >= line.size() || line[read + 1] != '#') break;
      ++read;  // "##" stands for one '#'
    }
    line[write++] = line[read];
  }
  line.resize(write);
}

ConfigurationLine classifyLine(std::string_view line) {
  if (line.size() >= 1 && line[0] == '/' && (line.size() < 2 || line[1] != '/')) {
    const std::string_view keyword = line.substr(1);
    if (startsWith(keyword, "if")) return ConfigurationLine::If;
    if (startsWith(keyword, "else")) return ConfigurationLine::Else;
    if (startsWith(keyword, "endif")) return ConfigurationLine::Endif;
    return ConfigurationLine::UnknownKeyword;
  }
  if (!line.empty() && line[0] == '[') return ConfigurationLine::Section;
  return ConfigurationLine::Entry;
}

std::string_view sectionNameOf(std::string_view line) {
  line.remove_prefix(1);
  return line.substr(0, line.find(']'));
}

ConditionParts parseCondition(std::string_view condition) {
  condition = skipBlanks(condition);
  while (!condition.empty() &&
         (isConfigurationBlank(condition.back()) || condition.back() == ')' || condition.back() == '}')) {
    condition.remove_suffix(1);
  }
  if (!condition.empty() && (condition[0] == '(' || condition[0] == '{')) condition.remove_prefix(1);
  // Blanks inside the brackets are allowed as well: "( NAME )".
  condition = skipBlanks(condition);
  ConditionParts parts;
  parts.name = takeWord(condition);
  condition = skipBlanks(condition);
  parts.op = takeWord(condition);
  parts.text = skipBlanks(condition);
  return parts;
}

SkippedLine classifySkippedLine(std::string_view line) {
  line = skipBlanks(line);
  if (startsWith(line, "/if")) return SkippedLine::If;
  if (startsWith(line, "/else")) return SkippedLine::Else;
  if (startsWith(line, "/endif")) return SkippedLine::Endif;
  return SkippedLine::Other;
}

std::vector<std::string> splitDirectoryList(std::string_view list, char separator) {
  std::vector<std::string> directories;
  while (true) {
    const std::size_t cut = list.find_first_of(";,");
    const std::string_view piece = trimPiece(list.substr(0, cut));
    if (!piece.empty()) {
      std::string directory(piece);
      if (directory.back() != '/' && directory.back() != '\\') directory += separator;
      directories.push_back(std::move(directory));
    }
    if (cut == std::string_view::npos) break;
    list.remove_prefix(cut + 1);
  }
  return directories;
}

std::vector<std::string> listFilesFromEnd(std::string_view list, std::string_view fileName, char separator) {
  std::vector<std::string> files;
  std::size_t end = list.size();
  while (true) {
    const std::size_t cut = end == 0 ? std::string_view::npos : list.find_last_of(";,", end - 1);
    const std::size_t start = cut == std::string_view::npos ? 0 : cut + 1;
    std::string_view piece = trimPiece(list.substr(start, end - start));
    // An empty piece would name the file at the root of the file system.
    if (!piece.empty()) {
      const char last = piece.back();
      if (last == '\\' || last == '/' || last == ' ') piece.remove_suffix(1);
      std::string file(piece);
      file += separator;
      file += fileName;
      files.push_back(std::move(file));
    }
    if (cut == std::string_view::npos) break;
    end = cut;
  }
  return files;
}

std::string configurationDirectoryOf(std::string_view home, char separator) {
  if (!home.empty() && (home.back() == '/' || home.back() == '\\')) home.remove_suffix(1);
  std::string directory(home);
  directory += separator;
  directory += "config";
  directory += separator;
  return directory;
}

bool sameTextIgnoringCase(std::string_view a, std::string_view b) {
  if (a.size() != b.size()) return false;
  for (std::size_t i = 0; i < a.size(); ++i) {
    if (fold(a[i]) != fold(b[i])) return false;
  }
  return true;
}

std::string foldedText(std::string_view text) {
  std::string folded(text);
  for (char& c : folded) c = fold(c);
  return folded;
}

}  // namespace pc
