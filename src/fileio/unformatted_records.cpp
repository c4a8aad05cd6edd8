// Reading and writing the records of unformatted units (the framing is
// documented in record_runtime.cpp).
#include "fileio/record_runtime.h"

#include "fileio/unit_table.h"

namespace pc::fileio {

using namespace detail;

namespace {

// A record that does not fit the buffer: its front is copied piece by piece
// and the rest skipped the same way, so that no allocation follows the count.
int readLongRecord(Unit& u, std::int64_t start, std::uint32_t count, unsigned char* data, std::size_t size) {
  u.cursor += kFrameSize;
  std::uint64_t remaining = count;
  std::size_t copied = 0;
  while (remaining > 0) {
    const std::size_t available = u.fill(1);
    if (available == 0) return recordError(u, start);
    const std::size_t take = static_cast<std::size_t>(std::min<std::uint64_t>(available, remaining));
    if (copied < size) {
      const std::size_t n = std::min(take, size - copied);
      std::memcpy(data + copied, u.buffer.get() + u.cursor, n);
      copied += n;
    }
    u.cursor += take;
    remaining -= take;
  }
  if (u.fill(kFrameSize) < kFrameSize || loadLE32(u.buffer.get() + u.cursor) != count) {
    return recordError(u, start);
  }
  u.cursor += kFrameSize;
  return kIoOk;
}

}  // namespace

int readRecord(int unit, void* data, std::size_t size) {
  Unit* u = table().find(unit);
  if (u == nullptr || u->form != FileForm::Unformatted) return kIoErrorUnit;
  if (data == nullptr && size > 0) return kIoErrorUnit;
  u->beginReading();
  const std::int64_t start = u->position();

  std::size_t available = u->fill(kFrameSize);
  if (available == 0) {
    if (u->readFailed) return recordError(*u, start);
    u->afterEnd = true;
    return kIoEnd;
  }
  if (available < kFrameSize) return recordError(*u, start);
  const unsigned char* head = u->buffer.get() + u->cursor;
  const std::uint32_t count = loadLE32(head);
  if (count > INT32_MAX || size > count) return recordError(*u, start);

  auto* out = static_cast<unsigned char*>(data);
  const std::size_t total = static_cast<std::size_t>(count) + 2 * kFrameSize;
  if (total > kBufferSize) return readLongRecord(*u, start, count, out, size);
  if (available < total) {
    available = u->fill(total);
    if (available < total) return recordError(*u, start);
    head = u->buffer.get() + u->cursor;
  }
  if (loadLE32(head + kFrameSize + count) != count) return recordError(*u, start);
  if (size > 0) std::memcpy(out, head + kFrameSize, size);
  u->cursor += total;
  return kIoOk;
}

int writeRecord(int unit, const void* data, std::size_t size) {
  Unit* u = table().find(unit);
  if (u == nullptr || u->form != FileForm::Unformatted || !u->writable) return kIoErrorUnit;
  if ((data == nullptr && size > 0) || size > static_cast<std::size_t>(INT32_MAX)) return kIoErrorUnit;
  if (u->writeFailed) return kIoErrorSystem;
  if (!u->beginWriting()) {
    u->writeFailed = true;
    return kIoErrorSystem;
  }
  unsigned char frame[kFrameSize];
  storeLE32(frame, static_cast<std::uint32_t>(size));
  if (size + 2 * kFrameSize <= kBufferSize - u->length) {
    // The common case: the whole record goes into the buffer in one piece.
    unsigned char* p = u->buffer.get() + u->length;
    std::memcpy(p, frame, kFrameSize);
    if (size > 0) std::memcpy(p + kFrameSize, data, size);
    std::memcpy(p + kFrameSize + size, frame, kFrameSize);
    u->length += size + 2 * kFrameSize;
  } else {
    u->put(frame, kFrameSize);
    u->put(static_cast<const unsigned char*>(data), size);
    u->put(frame, kFrameSize);
  }
  return u->writeFailed ? kIoErrorSystem : kIoOk;
}

}  // namespace pc::fileio
