// Free-form (list-directed) conversion of numbers in text records.
//
// A record holds values separated by blanks or commas: a run of blanks is one
// separator, and so is a comma with blanks around it; a comma right after a
// separator gives a null value, which leaves the variable as it was; a slash
// ends the values of the record. A value is the text up to the next blank,
// comma or slash and must be one number as a whole: "12.5abc" is an error,
// not 12.5.
#include "fileio/list_directed.h"

#include <array>
#include <charconv>
#include <cmath>
#include <limits>
#include <system_error>

#include "fileio/record_runtime.h"

namespace pc::fileio {

namespace {

constexpr int kConversionError = 1;

bool isBlank(char c) { return c == ' ' || c == '\t'; }
bool isDigit(char c) { return c >= '0' && c <= '9'; }
bool endsValue(char c) { return isBlank(c) || c == ',' || c == '/'; }

// Moves past the separator that follows a value: blanks, at most one comma,
// blanks. A slash is left in place so that every later read sees it.
void skipSeparator(std::string_view text, std::size_t& pos) {
  while (pos < text.size() && isBlank(text[pos])) ++pos;
  if (pos < text.size() && text[pos] == ',') {
    ++pos;
    while (pos < text.size() && isBlank(text[pos])) ++pos;
  }
}

enum class Start { Value, Null, End };

// Positions `pos` on the next value. A comma there is a null value (consumed
// with its trailing blanks); the end of the text or a slash means no value.
Start findValue(std::string_view text, std::size_t& pos) {
  if (pos > text.size()) pos = text.size();
  while (pos < text.size() && isBlank(text[pos])) ++pos;
  if (pos == text.size() || text[pos] == '/') return Start::End;
  if (text[pos] == ',') {
    ++pos;
    while (pos < text.size() && isBlank(text[pos])) ++pos;
    return Start::Null;
  }
  return Start::Value;
}

std::string_view takeToken(std::string_view text, std::size_t& pos) {
  const std::size_t begin = pos;
  while (pos < text.size() && !endsValue(text[pos])) ++pos;
  return text.substr(begin, pos - begin);
}

// Parses one real: optional sign, digits with an optional decimal point (at
// least one digit), optional exponent written with E, e, D or d, or with a
// bare sign ("1.5+3"). Infinity and NaN are not numbers here: a parameter
// that is not a finite value means nothing to the programs of the suite.
bool parseReal(std::string_view token, float& out) {
  std::size_t i = 0;
  const bool negative = i < token.size() && token[i] == '-';
  if (i < token.size() && (token[i] == '+' || token[i] == '-')) ++i;
  const std::size_t intBegin = i;
  while (i < token.size() && isDigit(token[i])) ++i;
  const std::string_view intDigits = token.substr(intBegin, i - intBegin);
  std::string_view fracDigits;
  if (i < token.size() && token[i] == '.') {
    const std::size_t fracBegin = ++i;
    while (i < token.size() && isDigit(token[i])) ++i;
    fracDigits = token.substr(fracBegin, i - fracBegin);
  }
  if (intDigits.empty() && fracDigits.empty()) return false;

  long long exponent = 0;
  if (i < token.size()) {
    const char c = token[i];
    if (c == 'E' || c == 'e' || c == 'D' || c == 'd') ++i;
    else if (c != '+' && c != '-') return false;
    bool expNegative = false;
    if (i < token.size() && (token[i] == '+' || token[i] == '-')) {
      expNegative = token[i] == '-';
      ++i;
    }
    if (i == token.size()) return false;
    for (; i < token.size(); ++i) {
      if (!isDigit(token[i])) return false;
      // Saturate: anything this far out is an overflow or an underflow anyway.
      if (exponent < 1000000) exponent = exponent * 10 + (token[i] - '0');
    }
    if (expNegative) exponent = -exponent;
  }

  // Decimal magnitude of the first significant digit, to tell an overflow
  // from an underflow when the conversion reports a result out of range.
  long long magnitude = 0;
  bool significant = false;
  const std::size_t intLead = intDigits.find_first_not_of('0');
  if (intLead != std::string_view::npos) {
    magnitude = static_cast<long long>(intDigits.size() - intLead);
    significant = true;
  } else {
    const std::size_t fracLead = fracDigits.find_first_not_of('0');
    if (fracLead != std::string_view::npos) {
      magnitude = -static_cast<long long>(fracLead);
      significant = true;
    }
  }
  if (!significant) {
    out = negative ? -0.0f : 0.0f;
    return true;
  }

  std::string normalized;
  normalized.reserve(intDigits.size() + fracDigits.size() + 16);
  normalized.append(intDigits.empty() ? std::string_view("0") : intDigits);
  if (!fracDigits.empty()) {
    normalized += '.';
    normalized.append(fracDigits);
  }
  normalized += 'e';
  normalized += std::to_string(exponent);

  float value = 0.0f;
  const auto [ptr, ec] = std::from_chars(normalized.data(), normalized.data() + normalized.size(), value);
  if (ec == std::errc::result_out_of_range) {
    if (magnitude + exponent > 0) return false;  // beyond the largest float
    value = 0.0f;                                // below the smallest: zero
  } else if (ec != std::errc() || ptr != normalized.data() + normalized.size() || !std::isfinite(value)) {
    return false;
  }
  out = negative ? -value : value;
  return true;
}

bool parseInteger(std::string_view token, std::int32_t& out) {
  std::size_t i = 0;
  const bool negative = i < token.size() && token[i] == '-';
  if (i < token.size() && (token[i] == '+' || token[i] == '-')) ++i;
  if (i == token.size()) return false;
  long long magnitude = 0;
  for (; i < token.size(); ++i) {
    if (!isDigit(token[i])) return false;
    magnitude = magnitude * 10 + (token[i] - '0');
    if (magnitude > 2147483648LL) return false;
  }
  const long long value = negative ? -magnitude : magnitude;
  if (value > std::numeric_limits<std::int32_t>::max()) return false;
  out = static_cast<std::int32_t>(value);
  return true;
}

// The next value of the record through `parse`; a null value leaves `value`.
template <typename T, typename Parse>
int readListValue(std::string_view text, std::size_t& pos, T& value, Parse parse) {
  switch (findValue(text, pos)) {
    case Start::End:
      return kListNoValue;
    case Start::Null:
      return kListValue;
    case Start::Value:
      break;
  }
  T parsed{};
  if (!parse(takeToken(text, pos), parsed)) return kConversionError;
  value = parsed;
  skipSeparator(text, pos);
  return kListValue;
}

}  // namespace

int readListReal(std::string_view text, std::size_t& pos, float& value) {
  return readListValue(text, pos, value, parseReal);
}

int readListInteger(std::string_view text, std::size_t& pos, std::int32_t& value) {
  return readListValue(text, pos, value, parseInteger);
}

std::string formatListReal(float value) {
  // The shortest text that converts back to the same float.
  std::array<char, 64> buffer{};
  const auto result = std::to_chars(buffer.data(), buffer.data() + buffer.size(), value);
  std::string text(buffer.data(), result.ptr);
  // Keep it recognisably real: "25" becomes "25.0"; "1e+20" is left alone.
  if (std::isfinite(value) && text.find_first_of(".e") == std::string::npos) text += ".0";
  return text;
}

std::string formatListInteger(std::int32_t value) {
  // Right-aligned in 11 columns, room for "-2147483648".
  std::string digits = std::to_string(value);
  if (digits.size() < 11) digits.insert(0, 11 - digits.size(), ' ');
  return digits;
}

int writeListRecord(int unit, std::string_view body) {
  std::string record;
  record.reserve(body.size() + 1);
  record += ' ';
  record.append(body);
  return writeTextRecord(unit, record);
}

}  // namespace pc::fileio
