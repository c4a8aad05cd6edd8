#include "zonedb/zone_record_format.h"

#include <gtest/gtest.h>

#include <vector>

#include "zonedb/zone_file_builder.h"
#include "zonedb/zone_status.h"

namespace pc::zonedb {
namespace {

std::vector<unsigned char> bytesOf(const std::string& s) { return {s.begin(), s.end()}; }

TEST(ZoneRecordFormat, HeaderAndEveryFieldTypeInBothOrders) {
  for (const bool big : {false, true}) {
    const test::ZoneBytes z{big};
    std::string h = z.header(7, 200);
    h.replace(8, 4, z.u32(0x01020304));
    ZoneFileHeader header;
    ASSERT_EQ(decodeHeader(bytesOf(h), header), 0);
    EXPECT_EQ(header.order, big ? ByteOrder::Big : ByteOrder::Little);
    EXPECT_EQ(header.lastRecordOffset, 0x01020304u);
    EXPECT_EQ(header.firstRecordOffset, 200u);
    EXPECT_EQ(header.recordCount, 7u);

    const std::string data = std::string("001C 001L 002W 000R 001I 001R 001D 002S ") + '\0' + "Z" + '\1' +
                             z.u16(0xfffe) + z.u16(300) + z.i32(-123456) + z.real(25.4f) + z.dbl(-1.0e-300) +
                             test::ZoneBytes::text("0.5\1\1") + test::ZoneBytes::text("a\1b");
    const auto bytes = bytesOf(data);
    RecordFields fields(bytes, header.order);
    char c = 0;
    bool l = false;
    std::int16_t w1 = 0, w2 = 0;
    std::int32_t i = 0;
    float r = 0;
    double d = 0;
    std::string s1, s2;
    EXPECT_EQ(fields.readChar(c) + fields.readLogical(l) + fields.readWord(w1) + fields.readWord(w2) +
                  fields.readInteger(i) + fields.readReal(r) + fields.readDouble(d) + fields.readText(s1) +
                  fields.readText(s2),
              0);
    EXPECT_EQ(c, 'Z');
    EXPECT_TRUE(l);
    EXPECT_EQ(w1, -2);
    EXPECT_EQ(w2, 300);
    EXPECT_EQ(i, -123456);
    EXPECT_EQ(r, 25.4f);
    EXPECT_EQ(d, -1.0e-300);
    EXPECT_EQ(s1, "0.5");  // trailing padding of value 1 dropped, inner ones kept
    EXPECT_EQ(s2, "a\1b");
    EXPECT_EQ(fields.readChar(c), kBeyondRecord);  // the format has no more items
  }
}

TEST(ZoneRecordFormat, HeaderFailures) {
  const test::ZoneBytes z;
  ZoneFileHeader header;
  std::string h = z.header(0);
  EXPECT_EQ(decodeHeader(bytesOf(h.substr(0, 159)), header), kEndOfFile);
  EXPECT_EQ(decodeHeader(bytesOf("TBQZ" + h.substr(4)), header), kBadMagic);  // half swapped
  EXPECT_EQ(decodeHeader(bytesOf(z.header(0, 160, 0)), header), kUnreadableFile);
  EXPECT_EQ(decodeHeader(bytesOf(z.header(0, 159)), header), kUnreadableFile);
  h[152] = h[153] = 0;  // only flag 154 matters
  EXPECT_EQ(decodeHeader(bytesOf(h), header), 0);
}

TEST(ZoneRecordFormat, FieldFailures) {
  auto real = [](const std::string& data) {
    const auto bytes = bytesOf(data);
    RecordFields fields(bytes, ByteOrder::Little);
    float v;
    return fields.readReal(v);
  };
  auto text = [](const std::string& data) {
    const auto bytes = bytesOf(data);
    RecordFields fields(bytes, ByteOrder::Little);
    std::string v;
    return fields.readText(v);
  };
  const std::string nul(1, '\0');
  EXPECT_EQ(real("001R abcd"), kBadFormat);  // no NUL
  EXPECT_EQ(real("001Q " + nul + "abcd"), kBadFormat);
  EXPECT_EQ(real("0x1R " + nul + "abcd"), kBadFormat);
  EXPECT_EQ(real("001R_" + nul + "abcd"), kBadFormat);
  EXPECT_EQ(real("001R" + nul + "abcd"), kBadFormat);
  EXPECT_EQ(real("001I " + nul + "abcd"), kWrongFieldType);
  EXPECT_EQ(real("001R " + nul + "abc"), kBeyondRecord);
  EXPECT_EQ(text("001S " + nul + "\x05" + "abcd"), kBeyondRecord);
  EXPECT_EQ(text("001S " + nul), kBeyondRecord);

  RecordKey key;
  EXPECT_EQ(numberedCode(-131), "31");
  EXPECT_EQ(decodeRecordKey(bytesOf("f" + nul + "aE"), key), kBeyondRecord);
}

}  // namespace
}  // namespace pc::zonedb
