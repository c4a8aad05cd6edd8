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

// Appending forms for writers that fill a byte buffer: each stores its value
// at `out` and returns the position after it.
inline char* putInt32LE(char* out, std::int32_t v) {
  storeInt32LE(reinterpret_cast<unsigned char*>(out), v);
  return out + 4;
}
inline char* putInt16LE(char* out, std::int16_t v) {
  storeInt16LE(reinterpret_cast<unsigned char*>(out), v);
  return out + 2;
}
inline char* putFloatLE(char* out, float v) {
  storeFloatLE(reinterpret_cast<unsigned char*>(out), v);
  return out + 4;
}
inline char* putDoubleLE(char* out, double v) {
  const auto bits = std::bit_cast<std::uint64_t>(v);
  storeLE32(reinterpret_cast<unsigned char*>(out), static_cast<std::uint32_t>(bits));
  storeLE32(reinterpret_cast<unsigned char*>(out) + 4, static_cast<std::uint32_t>(bits >> 32));
  return out + 8;
}

}  // namespace pc::fileio
