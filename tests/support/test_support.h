// Helpers shared by the test suites: temporary directories, whole-file
// reads and writes, environment overrides and unformatted record files.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace pc::test {

// A fresh directory under the system's temporary directory, removed with
// everything in it when the object goes.
class TempDir {
 public:
  TempDir();
  ~TempDir();
  TempDir(const TempDir&) = delete;
  TempDir& operator=(const TempDir&) = delete;
  const std::string& path() const { return path_; }
  // Joined with the platform's own separator, as the program writes names.
  std::string file(const std::string& name) const;

 private:
  std::string path_;
};

// Sets (or unsets, with nullopt) an environment variable for the scope.
class ScopedEnv {
 public:
  ScopedEnv(std::string name, const std::optional<std::string>& value);
  ~ScopedEnv();
  ScopedEnv(const ScopedEnv&) = delete;
  ScopedEnv& operator=(const ScopedEnv&) = delete;

 private:
  std::string name_;
  std::optional<std::string> old_;
};

void writeFile(const std::string& path, const std::string& bytes);
std::string readFile(const std::string& path);
bool fileExists(const std::string& path);

// Little-endian encoders for building and checking binary files.
void putInt32(std::string& out, std::int32_t v);
void putInt16(std::string& out, std::int16_t v);
void putFloat(std::string& out, float v);
void putDouble(std::string& out, double v);
// One unformatted record: byte count, data, byte count.
std::string framedRecord(const std::string& data);
// A contour information file from (x, y, z) triples, one record each.
std::string contourInfoBytes(const std::vector<std::vector<float>>& records);

}  // namespace pc::test
