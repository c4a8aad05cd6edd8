// Fixed-length text fields: the numbered-unit layer and its callers pass texts
// as blank-padded fields of an explicit length, without a terminator.
#pragma once

#include <algorithm>
#include <span>
#include <string_view>

namespace pc {

// The field's text up to its last non-blank character.
inline std::string_view fieldText(std::string_view field) {
  const auto end = field.find_last_not_of(' ');
  return end == std::string_view::npos ? std::string_view{} : field.substr(0, end + 1);
}

// Copies `text` into the field, cut to its length and blank-padded.
inline void setField(std::span<char> field, std::string_view text) {
  const std::size_t n = std::min(field.size(), text.size());
  std::copy_n(text.data(), n, field.data());
  std::fill(field.begin() + static_cast<std::ptrdiff_t>(n), field.end(), ' ');
}

}  // namespace pc
