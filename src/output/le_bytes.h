// Little-endian encoders for the binary output files, independent of the
// host's byte order, and the float-to-integer truncation their integer
// fields use.
#pragma once

#include <bit>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>

namespace pc {

inline char* putUint32LE(char* out, std::uint32_t v) {
  if constexpr (std::endian::native == std::endian::little) {
    std::memcpy(out, &v, sizeof v);  // one store instead of four
    return out + 4;
  }
  out[0] = static_cast<char>(v);
  out[1] = static_cast<char>(v >> 8);
  out[2] = static_cast<char>(v >> 16);
  out[3] = static_cast<char>(v >> 24);
  return out + 4;
}

inline char* putInt32LE(char* out, std::int32_t v) {
  return putUint32LE(out, static_cast<std::uint32_t>(v));
}

inline char* putInt16LE(char* out, std::int16_t v) {
  const auto u = static_cast<std::uint16_t>(v);
  if constexpr (std::endian::native == std::endian::little) {
    std::memcpy(out, &u, sizeof u);
    return out + 2;
  }
  out[0] = static_cast<char>(u);
  out[1] = static_cast<char>(u >> 8);
  return out + 2;
}

inline char* putFloatLE(char* out, float v) {
  std::uint32_t bits = 0;
  std::memcpy(&bits, &v, sizeof bits);
  return putUint32LE(out, bits);
}

inline char* putDoubleLE(char* out, double v) {
  std::uint64_t bits = 0;
  std::memcpy(&bits, &v, sizeof bits);
  if constexpr (std::endian::native == std::endian::little) {
    std::memcpy(out, &bits, sizeof bits);
    return out + 8;
  }
  out = putUint32LE(out, static_cast<std::uint32_t>(bits));
  return putUint32LE(out, static_cast<std::uint32_t>(bits >> 32));
}

// Truncation toward zero. Values outside the 32-bit range saturate and NaN
// gives 0, so a damaged value cannot make the conversion undefined.
inline std::int32_t truncateToInt32(float v) {
  const double d = static_cast<double>(v);
  if (std::isnan(d)) return 0;
  if (d >= 2147483647.0) return std::numeric_limits<std::int32_t>::max();
  if (d <= -2147483648.0) return std::numeric_limits<std::int32_t>::min();
  return static_cast<std::int32_t>(d);
}

}  // namespace pc
