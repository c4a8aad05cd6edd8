// Free-form (list-directed) conversion: values in a record separated by
// blanks or commas; each free-form record written begins with one blank.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace pc::fileio {

inline constexpr int kListValue = 0;     // a value was read
inline constexpr int kListNoValue = -1;  // the record holds no further value
// Any positive result is a conversion error.

// Reads the next value of `text` from `pos`, advancing `pos` past the value
// and its separator. A null value (two commas) leaves `value` unchanged and
// returns kListValue; a conversion error (positive result) leaves it
// unchanged too. Reals
// take an optional exponent (E, e, D or d); "nan", "inf" and values beyond
// the float range are errors, values below it read as zero. Integers are an
// optional sign and digits within 32 bits.
int readListReal(std::string_view text, std::size_t& pos, float& value);
int readListInteger(std::string_view text, std::size_t& pos, std::int32_t& value);

// Texts that readListReal / readListInteger read back to the same value: the
// shortest such text for a real ("6.35", "25.0", "1e+20"), the integer
// right-aligned in 11 columns.
std::string formatListReal(float value);
std::string formatListInteger(std::int32_t value);

// Writes one free-form record: one blank, then `body`.
int writeListRecord(int unit, std::string_view body);

}  // namespace pc::fileio
