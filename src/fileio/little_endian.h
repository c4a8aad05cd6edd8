// Little-endian encoding of the numbers stored in the suite's binary files,
// independent of the host's byte order.
#pragma once

#include <bit>
#include <cstdint>

namespace pc::fileio {

inline std::uint32_t loadLE32(const unsigned char* p) {
  return static_cast<std::uint32_t>(p[0]) | (static_cast<std::uint32_t>(p[1]) << 8) |
         (static_cast<std::uint32_t>(p[2]) << 16) | (static_cast<std::uint32_t>(p[3]) << 24);
}

inline void storeLE32(unsigned char* p, std::uint32_t v) {
  p[0] = static_cast<unsigned char>(v);
  p[1] = static_cast<unsigned char>(v >> 8);
  p[2] = static_cast<unsigned char>(v >> 16);
  p[3] = static_cast<unsigned char>(v >> 24);
}

inline std::int32_t loadInt32LE(const unsigned char* p) { return std::bit_cast<std::int32_t>(loadLE32(p)); }
inline void storeInt32LE(unsigned char* p, std::int32_t v) { storeLE32(p, std::bit_cast<std::uint32_t>(v)); }

inline void storeInt16LE(unsigned char* p, std::int16_t v) {
  const auto u = std::bit_cast<std::uint16_t>(v);
  p[0] = static_cast<unsigned char>(u);
  p[1] = static_cast<unsigned char>(u >> 8);
}

inline std::int16_t loadInt16LE(const unsigned char* p) {
  return std::bit_cast<std::int16_t>(
      static_cast<std::uint16_t>(static_cast<unsigned>(p[0]) | (static_cast<unsigned>(p[1]) << 8)));
}

inline float loadFloatLE(const unsigned char* p) { return std::bit_cast<float>(loadLE32(p)); }
inline void storeFloatLE(unsigned char* p, float v) { storeLE32(p, std::bit_cast<std::uint32_t>(v)); }

}  // namespace pc::fileio
