// Path expansion of an arbitrary name and environment: the input's first
// line is the value of the variable FUZZ (referenced as $FUZZ, $(FUZZ),
// ${FUZZ} or ?FUZZ), the rest the name to expand through every entry point.
#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

#include "env/path_expander.h"
#include "fuzz_support.h"

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  pc::fuzz::detachedDiagnostics();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::string_view input(reinterpret_cast<const char*>(data), size);
  const std::size_t lineEnd = input.find('\n');
  std::string value(input.substr(0, lineEnd));
  const std::string_view name = lineEnd == std::string_view::npos ? std::string_view{} : input.substr(lineEnd + 1);
  // The environment holds no NUL.
  value.resize(value.find('\0') == std::string::npos ? value.size() : value.find('\0'));
  pc::platform::setEnv("FUZZ", value);

  std::array<char, 512> field;
  pc::expandText(name, field);
  pc::expandPath(name, field);
  pc::expandFileName(name, field);
  std::string terminated(name.substr(0, name.find('\0')));
  std::array<char, 512> out;
  pc::expandName(terminated.c_str(), out.data(), out.size());
  terminated.resize(std::min<std::size_t>(terminated.size(), 511));
  std::array<char, 512> inPlace{};
  terminated.copy(inPlace.data(), terminated.size());
  pc::expandNameInPlace(inPlace.data(), inPlace.size());
  return 0;
}
