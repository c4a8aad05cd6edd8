// The work zone's tool database "zone.inf" through the read queries: header,
// record walk in both byte orders, formats and the fields of every kind the
// queries read, under the real zone lock.
#include <cstddef>
#include <cstdint>
#include <span>

#include "fuzz_support.h"
#include "zonedb/zone_database.h"

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  pc::fuzz::quietConsole();
  pc::fuzz::scratchDirectory();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  pc::fuzz::useAsFile("zone.inf", data, size);
  float scale = 0.0f;
  pc::zoneRealValue(6, scale);
  char text[60];
  pc::zoneTextValue(31, std::span<char>(text, sizeof text));  // the stock allowance
  // The text of an integer, two integers, a real or a numbered item, chosen
  // by the input's length so that the bytes stay a plain database file.
  constexpr int kOthers[] = {105, 109, 106, 113};
  pc::zoneTextValue(kOthers[size % 4], std::span<char>(text, sizeof text));
  return 0;
}
