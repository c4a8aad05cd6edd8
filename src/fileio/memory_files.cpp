#include "fileio/memory_files.h"

#include <map>

#include "platform/platform.h"

namespace pc::fileio {

namespace {

std::map<std::string, std::span<const unsigned char>>& memoryFiles() {
  static std::map<std::string, std::span<const unsigned char>> files;
  return files;
}

}  // namespace

void setMemoryFile(const std::string& name, std::span<const unsigned char> bytes) { memoryFiles()[name] = bytes; }

void clearMemoryFiles() { memoryFiles().clear(); }

std::FILE* openMemoryFile(const std::string& name) {
  const auto& files = memoryFiles();
  if (files.empty()) return nullptr;
  const auto found = files.find(name);
  if (found == files.end()) return nullptr;
  return platform::openMemoryStream(found->second.data(), found->second.size());
}

}  // namespace pc::fileio
