#include "zonedb/zone_database.h"

#include <gtest/gtest.h>

#include <bit>
#include <filesystem>
#include <tuple>
#include <vector>

#include "env/diagnostic_channels.h"
#include "support/test_support.h"
#include "zonedb/zone_database_testing.h"
#include "zonedb/zone_record_format.h"
#include "zonedb/zone_status.h"

namespace pc::zonedb {
namespace {

namespace fs = std::filesystem;
using namespace std::string_literals;

// Zone record data: format text with the value token, NUL, state, code, values.
std::string record(const std::string& token, const std::string& code, const std::string& values, char state = ' ') {
  return "001C 002C " + token + '\0' + state + code + values;
}
std::string textRecord(const std::string& code, const std::string& text, char state = ' ') {
  return record("001S ", code, static_cast<char>(text.size()) + text, state);
}

// "zone.inf" images in either byte order. Only the first record offset and
// flag byte 154 are set: the other header fields must not matter to a reader.
struct ZoneBytes {
  bool big = false;

  std::string number(std::uint64_t value, int size) const {
    std::string out;
    for (int i = 0; i < size; ++i) out += static_cast<char>(value >> 8 * (big ? size - 1 - i : i));
    return out;
  }
  std::string ec(float value, char state = ' ') const {
    return record("001R ", "EC", number(std::bit_cast<std::uint32_t>(value), 4), state);
  }
  std::string file(const std::vector<std::string>& records) const {
    std::string out = (big ? "BTZQ"s : "QZTB"s) + std::string(8, '\0') + number(160, 4);
    out.resize(160, '\0');
    out[154] = 1;
    for (const auto& r : records) out += number(r.size(), 2) + number(0, 2) + r;
    return out;
  }
};

// Formats of no zone item: every malformed token is refused (the first
// format has no NUL at all).
TEST(ZoneRecordFields, MalformedFormats) {
  for (const std::string& data : {"001R abcd"s, "001Q \0abcd"s, "0x1R \0abcd"s, "001R_\0abcd"s, "001R\0abcd"s}) {
    float real;
    RecordFields fields({reinterpret_cast<const unsigned char*>(data.data()), data.size()}, ByteOrder::Little);
    EXPECT_EQ(fields.readReal(real), kBadFormat) << data;
  }
}

// Every query of a zone directory in TRXZONE, with a clock that only moves
// when the lock sleeps, so that no test can hang on a lock.
TEST(ZoneQueries, ValuesOfEachFileInBothOrdersLeaveItUntouchedAndUnlocked) {
  test::TempDir dir;
  test::ScopedEnv zone("TRXZONE", dir.path());
  resetZoneNamesForTesting();
  std::int64_t clock = 0;
  setLockTimingForTesting({[&clock] { return clock; }, [&clock](unsigned ms) { clock += ms; }});
  const std::string database = dir.file("zone.inf");
  // Number, buffer size, status and text.
  const std::tuple<int, std::size_t, int, std::string> texts[] = {
      {31, 8, 4, "0\1.5    "},  // deleted skipped, first found, trailing bytes of value 1 dropped
      {-131, 8, 4, "0\1.5    "},  // the two last digits
      {5, 4, 1, "fiv "},  // cut to the length minus one
      {105, 8, 6, "-42     "},
      {109, 8, 7, "7 3     "},
      {106, 8, 14, "25.4    "},
      {113, 10, 8, "thirteen  "},
      {41, 8, kTextOverLimit, "        "},
      {42, 243, 10, std::string(241, 'b') + "  "},
      {43, 8, kBeyondRecord, "        "},  // the length byte goes beyond the record
      {44, 8, kBeyondRecord, "        "},  // no length byte
  };
  float value = -7.0f;
  EXPECT_EQ(zoneRealValue(6, value), kNoRecord);  // no database: nothing is created
  EXPECT_TRUE(fs::is_empty(dir.path()));
  for (const bool big : {false, true}) {
    const ZoneBytes z{big};
    const std::string good = z.file(
        {textRecord("05", "five"), textRecord("31", "9.9", 'X'), z.ec(3.0f, 'x'), textRecord("31", "0\1.5\1\1\1"),
         textRecord("31", "later"), record("001I ", "CN", z.number(static_cast<std::uint32_t>(-42), 4)),
         record("002I ", "CB", z.number(7, 4) + z.number(3, 4)), textRecord("13", "thirteen"),
         textRecord("41", std::string(242, 'a')), textRecord("42", std::string(241, 'b') + "\1\1\1"),
         record("001S ", "43", "\5abcd"), record("001S ", "44", ""), z.ec(2.0f, 'X'), z.ec(25.4f)});
    test::writeFile(database, good);
    for (const auto& [number, size, status, expected] : texts) {
      std::string text(size, '?');
      EXPECT_EQ(zoneTextValue(number, text), status) << number << big;
      EXPECT_EQ(text, expected) << number << big;
    }

    const auto patched = [&](std::size_t at, std::string_view b) { return std::string(good).replace(at, b.size(), b); };
    const std::tuple<std::string, int, int> files[] = {
        {good, 6, 14},  // deleted records skipped
        {good.substr(0, 100), 6, kEndOfFile},
        {good.substr(0, 162), 6, kEndOfFile},  // cut in a record header
        {good.substr(0, good.size() - 1), 6, kEndOfFile},
        {patched(12, z.number(100000, 4)), 6, kEndOfFile},  // first record beyond the end
        {patched(0, "TBQZ"), 6, kBadMagic},
        {patched(154, "\0"s), 6, kUnreadableFile},
        {patched(12, z.number(159, 4)), 6, kUnreadableFile},  // first record inside the header
        {z.file({}), 6, kNoRecord},
        {z.file({"001C 002C 001S  EC"}), 6, kBadFormat},  // no NUL
        {z.file({""}), 6, kBadFormat},  // no data at all: no format text
        {z.file({"001C \0 E"s}), 6, kBeyondRecord},
        {z.file({record("001I ", "EC", z.number(2, 4))}), 6, kBadFormat},
        {z.file({record("001I ", "CN", z.number(2, 4))}), 5, kWrongFieldType},
        {z.file({record("001R ", "EC", "abc")}), 6, kBeyondRecord},
        {good, 0, kNoRecord},  // item 0 would find the deleted records
    };
    for (const auto& [bytes, item, status] : files) {
      test::writeFile(database, bytes);
      value = -7.0f;
      EXPECT_EQ(zoneRealValue(item, value), status) << &bytes - &std::get<0>(files[0]) << big;
      EXPECT_EQ(value, status >= 1 ? 25.4f : -7.0f);
      EXPECT_EQ(test::readFile(database), bytes);
      EXPECT_FALSE(test::fileExists(dir.file("zone.lck")));
    }
  }

  // A lock left behind is waited for, and broken once abandoned for 10 s.
  EXPECT_EQ(clock, 0);
  test::writeFile(dir.file("zone.lck"), "999999999");
  EXPECT_EQ(zoneRealValue(6, value), 14);
  EXPECT_EQ(clock, 10000);

  // An empty zone setting means the current directory, not the root.
  test::ScopedEnv empty("TRXZONE", "");
  resetZoneNamesForTesting();
  const auto previous = fs::current_path();
  fs::current_path(dir.path());
  EXPECT_EQ(zoneRealValue(6, value), 14);
  fs::remove(database);
  fs::create_directory(database);
  EXPECT_EQ(zoneRealValue(6, value), kCannotOpen);
  fs::current_path(previous);
  // A zone directory that does not exist: its lock cannot be made, but
  // there is no database to lose either.
  test::ScopedEnv absent("TRXZONE", dir.file("absent"));
  resetZoneNamesForTesting();
  EXPECT_EQ(zoneRealValue(6, value), kNoRecord);
  EXPECT_EQ(clock, 10000);  // no more waiting
  setLockTimingForTesting({});
  resetZoneNamesForTesting();
}

std::vector<std::string>& fatalMessages() {
  static std::vector<std::string> messages;
  return messages;
}

// A database that is there but whose lock can be neither taken nor broken is
// a lost input: it goes to the fatal channel, naming the lock; without a
// database the default stands.
TEST(ZoneQueries, LockInTheWayOfAnExistingDatabaseIsFatal) {
  test::TempDir dir;
  test::ScopedEnv zone("TRXZONE", dir.path());
  resetZoneNamesForTesting();
  std::int64_t clock = 0;
  setLockTimingForTesting({[&clock] { return clock; }, [&clock](unsigned ms) { clock += ms; }});
  const MessageHandler previous = setFatalHandler([](const char* m) { fatalMessages().push_back(m); });
  const std::string lock = dir.file("zone.lck");
  fs::create_directory(lock);

  float value = -7.0f;
  std::string text(8, '?');
  EXPECT_EQ(zoneRealValue(6, value), kNoRecord);
  EXPECT_TRUE(fatalMessages().empty());
  test::writeFile(dir.file("zone.inf"), ZoneBytes{}.file({ZoneBytes{}.ec(25.4f)}));
  EXPECT_EQ(zoneRealValue(6, value), kCannotOpen);
  EXPECT_EQ(zoneTextValue(31, text), kCannotOpen);
  EXPECT_EQ(std::tuple(value, text, clock), std::tuple(-7.0f, "        "s, 0));  // given up at once
  const std::string expected = "Zone database '" + dir.file("zone.inf") + "' cannot be read: its lock file '" + lock +
                               "' can be neither taken nor broken";
  EXPECT_EQ(fatalMessages(), std::vector<std::string>(2, expected));
  EXPECT_TRUE(fs::is_directory(lock));

  setFatalHandler(previous);
  setLockTimingForTesting({});
  resetZoneNamesForTesting();
}

}  // namespace
}  // namespace pc::zonedb
