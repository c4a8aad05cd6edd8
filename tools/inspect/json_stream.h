// JSON written as it is produced, so that a file of millions of points
// never needs its whole document in memory: containers are opened and
// closed by hand, small values are serialised by nlohmann::json.
#pragma once

#include <cstdio>
#include <string_view>
#include <vector>

#include <nlohmann/json.hpp>

namespace pc::inspect {

class JsonStream {
 public:
  explicit JsonStream(std::FILE* out) : out_(out) {}
  void beginObject(std::string_view key = {});
  void beginArray(std::string_view key = {});
  void end();  // closes the innermost container
  void value(std::string_view key, const nlohmann::json& v);  // key ignored inside arrays
  void element(const nlohmann::json& v) { value({}, v); }

 private:
  void separate(std::string_view key);

  std::FILE* out_;
  struct Level {
    bool array;
    bool first;
  };
  std::vector<Level> stack_;
};

// A point as [x, y] (NaN and infinities as null).
nlohmann::json pointJson(float x, float y);

}  // namespace pc::inspect
