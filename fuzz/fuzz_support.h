// Shared set-up of the fuzz targets: a private scratch directory that stands
// for the work zone and its temporary directory, the empty files whose names
// the readers expand (their bytes come from memory), and a quiet console.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <span>
#include <string>

#include "env/diagnostic_channels.h"
#include "fileio/memory_files.h"
#include "platform/platform.h"

namespace pc::fuzz {

// The scratch directory, made on first use: TRXZONE and TRXTMPDIR point at
// it, so that "$TMP/x" and the zone database both name files inside it.
// Never destroyed, so that the exit handler that removes the directory can
// still name it.
inline const std::string& scratchDirectory() {
  static const std::string* dir = [] {
    const auto path = std::filesystem::temp_directory_path() /
                      ("pc_fuzz_" + std::to_string(platform::processId()));
    std::filesystem::create_directories(path);
    platform::setEnv("TRXZONE", path.string());
    platform::setEnv("TRXTMPDIR", path.string());
    std::atexit([] {
      std::error_code ignored;
      std::filesystem::remove_all(scratchDirectory(), ignored);
    });
    return new std::string(path.string());
  }();
  return *dir;
}

// The path of `name` in the scratch directory, created empty so that name
// expansion finds it.
inline std::string placeholderFile(const std::string& name) {
  const std::string path = scratchDirectory() + "/" + name;
  if (!platform::pathExists(path)) std::ofstream(path, std::ios::binary).flush();
  return path;
}

// Makes `data` the content of the scratch file `name` for every reader.
inline void useAsFile(const std::string& name, const std::uint8_t* data, std::size_t size) {
  static const std::uint8_t none = 0;
  fileio::clearMemoryFiles();
  fileio::setMemoryFile(placeholderFile(name), std::span<const unsigned char>(size > 0 ? data : &none, size));
}

// The progress lines and boxed reports of the readers would only slow the
// fuzzer down; the sanitizers report on standard error.
inline void quietConsole() {
  if (std::freopen("/dev/null", "w", stdout) == nullptr) std::abort();
}

// Quiet console, the scratch directory as the installation, and fatal
// messages and warnings that end nothing: the code under test then gives up
// with its own return value, which is what the targets exercise.
inline void ignoreDiagnostic(const char*) {}
inline void detachedDiagnostics() {
  quietConsole();
  platform::setEnv("TRXHOME", scratchDirectory());
  setFatalHandler(ignoreDiagnostic);
  setWarningHandler(ignoreDiagnostic);
}

}  // namespace pc::fuzz
