#include "fileio/runtime_fatal.h"

#include <cstdio>
#include <cstdlib>
#include <string>

#include "fileio/record_runtime.h"

namespace pc::fileio {

namespace {

// The report is built in a work field of this many characters, the template
// framed by parentheses so that its own leading and trailing blanks survive.
constexpr std::size_t kWorkField = 200;
constexpr std::size_t kValueWidth = 9;

std::size_t trimmedLength(std::string_view text) {
  const auto end = text.find_last_not_of(' ');
  return end == std::string_view::npos ? 0 : end + 1;
}

std::string valueText(int value) {
  std::string text = std::to_string(value);
  return text.size() > kValueWidth ? std::string(kValueWidth, '*') : text;
}

void printRecord(std::string_view body) {
  std::string record = " ";
  record += body;
  writeTextRecord(kStandardOutputUnit, record);
}

}  // namespace

std::string fatalMessageText(std::string_view messageTemplate, std::span<const int> values) {
  std::string work = "(";
  work += messageTemplate;
  work += ')';
  if (work.size() > kWorkField) work.resize(kWorkField);
  std::size_t length = trimmedLength(work);
  for (const int value : values) {
    const std::size_t k = work.find('%');
    if (k == std::string::npos || k >= length) break;
    work = work.substr(0, k) + valueText(value) + work.substr(k + 1, length - k - 1);
    if (work.size() > kWorkField) work.resize(kWorkField);
    length = trimmedLength(work);
  }
  // Without the parentheses (the closing one may have been cut with the tail).
  return length >= 2 ? work.substr(1, length - 2) : std::string{};
}

void fatalErrorValues(std::string_view routine, std::string_view messageTemplate, std::span<const int> values) {
  const std::string message = fatalMessageText(messageTemplate, values);
  const std::string_view name = routine.substr(0, trimmedLength(routine));
  if (!name.empty()) {
    std::string line = "Fatal error in ";
    line += name;
    line += " : ";
    printRecord(line);
  }
  printRecord(message);
  printRecord("Program terminated.");
  std::fflush(stdout);
  // Open units are flushed and closed on the way out.
  closeAllUnits();
  std::exit(kFatalStopStatus);
}

void fatalError(std::string_view routine, std::string_view messageTemplate, int value) {
  fatalErrorValues(routine, messageTemplate, std::span<const int>(&value, 1));
}

}  // namespace pc::fileio
