// Builds "zone.inf" images in either byte order for the zone database tests.
#pragma once

#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

namespace pc::test {

struct ZoneBytes {
  bool bigEndian = false;

  std::string number(std::uint64_t value, int size) const {
    std::string out(static_cast<std::size_t>(size), '\0');
    for (int i = 0; i < size; ++i) {
      const int at = bigEndian ? size - 1 - i : i;
      out[static_cast<std::size_t>(at)] = static_cast<char>((value >> (8 * i)) & 0xff);
    }
    return out;
  }
  std::string u16(std::uint16_t v) const { return number(v, 2); }
  std::string u32(std::uint32_t v) const { return number(v, 4); }
  std::string i32(std::int32_t v) const { return number(static_cast<std::uint32_t>(v), 4); }
  std::string real(float v) const {
    std::uint32_t raw;
    std::memcpy(&raw, &v, 4);
    return number(raw, 4);
  }
  std::string dbl(double v) const {
    std::uint64_t raw;
    std::memcpy(&raw, &v, 8);
    return number(raw, 8);
  }
  static std::string text(const std::string& s) { return std::string(1, static_cast<char>(s.size())) + s; }

  // Record data: format text, NUL, state, code, values.
  static std::string record(const std::string& format, char state, const std::string& code,
                            const std::string& values) {
    return format + std::string(1, '\0') + state + code + values;
  }

  // 160-byte header whose first record is at `first`.
  std::string header(std::uint32_t count, std::uint32_t first = 160, unsigned char flag154 = 1) const {
    std::string h = bigEndian ? "BTZQ" : "QZTB";
    h += u32(0) + u32(first) + u32(first) + u32(count) + u32(0);
    h += "zone header text";
    h.resize(160, '\0');
    h[152] = 1;
    h[153] = 1;
    h[154] = static_cast<char>(flag154);
    return h;
  }

  std::string framed(const std::string& data) const { return u16(static_cast<std::uint16_t>(data.size())) + u16(0) + data; }

  std::string file(const std::vector<std::string>& records) const {
    std::string out = header(static_cast<std::uint32_t>(records.size()));
    for (const auto& r : records) out += framed(r);
    return out;
  }
};

}  // namespace pc::test
