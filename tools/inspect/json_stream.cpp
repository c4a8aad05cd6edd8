#include "json_stream.h"

#include <string>

#include "report.h"

namespace pc::inspect {

void JsonStream::separate(std::string_view key) {
  if (stack_.empty()) return;
  Level& level = stack_.back();
  if (!level.first) std::fputc(',', out_);
  level.first = false;
  std::fputc('\n', out_);
  if (!level.array) {
    const std::string k = nlohmann::json(std::string(key)).dump();
    std::fprintf(out_, "%s:", k.c_str());
  }
}

void JsonStream::beginObject(std::string_view key) {
  separate(key);
  std::fputc('{', out_);
  stack_.push_back(Level{false, true});
}

void JsonStream::beginArray(std::string_view key) {
  separate(key);
  std::fputc('[', out_);
  stack_.push_back(Level{true, true});
}

void JsonStream::end() {
  if (stack_.empty()) return;
  const bool array = stack_.back().array;
  stack_.pop_back();
  std::fputc(array ? ']' : '}', out_);
  if (stack_.empty()) std::fputc('\n', out_);
}

void JsonStream::value(std::string_view key, const nlohmann::json& v) {
  separate(key);
  const std::string text = v.dump(-1, ' ', false, nlohmann::json::error_handler_t::replace);
  std::fputs(text.c_str(), out_);
}

nlohmann::json pointJson(float x, float y) { return nlohmann::json::array({number(x), number(y)}); }

}  // namespace pc::inspect
