// The storage format of the zone database "zone.inf": the file header, the
// record headers, the field formats and the zone item table. Pure decoding
// over bytes already read; the file walk lives in zone_record_file.h.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>

namespace pc::zonedb {

enum class ByteOrder { Little, Big };

inline constexpr std::size_t kHeaderSize = 160;
inline constexpr std::size_t kRecordHeaderSize = 4;

struct ZoneFileHeader {
  ByteOrder order = ByteOrder::Little;
  std::uint32_t lastRecordOffset = 0;
  std::uint32_t firstRecordOffset = 0;
  std::uint32_t recordCount = 0;
};

// Decodes the file header. 0, or kEndOfFile (fewer than 160 bytes),
// kBadMagic, kUnreadableFile (flag cleared, first record inside the header).
int decodeHeader(std::span<const unsigned char> bytes, ZoneFileHeader& header);

std::uint16_t decodeUint16(const unsigned char* bytes, ByteOrder order);
std::uint32_t decodeUint32(const unsigned char* bytes, ByteOrder order);

// Length of the data that follows a 4-byte record header.
std::uint16_t recordDataLength(std::span<const unsigned char, kRecordHeaderSize> bytes,
                               ByteOrder order);

// Zone items: 1..12 have a fixed type code; 13 is a numbered record whose
// code is the two last decimal digits of the requested number; 0 stands for
// deleted records and unknown codes.
inline constexpr int kNumberedItem = 13;
inline constexpr int kScaleItem = 6;

// The type code of items 1..12 ("??" for 0, "" for 13 and beyond).
std::string_view itemCode(int item);
// The exact format text expected for items 1..13 ("" otherwise).
std::string_view itemFormat(int item);
// Code of a numbered record: tens digit, then units digit of |number|.
std::string numberedCode(int number);

// The state character and type code that follow a record's format text.
struct RecordKey {
  char state = ' ';
  char code[2] = {' ', ' '};
};
// 0, kBadFormat (format text without NUL) or kBeyondRecord.
int decodeRecordKey(std::span<const unsigned char> data, RecordKey& key);
// The item a record stands for, 0 for deleted ("X"/"x") or unknown ones.
int itemOfRecord(const RecordKey& key, std::string_view numberedRecordCode);

// Reads one record's fields in the order its format lists them. Each read
// returns 0, kBadFormat (malformed token, unknown type letter), kWrongFieldType
// or kBeyondRecord (past the data, or past the last item of the format).
class RecordFields {
 public:
  RecordFields(std::span<const unsigned char> data, ByteOrder order);

  // kBadFormat when the format text has no NUL, else 0.
  int status() const { return status_; }
  std::string_view format() const { return format_; }

  int readChar(char& value);
  int readInteger(std::int32_t& value);
  int readReal(float& value);
  // An "S" text, trailing bytes of value 1 (padding) dropped.
  int readText(std::string& value);
  int readWord(std::int16_t& value);
  int readLogical(bool& value);
  int readDouble(double& value);
  // Type letter of the next item, for readers that decode any format:
  // 0, kBadFormat or kBeyondRecord (no item left in the format).
  int nextType(char& type);

 private:
  // Moves to the next item, which must be of `type`; `bytes` then points at
  // its storage, of which `size` bytes must lie inside the data.
  int nextItem(char type, std::size_t size, const unsigned char*& bytes);
  // The next fixed-size item of `type`, its bytes taken in the file's order.
  int readFixed(char type, std::uint64_t& raw);

  std::span<const unsigned char> data_;
  ByteOrder order_;
  int status_ = 0;
  std::string_view format_;
  std::size_t formatPos_ = 0;  // next token of the format
  char itemType_ = 0;          // type of the current token
  unsigned itemsLeft_ = 0;     // items of the current token not yet read
  std::size_t dataPos_ = 0;    // next field byte
};

}  // namespace pc::zonedb
