#include "env/separators.h"

#include "platform/platform.h"

namespace pc {

void normaliseSeparators(std::string& text) { normaliseSeparators(text, platform::nativeSeparator()); }

void normaliseSeparators(std::string& text, char separator) {
  const char foreign = separator == '/' ? '\\' : '/';
  std::size_t out = 0;
  for (std::size_t in = 0; in < text.size(); ++in) {
    const char c = text[in] == foreign ? separator : text[in];
    // A run collapses anywhere, the start included: "//server" loses its
    // second separator too.
    if (c == separator && out > 0 && text[out - 1] == separator) continue;
    text[out++] = c;
  }
  text.resize(out);
}

}  // namespace pc
