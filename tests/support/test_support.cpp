#include "support/test_support.h"

#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <sstream>

#include "platform/platform.h"

namespace pc::test {

TempDir::TempDir() {
  // A name nobody else holds: the creation itself decides, as mkdtemp does.
  static unsigned serial = 0;
  const std::filesystem::path base = std::filesystem::temp_directory_path();
  for (int attempt = 0; attempt < 1000; ++attempt) {
    const std::string name = "pc-test-" + std::to_string(platform::processId()) + "-" + std::to_string(++serial);
    const std::string candidate = (base / name).string();
    if (platform::createDirectory(candidate) == platform::DirectoryCreation::created) {
      path_ = candidate;
      return;
    }
  }
  std::abort();
}

TempDir::~TempDir() {
  std::error_code ec;
  std::filesystem::remove_all(path_, ec);
}

std::string TempDir::file(const std::string& name) const { return path_ + platform::nativeSeparator() + name; }

ScopedEnv::ScopedEnv(std::string name, const std::optional<std::string>& value) : name_(std::move(name)) {
  if (const char* old = std::getenv(name_.c_str())) old_ = old;
  if (value) {
    platform::setEnv(name_, *value);
  } else {
    platform::unsetEnv(name_);
  }
}

ScopedEnv::~ScopedEnv() {
  if (old_) {
    platform::setEnv(name_, *old_);
  } else {
    platform::unsetEnv(name_);
  }
}

void writeFile(const std::string& path, const std::string& bytes) {
  std::ofstream out(path, std::ios::binary | std::ios::trunc);
  out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
}

std::string readFile(const std::string& path) {
  std::ifstream in(path, std::ios::binary);
  return std::string(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
}

bool fileExists(const std::string& path) { return std::filesystem::exists(path); }

namespace {
template <typename T>
void putRaw(std::string& out, T v) {
  char bytes[sizeof(T)];
  std::memcpy(bytes, &v, sizeof(T));  // the test machines are little-endian
  out.append(bytes, sizeof(T));
}
}  // namespace

void putInt32(std::string& out, std::int32_t v) { putRaw(out, v); }
void putInt16(std::string& out, std::int16_t v) { putRaw(out, v); }
void putFloat(std::string& out, float v) { putRaw(out, v); }
void putDouble(std::string& out, double v) { putRaw(out, v); }

std::string framedRecord(const std::string& data) {
  std::string out;
  putInt32(out, static_cast<std::int32_t>(data.size()));
  out += data;
  putInt32(out, static_cast<std::int32_t>(data.size()));
  return out;
}

std::string contourInfoBytes(const std::vector<std::vector<float>>& records) {
  std::string out;
  for (const auto& r : records) {
    std::string data;
    for (float v : r) putFloat(data, v);
    out += framedRecord(data);
  }
  return out;
}

}  // namespace pc::test
