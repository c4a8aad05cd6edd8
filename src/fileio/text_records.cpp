// Reading and writing the records (lines) of formatted units, and of
// standard output as unit -1.
#include "fileio/record_runtime.h"

#include "fileio/unit_table.h"

namespace pc::fileio {

using namespace detail;

namespace {

int writeStandardOutput(std::string_view record) {
  std::FILE* out = stdout;
  if (std::fwrite(record.data(), 1, record.size(), out) != record.size() || std::fputc('\n', out) == EOF) {
    std::clearerr(out);
    return kIoErrorSystem;
  }
  return kIoOk;
}

}  // namespace

int readTextRecord(int unit, std::string& record) {
  Unit* u = table().find(unit);
  if (u == nullptr || u->form != FileForm::Formatted) return kIoErrorUnit;
  u->beginReading();
  const std::int64_t start = u->position();
  record.clear();
  bool consumed = false;
  for (;;) {
    const std::size_t available = u->fill(1);
    if (available == 0) {
      if (u->readFailed) return recordError(*u, start);
      if (!consumed) {
        u->afterEnd = true;
        return kIoEnd;
      }
      break;  // a last line without its line end
    }
    const unsigned char* from = u->buffer.get() + u->cursor;
    const auto* newline = static_cast<const unsigned char*>(std::memchr(from, '\n', available));
    const std::size_t n = newline != nullptr ? static_cast<std::size_t>(newline - from) : available;
    if (record.size() + n > kMaxTextRecord) {
      record.clear();
      return recordError(*u, start);
    }
    record.append(reinterpret_cast<const char*>(from), n);
    consumed = true;
    if (newline != nullptr) {
      u->cursor += n + 1;
      break;
    }
    u->cursor += n;
  }
  if (!record.empty() && record.back() == '\r') record.pop_back();
  return kIoOk;
}

int writeTextRecord(int unit, std::string_view record) {
  if (unit == kStandardOutputUnit) return writeStandardOutput(record);
  Unit* u = table().find(unit);
  if (u == nullptr || u->form != FileForm::Formatted || !u->writable) return kIoErrorUnit;
  if (u->writeFailed) return kIoErrorSystem;
  if (!u->beginWriting()) {
    u->writeFailed = true;
    return kIoErrorSystem;
  }
  const unsigned char lineEnd = '\n';
  u->put(reinterpret_cast<const unsigned char*>(record.data()), record.size());
  u->put(&lineEnd, 1);
  return u->writeFailed ? kIoErrorSystem : kIoOk;
}

}  // namespace pc::fileio
