// File-system tests used by expansion and the work zone.
#include <cctype>

#include "env/separators.h"
#include "env/work_zone.h"
#include "platform/platform.h"

namespace pc {

namespace {

bool sameLetter(char a, char b) {
  return std::tolower(static_cast<unsigned char>(a)) == std::tolower(static_cast<unsigned char>(b));
}

// A prefix ending before the first separator that names a root ("" before a
// leading separator, or a drive "X:") needs no test and no creation.
bool isRootPrefix(std::string_view prefix) { return prefix.empty() || prefix.back() == ':'; }

bool createdOrPresent(const std::string& name) {
  switch (platform::createDirectory(name)) {
    case platform::DirectoryCreation::created:
    case platform::DirectoryCreation::alreadyExists:
    case platform::DirectoryCreation::accessDenied:
      return true;
    case platform::DirectoryCreation::failed:
      break;
  }
  return false;
}

}  // namespace

bool wildcardMatch(std::string_view pattern, std::string_view text) {
  // Greedy match with one back-tracking point (the last '*'): linear in
  // practice and never exponential.
  std::size_t p = 0;
  std::size_t t = 0;
  std::size_t star = std::string_view::npos;
  std::size_t resume = 0;
  while (t < text.size()) {
    if (p < pattern.size() && pattern[p] == '*') {
      star = p++;
      resume = t;
    } else if (p < pattern.size() && (pattern[p] == '?' || sameLetter(pattern[p], text[t]))) {
      ++p;
      ++t;
    } else if (star != std::string_view::npos) {
      p = star + 1;
      t = ++resume;
    } else {
      return false;
    }
  }
  while (p < pattern.size() && pattern[p] == '*') ++p;
  return p == pattern.size();
}

bool fileExists(const std::string& name) {
  if (name.empty()) return false;
  const std::size_t cut = name.find_last_of("/\\");
  const std::string_view pattern = cut == std::string::npos ? std::string_view(name) : std::string_view(name).substr(cut + 1);
  if (pattern.find_first_of("*?") == std::string_view::npos) return platform::pathExists(name);
  std::string directory = cut == std::string::npos ? std::string(".") : name.substr(0, cut);
  if (directory.empty()) directory = std::string(1, platform::nativeSeparator());
  // Patterns are matched in the last component only.
  if (directory.find_first_of("*?") != std::string::npos) return false;
  for (const std::string& entry : platform::listDirectory(directory)) {
    if (wildcardMatch(pattern, entry)) return true;
  }
  return false;
}

bool isDirectory(const std::string& name) {
  std::string reduced = name;
  normaliseSeparators(reduced);
  return platform::isDirectory(reduced);
}

int makeDirectories(const std::string& name) {
  std::string path = name;
  normaliseSeparators(path);
  if (path.empty()) return -1;
  const char separator = platform::nativeSeparator();
  bool creating = false;
  for (std::size_t at = path.find(separator); at != std::string::npos; at = path.find(separator, at + 1)) {
    const std::string prefix = path.substr(0, at);
    if (isRootPrefix(prefix)) continue;
    if (!creating && platform::isDirectory(prefix)) continue;
    creating = true;
    if (!createdOrPresent(prefix)) return -1;
  }
  if (platform::isDirectory(path)) return 0;
  createdOrPresent(path);
  // Success means the directory is there: a refused creation of the last
  // level must not pass for a usable directory.
  return platform::isDirectory(path) ? 0 : -1;
}

bool isExistingFile(const std::string& name) {
  return !name.empty() && platform::pathExists(name) && !platform::isDirectory(name);
}

bool isExistingDirectory(const std::string& name) { return !name.empty() && platform::isDirectory(name); }

}  // namespace pc
