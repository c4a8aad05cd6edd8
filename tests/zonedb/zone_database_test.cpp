#include "zonedb/zone_database.h"

#include <gtest/gtest.h>

#include <bit>
#include <filesystem>
#include <tuple>
#include <vector>

#include "support/test_support.h"
#include "zonedb/zone_database_testing.h"
#include "zonedb/zone_record_format.h"
#include "zonedb/zone_status.h"

namespace pc::zonedb {
namespace {

using namespace std::string_literals;

// "zone.inf" images in either byte order.
struct ZoneBytes {
  bool big = false;

  std::string number(std::uint64_t value, int size) const {
    std::string out;
    for (int i = 0; i < size; ++i) out += static_cast<char>(value >> 8 * (big ? size - 1 - i : i));
    return out;
  }
  std::string u32(std::uint32_t v) const { return number(v, 4); }
  std::string real(float v) const { return number(std::bit_cast<std::uint32_t>(v), 4); }
  static std::string text(const std::string& s) { return static_cast<char>(s.size()) + s; }
  // Only flag byte 154 is set: the others must not matter to a reader.
  std::string file(const std::vector<std::string>& records) const {
    std::string out = (big ? "BTZQ" : "QZTB") + u32(0) + u32(160) + u32(160) + u32(records.size());
    out.resize(160, '\0');
    out[154] = 1;
    for (const auto& r : records) out += number(r.size(), 2) + number(0, 2) + r;
    return out;
  }
};

// Zone record data: format text with the value token, NUL, state, code, values.
std::string record(const std::string& token, const std::string& code, const std::string& values, char state = ' ') {
  return "001C 002C " + token + '\0' + state + code + values;
}
std::string ec(const ZoneBytes& z, float value, char state = ' ') {
  return record("001R ", "EC", z.real(value), state);
}
std::string textRecord(const std::string& code, const std::string& text, char state = ' ') {
  return record("001S ", code, ZoneBytes::text(text), state);
}

// The queries read characters, texts, integers and reals; the other types
// are only decoded here.
TEST(ZoneRecordFields, OtherTypesInBothOrdersAndMalformedFormats) {
  for (const bool big : {false, true}) {
    const ZoneBytes z{big};
    const std::string data = "001L 000R 001W 001D "s + '\0' + '\2' + z.number(0xfffe, 2) +
                             z.number(std::bit_cast<std::uint64_t>(-1.0e-300), 8);
    const std::vector<unsigned char> bytes(data.begin(), data.end());
    RecordFields fields(bytes, big ? ByteOrder::Big : ByteOrder::Little);
    bool l = false;
    std::int16_t w = 0;
    double d = 0;
    EXPECT_EQ(fields.readLogical(l) + fields.readWord(w) + fields.readDouble(d), 0);
    EXPECT_EQ(std::tuple(l, w, d), std::tuple(true, std::int16_t{-2}, -1.0e-300));
    EXPECT_EQ(fields.readLogical(l), kBeyondRecord);  // the format has no more items
  }
  for (const std::string& data : {"001R abcd"s, "001Q \0abcd"s, "0x1R \0abcd"s, "001R_\0abcd"s, "001R\0abcd"s}) {
    const std::vector<unsigned char> bytes(data.begin(), data.end());
    RecordFields fields(bytes, ByteOrder::Little);
    float real;
    EXPECT_EQ(fields.readReal(real), kBadFormat) << data;  // the first has no NUL
  }
}

// A zone directory in TRXZONE, queried with a clock that only moves when the
// lock sleeps, so that no test can hang on a lock.
class ZoneQuery : public testing::Test {
 protected:
  ZoneQuery() : zone_("TRXZONE", dir_.path()) {
    resetZoneNamesForTesting();
    setLockTimingForTesting({[this] { return clock_; }, [this](unsigned ms) { clock_ += ms; }});
  }
  ~ZoneQuery() override {
    setLockTimingForTesting({});
    resetZoneNamesForTesting();
  }

  test::TempDir dir_;
  test::ScopedEnv zone_;
  std::string database_ = dir_.file("zone.inf");
  std::int64_t clock_ = 0;
};

TEST_F(ZoneQuery, RealValueOfEachFileLeavesItUntouchedAndUnlocked) {
  const ZoneBytes z;
  const std::string good = z.file({textRecord("PJ", "p"), ec(z, 2.0f, 'X'), ec(z, 3.0f, 'x'), ec(z, 25.4f)});
  auto patched = [&good](std::size_t at, const std::string& bytes) {
    return std::string(good).replace(at, bytes.size(), bytes);
  };
  const std::tuple<std::string, int, int> cases[] = {
      {good, 6, 4},  // deleted records skipped
      {good.substr(0, 100), 6, kEndOfFile},
      {good.substr(0, 162), 6, kEndOfFile},  // cut in a record header
      {good.substr(0, good.size() - 1), 6, kEndOfFile},
      {patched(12, z.u32(100000)), 6, kEndOfFile},  // first record beyond the end
      {patched(0, "TBQZ"), 6, kBadMagic},
      {patched(154, "\0"s), 6, kUnreadableFile},
      {patched(12, z.u32(159)), 6, kUnreadableFile},  // first record inside the header
      {z.file({}), 6, kNoRecord},
      {z.file({"001C 002C 001S  EC"}), 6, kBadFormat},  // no NUL
      {z.file({"001C \0 E"s}), 6, kBeyondRecord},
      {z.file({record("001I ", "EC", z.u32(2))}), 6, kBadFormat},
      {z.file({record("001I ", "CN", z.u32(2))}), 5, kWrongFieldType},
      {z.file({record("001R ", "EC", "abc")}), 6, kBeyondRecord},
      {good, 0, kNoRecord},  // item 0 would find the deleted records
  };
  float value = -7.0f;
  EXPECT_EQ(zoneRealValue(6, value), kNoRecord);  // no database: nothing is created
  EXPECT_TRUE(std::filesystem::is_empty(dir_.path()));
  for (const auto& [bytes, item, status] : cases) {
    test::writeFile(database_, bytes);
    value = -7.0f;
    EXPECT_EQ(zoneRealValue(item, value), status) << &bytes - &std::get<0>(cases[0]);
    EXPECT_EQ(value, status >= 1 ? 25.4f : -7.0f);
    EXPECT_EQ(test::readFile(database_), bytes);
    EXPECT_FALSE(test::fileExists(dir_.file("zone.lck")));
  }
  EXPECT_EQ(clock_, 0);

  // An empty zone setting means the current directory, not the root.
  test::ScopedEnv empty("TRXZONE", "");
  resetZoneNamesForTesting();
  const auto previous = std::filesystem::current_path();
  std::filesystem::current_path(dir_.path());
  EXPECT_EQ(zoneRealValue(6, value), 4);
  std::filesystem::remove(database_);
  std::filesystem::create_directory(database_);
  EXPECT_EQ(zoneRealValue(6, value), kCannotOpen);
  std::filesystem::current_path(previous);
  // A zone directory that does not exist: its lock cannot be made.
  test::ScopedEnv absent("TRXZONE", dir_.file("absent"));
  resetZoneNamesForTesting();
  EXPECT_EQ(zoneRealValue(6, value), kCannotOpen);
  EXPECT_EQ(clock_, 0);
}

TEST_F(ZoneQuery, TextValuesInBothOrdersAreCutAndBlankPadded) {
  const std::tuple<int, std::size_t, int, std::string> cases[] = {
      {31, 8, 4, "0\1.5    "},  // deleted skipped, first found, trailing bytes of value 1 dropped
      {-131, 8, 4, "0\1.5    "},  // the two last digits
      {5, 4, 1, "fiv "},  // cut to the length minus one
      {32, 8, kNoRecord, "        "},
      {105, 8, 6, "-42     "},
      {109, 8, 7, "7 3     "},
      {106, 8, 3, "25.4    "},
      {113, 10, 8, "thirteen  "},
      {41, 8, kTextOverLimit, "        "},
      {42, 243, 10, std::string(241, 'b') + "  "},
      {43, 8, kBeyondRecord, "        "},  // the length byte goes beyond the record
      {44, 8, kBeyondRecord, "        "},  // no length byte
  };
  for (const bool big : {false, true}) {
    const ZoneBytes z{big};
    test::writeFile(database_, z.file({textRecord("05", "five"), textRecord("31", "9.9", 'X'), ec(z, 25.4f),
                                       textRecord("31", "0\1.5\1\1\1"), textRecord("31", "later"),
                                       record("001I ", "CN", z.u32(static_cast<std::uint32_t>(-42))),
                                       record("002I ", "CB", z.u32(7) + z.u32(3)), textRecord("13", "thirteen"),
                                       textRecord("41", std::string(242, 'a')),
                                       textRecord("42", std::string(241, 'b') + "\1\1\1"),
                                       record("001S ", "43", "\5abcd"), record("001S ", "44", "")}));
    for (const auto& [number, size, status, expected] : cases) {
      std::vector<char> text(size, '?');
      EXPECT_EQ(zoneTextValue(number, text), status) << number << big;
      EXPECT_EQ(std::string(text.begin(), text.end()), expected) << number << big;
    }
  }
}

}  // namespace
}  // namespace pc::zonedb
