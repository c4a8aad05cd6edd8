// Decoding of "zone.inf", the record file of the work zone's tool database.
//
// All multi-byte numbers are in the byte order of the file, told by the magic:
// "QZTB" as written means little-endian, "BTZQ" big-endian (every 16-, 32-
// and 64-bit number is then swapped on reading).
//
// File header, 160 bytes:
//   offset  size  type     meaning
//   0       4     char[4]  magic "QZTB" (or "BTZQ")
//   4       4     uint32   reserved for the writers
//   8       4     uint32   offset of the last record (where an update goes on)
//   12      4     uint32   offset of the first record (160 in a new file)
//   16      4     uint32   number of records
//   20      4     uint32   reserved for the writers
//   24      128   char[]   text kept by the writers
//   152     5     byte[5]  flags; the file is readable only when byte 154 != 0
//   157     3     -        unused
//
// Records, one after another from the first record offset to the end of file:
//   offset  size  type     meaning
//   0       2     uint16   data length n
//   2       2     uint16   kept by the writers
//   4       n     byte[n]  data: format text, NUL, then the field values
//
// The format text is a row of 5-character tokens "nnnT " (count, type
// letter, blank); the values follow without alignment, count items per token:
//   C char (1)   L logical (1)   W int16 (2)   I int32 (4)
//   R float32 (4)   D float64 (8)   S length byte (0-255) + that many chars
// Zone records start with "001C 002C ": a state character ("X"/"x" deleted)
// and a 2-character type code; the value fields follow.
#include "zonedb/zone_record_format.h"

#include <array>
#include <cstdlib>
#include <cstring>

#include "zonedb/zone_status.h"

namespace pc::zonedb {

namespace {

constexpr unsigned char kMagic[4] = {'Q', 'Z', 'T', 'B'};
constexpr std::size_t kReadableFlag = 154;

struct ItemType {
  const char* code;
  const char* format;
};

constexpr std::array<ItemType, 14> kItems = {{
    {"??", ""},
    {"PJ", "001C 002C 001S "},
    {"PG", "001C 002C 001S "},
    {"CM", "001C 002C 001S "},
    {"SU", "001C 002C 001S "},
    {"CN", "001C 002C 001I "},
    {"EC", "001C 002C 001R "},
    {"TB", "001C 002C 001I "},
    {"GE", "001C 002C 001S "},
    {"CB", "001C 002C 002I "},
    {"RE", "001C 002C 002I "},
    {"DS", "001C 002C 001I "},
    {"CH", "001C 002C 001I "},
    {"", "001C 002C 001S "},
}};

std::uint64_t decodeUnsigned(const unsigned char* bytes, std::size_t size, ByteOrder order) {
  std::uint64_t value = 0;
  for (std::size_t i = 0; i < size; ++i) {
    const std::size_t at = order == ByteOrder::Little ? size - 1 - i : i;
    value = (value << 8) | bytes[at];
  }
  return value;
}

std::size_t itemSize(char type) {
  switch (type) {
    case 'C':
    case 'L':
      return 1;
    case 'W':
      return 2;
    case 'I':
    case 'R':
      return 4;
    case 'D':
      return 8;
    default:
      return 0;  // 'S' is sized by its length byte
  }
}

bool knownType(char type) { return std::strchr("CLWIRDS", type) != nullptr && type != '\0'; }

bool isDigit(char c) { return c >= '0' && c <= '9'; }

// Length of the format text at the front of a record's data, npos when it
// has no NUL. A record without data (an empty vector holds no storage) never
// hands a null pointer to the C library.
std::size_t formatLength(std::span<const unsigned char> data) {
  if (data.empty()) return std::string_view::npos;
  const void* nul = std::memchr(data.data(), 0, data.size());
  if (nul == nullptr) return std::string_view::npos;
  return static_cast<std::size_t>(static_cast<const unsigned char*>(nul) - data.data());
}

}  // namespace

std::uint16_t decodeUint16(const unsigned char* bytes, ByteOrder order) {
  return static_cast<std::uint16_t>(decodeUnsigned(bytes, 2, order));
}

std::uint32_t decodeUint32(const unsigned char* bytes, ByteOrder order) {
  return static_cast<std::uint32_t>(decodeUnsigned(bytes, 4, order));
}

int decodeHeader(std::span<const unsigned char> bytes, ZoneFileHeader& header) {
  if (bytes.size() < kHeaderSize) return kEndOfFile;
  if (std::memcmp(bytes.data(), kMagic, 4) == 0) {
    header.order = ByteOrder::Little;
  } else if (bytes[0] == kMagic[3] && bytes[1] == kMagic[2] && bytes[2] == kMagic[1] &&
             bytes[3] == kMagic[0]) {
    header.order = ByteOrder::Big;
  } else {
    return kBadMagic;
  }
  header.lastRecordOffset = decodeUint32(bytes.data() + 8, header.order);
  header.firstRecordOffset = decodeUint32(bytes.data() + 12, header.order);
  header.recordCount = decodeUint32(bytes.data() + 16, header.order);
  if (bytes[kReadableFlag] == 0) return kUnreadableFile;
  // Records never start inside the header; such an offset means damage.
  if (header.firstRecordOffset < kHeaderSize) return kUnreadableFile;
  return 0;
}

std::uint16_t recordDataLength(std::span<const unsigned char, kRecordHeaderSize> bytes,
                               ByteOrder order) {
  return decodeUint16(bytes.data(), order);
}

std::string_view itemCode(int item) {
  if (item < 0 || item >= kNumberedItem) return {};
  return kItems[static_cast<std::size_t>(item)].code;
}

std::string_view itemFormat(int item) {
  if (item < 1 || item > kNumberedItem) return {};
  return kItems[static_cast<std::size_t>(item)].format;
}

std::string numberedCode(int number) {
  const long long magnitude = std::llabs(static_cast<long long>(number));
  std::string code(2, '0');
  code[0] = static_cast<char>('0' + magnitude / 10 % 10);
  code[1] = static_cast<char>('0' + magnitude % 10);
  return code;
}

int decodeRecordKey(std::span<const unsigned char> data, RecordKey& key) {
  const std::size_t length = formatLength(data);
  if (length == std::string_view::npos) return kBadFormat;
  const std::size_t at = length + 1;
  if (data.size() - at < 3) return kBeyondRecord;
  key.state = static_cast<char>(data[at]);
  key.code[0] = static_cast<char>(data[at + 1]);
  key.code[1] = static_cast<char>(data[at + 2]);
  return 0;
}

int itemOfRecord(const RecordKey& key, std::string_view numberedRecordCode) {
  if (key.state == 'X' || key.state == 'x') return 0;
  const std::string_view code(key.code, 2);
  for (int item = 1; item < kNumberedItem; ++item) {
    if (code == itemCode(item)) return item;
  }
  if (numberedRecordCode.size() == 2 && code == numberedRecordCode) return kNumberedItem;
  return 0;
}

RecordFields::RecordFields(std::span<const unsigned char> data, ByteOrder order)
    : data_(data), order_(order) {
  const std::size_t length = formatLength(data);
  if (length == std::string_view::npos) {
    status_ = kBadFormat;
    return;
  }
  format_ = std::string_view(reinterpret_cast<const char*>(data.data()), length);
  dataPos_ = length + 1;
}

int RecordFields::nextItem(char type, std::size_t size, const unsigned char*& bytes) {
  if (status_ != 0) return status_;
  while (itemsLeft_ == 0) {
    if (formatPos_ >= format_.size()) return kBeyondRecord;
    if (format_.size() - formatPos_ < 5) return kBadFormat;
    const std::string_view token = format_.substr(formatPos_, 5);
    if (!isDigit(token[0]) || !isDigit(token[1]) || !isDigit(token[2]) || !knownType(token[3]) ||
        token[4] != ' ') {
      return kBadFormat;
    }
    itemsLeft_ = static_cast<unsigned>((token[0] - '0') * 100 + (token[1] - '0') * 10 + (token[2] - '0'));
    itemType_ = token[3];
    formatPos_ += 5;
  }
  if (itemType_ != type) return kWrongFieldType;
  if (dataPos_ > data_.size() || data_.size() - dataPos_ < size) return kBeyondRecord;
  bytes = data_.data() + dataPos_;
  return 0;
}

int RecordFields::readFixed(char type, std::uint64_t& raw) {
  const std::size_t size = itemSize(type);
  const unsigned char* bytes = nullptr;
  if (const int status = nextItem(type, size, bytes); status != 0) return status;
  raw = decodeUnsigned(bytes, size, order_);
  dataPos_ += size;
  --itemsLeft_;
  return 0;
}

int RecordFields::readChar(char& value) {
  std::uint64_t raw = 0;
  if (const int status = readFixed('C', raw); status != 0) return status;
  value = static_cast<char>(raw);
  return 0;
}

int RecordFields::readInteger(std::int32_t& value) {
  std::uint64_t raw = 0;
  if (const int status = readFixed('I', raw); status != 0) return status;
  value = static_cast<std::int32_t>(static_cast<std::uint32_t>(raw));
  return 0;
}

int RecordFields::readReal(float& value) {
  std::uint64_t raw = 0;
  if (const int status = readFixed('R', raw); status != 0) return status;
  const auto bits = static_cast<std::uint32_t>(raw);
  std::memcpy(&value, &bits, sizeof value);
  return 0;
}

int RecordFields::nextType(char& type) {
  const unsigned char* bytes = nullptr;
  const int status = nextItem(0, 0, bytes);  // type 0 matches no item: only moves to the next token
  if (status == kWrongFieldType) {
    type = itemType_;
    return 0;
  }
  return status;
}

int RecordFields::readWord(std::int16_t& value) {
  std::uint64_t raw = 0;
  if (const int status = readFixed('W', raw); status != 0) return status;
  value = static_cast<std::int16_t>(static_cast<std::uint16_t>(raw));
  return 0;
}

int RecordFields::readLogical(bool& value) {
  std::uint64_t raw = 0;
  if (const int status = readFixed('L', raw); status != 0) return status;
  value = raw != 0;
  return 0;
}

int RecordFields::readDouble(double& value) {
  std::uint64_t raw = 0;
  if (const int status = readFixed('D', raw); status != 0) return status;
  std::memcpy(&value, &raw, sizeof value);
  return 0;
}

int RecordFields::readText(std::string& value) {
  const unsigned char* bytes = nullptr;
  if (const int status = nextItem('S', 1, bytes); status != 0) return status;
  const std::size_t length = bytes[0];
  if (data_.size() - dataPos_ - 1 < length) return kBeyondRecord;
  std::size_t kept = length;
  while (kept > 0 && bytes[kept] == 1) --kept;  // bytes[1..length] are the text
  value.assign(reinterpret_cast<const char*>(bytes + 1), kept);
  dataPos_ += 1 + length;
  --itemsLeft_;
  return 0;
}

}  // namespace pc::zonedb
