#include "zonedb/zone_database.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <array>
#include <filesystem>

#include "support/test_support.h"
#include "zonedb/zone_database_testing.h"
#include "zonedb/zone_file_builder.h"
#include "zonedb/zone_status.h"

namespace pc::zonedb {
namespace {

using test::ZoneBytes;

// A zone directory in TRXZONE, queried with a clock that only moves when the
// lock sleeps, so that no test can hang on a lock.
class ZoneQuery : public testing::Test {
 protected:
  ZoneQuery() : zone_("TRXZONE", dir_.path()) {
    resetZoneNamesForTesting();
    setLockTimingForTesting({[this] { return clock_; }, [this](unsigned ms) {
                               clock_ += ms;
                               ++sleeps_;
                             }});
  }
  ~ZoneQuery() override {
    setLockTimingForTesting({});
    resetZoneNamesForTesting();
  }

  std::string database() const { return dir_.file("zone.inf"); }
  void store(const std::string& bytes) { test::writeFile(database(), bytes); }
  // The status of an EC query on `bytes`, checking that the file is left
  // exactly as it was and the lock is gone.
  int scaleStatus(const std::string& bytes, float& value) {
    store(bytes);
    const int status = zoneRealValue(6, value);
    EXPECT_EQ(test::readFile(database()), bytes);
    EXPECT_FALSE(test::fileExists(dir_.file("zone.lck")));
    return status;
  }
  int scaleStatus(const std::string& bytes) {
    float value = -7.0f;
    return scaleStatus(bytes, value);
  }

  test::TempDir dir_;
  test::ScopedEnv zone_;
  std::int64_t clock_ = 0;
  int sleeps_ = 0;
};

std::string ec(const ZoneBytes& z, float value, char state = ' ') {
  return ZoneBytes::record("001C 002C 001R ", state, "EC", z.real(value));
}
std::string textRecord(const std::string& code, const std::string& text, char state = ' ') {
  return ZoneBytes::record("001C 002C 001S ", state, code, ZoneBytes::text(text));
}

TEST_F(ZoneQuery, ScaleInBothByteOrdersSkipsDeletedRecords) {
  for (const bool big : {false, true}) {
    const ZoneBytes z{big};
    float value = 0.0f;
    const std::string bytes =
        z.file({textRecord("PJ", "project"), ec(z, 2.0f, 'X'), ec(z, 3.0f, 'x'), ec(z, 25.4f), ec(z, 9.0f)});
    EXPECT_EQ(scaleStatus(bytes, value), 4) << big;
    EXPECT_EQ(value, 25.4f) << big;
  }
  EXPECT_EQ(sleeps_, 0);
}

TEST_F(ZoneQuery, NoDatabaseIsNoRecordAndLeavesNothing) {
  float value = 3.0f;
  EXPECT_EQ(zoneRealValue(6, value), kNoRecord);
  EXPECT_EQ(value, 3.0f);
  std::array<char, 8> text;
  EXPECT_EQ(zoneTextValue(31, text), kNoRecord);
  EXPECT_EQ(std::string(text.data(), text.size()), "        ");
  EXPECT_TRUE(std::filesystem::is_empty(dir_.path()));
}

TEST_F(ZoneQuery, RealValueFailures) {
  const ZoneBytes z;
  float value = -7.0f;
  EXPECT_EQ(scaleStatus(z.file({textRecord("PJ", "p"), ec(z, 1.0f, 'X')}), value), kNoRecord);
  // The right code with another format, or an unknown letter in it.
  EXPECT_EQ(scaleStatus(z.file({ZoneBytes::record("001C 002C 001I ", ' ', "EC", z.i32(2))})), kBadFormat);
  EXPECT_EQ(scaleStatus(z.file({ZoneBytes::record("001C 002C 001Y ", ' ', "EC", z.real(2))})), kBadFormat);
  EXPECT_EQ(value, -7.0f);
  // An integer item asked for as a real.
  store(z.file({ZoneBytes::record("001C 002C 001I ", ' ', "CN", z.i32(2))}));
  EXPECT_EQ(zoneRealValue(5, value), kWrongFieldType);
  // Not real items of the zone: no file access at all.
  EXPECT_EQ(zoneRealValue(0, value), kNoRecord);
  EXPECT_EQ(zoneRealValue(13, value), kNoRecord);
  EXPECT_EQ(zoneRealValue(99, value), kNoRecord);
  EXPECT_EQ(value, -7.0f);
}

TEST_F(ZoneQuery, DamagedFilesGiveTheirStatusAndStayUntouched) {
  const ZoneBytes z;
  const std::string good = z.file({textRecord("PJ", "p"), ec(z, 2.0f)});
  EXPECT_EQ(scaleStatus(good.substr(0, 100)), kEndOfFile);         // cut in the header
  EXPECT_EQ(scaleStatus(good.substr(0, 162)), kEndOfFile);         // cut in a record header
  EXPECT_EQ(scaleStatus(good.substr(0, good.size() - 1)), kEndOfFile);  // cut in the data
  std::string longRecord = good;
  longRecord.replace(160, 2, z.u16(5000));                        // length beyond the end
  EXPECT_EQ(scaleStatus(longRecord), kEndOfFile);
  EXPECT_EQ(scaleStatus(z.file({"001C 002C 001S  EC"})), kBadFormat);  // no NUL
  EXPECT_EQ(scaleStatus(z.file({std::string("001C ") + '\0' + " E"})), kBeyondRecord);
  std::string magic = good;
  magic[0] = 'q';
  EXPECT_EQ(scaleStatus(magic), kBadMagic);
  std::string unreadable = good;
  unreadable[154] = 0;
  EXPECT_EQ(scaleStatus(unreadable), kUnreadableFile);
  std::string farFirst = good;
  farFirst.replace(12, 4, z.u32(100000));
  EXPECT_EQ(scaleStatus(farFirst), kEndOfFile);
  EXPECT_EQ(scaleStatus(z.header(0)), kNoRecord);
  EXPECT_EQ(scaleStatus(std::string()), kEndOfFile);
  std::filesystem::remove(database());
  std::filesystem::create_directory(database());
  float value = 0;
  EXPECT_EQ(zoneRealValue(6, value), kCannotOpen);
}

TEST_F(ZoneQuery, NumberedRecordTextIsCutAndPadded) {
  const ZoneBytes z{true};
  store(z.file({textRecord("05", "five"), textRecord("31", "9.9", 'X'), ec(z, 1.0f),
                textRecord("31", "0.5\1\1\1\1"), textRecord("31", "later")}));
  std::array<char, 60> text;
  text.fill('?');
  EXPECT_EQ(zoneTextValue(31, text), 4);
  EXPECT_EQ(std::string(text.data(), 60), "0.5" + std::string(57, ' '));
  EXPECT_EQ(zoneTextValue(131, text), 4);  // the two last digits
  EXPECT_EQ(zoneTextValue(5, text), 1);
  EXPECT_EQ(std::string(text.data(), 60), "five" + std::string(56, ' '));
  std::array<char, 4> small;
  EXPECT_EQ(zoneTextValue(5, small), 1);
  EXPECT_EQ(std::string(small.data(), 4), "fiv ");  // cut to the length minus one
  EXPECT_EQ(zoneTextValue(32, text), kNoRecord);
  EXPECT_EQ(std::string(text.data(), 60), std::string(60, ' '));
}

TEST_F(ZoneQuery, TextLongerThanTheLimit) {
  const ZoneBytes z;
  store(z.file({textRecord("31", std::string(255, 'a')), textRecord("32", std::string(241, 'b') + "\1\1\1")}));
  std::array<char, 60> text;
  text.fill('?');
  EXPECT_EQ(zoneTextValue(31, text), kTextOverLimit);
  EXPECT_EQ(std::string(text.data(), 60), std::string(60, ' '));
  EXPECT_EQ(zoneTextValue(32, text), 2);
  EXPECT_EQ(std::string(text.data(), 60), std::string(59, 'b') + " ");
}

TEST_F(ZoneQuery, ItemRequestsUseTheReaderOfTheirType) {
  const ZoneBytes z;
  store(z.file({ZoneBytes::record("001C 002C 001I ", ' ', "CN", z.i32(-42)),
                ZoneBytes::record("001C 002C 002I ", ' ', "CB", z.i32(7) + z.i32(3)), ec(z, 25.4f),
                textRecord("13", "thirteen")}));
  std::array<char, 10> text;
  const std::pair<int, const char*> cases[] = {
      {105, "-42       "}, {109, "7 3       "}, {106, "25.4      "}, {113, "thirteen  "}, {110, "          "}};
  const int statuses[] = {1, 2, 3, 4, kNoRecord};
  for (int i = 0; i < 5; ++i) {
    EXPECT_EQ(zoneTextValue(cases[i].first, text), statuses[i]);
    EXPECT_EQ(std::string(text.data(), text.size()), cases[i].second);
  }
}

TEST_F(ZoneQuery, AbandonedForeignLockIsBrokenAndRemovedAfterwards) {
  const ZoneBytes z;
  store(z.file({ec(z, 2.5f)}));
  test::writeFile(dir_.file("zone.lck"), std::string("999999999") + '\0');
  float value = 0;
  EXPECT_EQ(zoneRealValue(6, value), 1);
  EXPECT_EQ(value, 2.5f);
  EXPECT_EQ(sleeps_, 50);  // 10 seconds of 200 ms polls
  EXPECT_FALSE(test::fileExists(dir_.file("zone.lck")));
}

TEST_F(ZoneQuery, LockThatCannotBeTakenFailsTheQuery) {
  const ZoneBytes z;
  store(z.file({ec(z, 2.5f)}));
  std::filesystem::create_directory(dir_.file("zone.lck"));  // neither readable nor removable as a file
  float value = 0;
  EXPECT_EQ(zoneRealValue(6, value), kCannotOpen);
  EXPECT_EQ(value, 0.0f);
  EXPECT_EQ(sleeps_, 50);
  // A zone directory that does not exist fails at once.
  test::ScopedEnv other("TRXZONE", dir_.file("absent"));
  resetZoneNamesForTesting();
  EXPECT_EQ(zoneRealValue(6, value), kCannotOpen);
  EXPECT_EQ(sleeps_, 50);
}

TEST_F(ZoneQuery, NamesAreBuiltOnceAndDefaultToTheCurrentDirectory) {
  const ZoneBytes z;
  store(z.file({ec(z, 4.0f)}));
  float value = 0;
  ASSERT_EQ(zoneRealValue(6, value), 1);
  {
    // Without a reset the first zone stays in use.
    test::ScopedEnv other("TRXZONE", dir_.file("absent"));
    EXPECT_EQ(zoneRealValue(6, value), 1);
  }
  test::TempDir cwdZone;
  test::writeFile(cwdZone.file("zone.inf"), z.file({ec(z, 8.0f)}));
  const auto previous = std::filesystem::current_path();
  std::filesystem::current_path(cwdZone.path());
  for (const std::optional<std::string>& setting : {std::optional<std::string>(), std::optional<std::string>("")}) {
    test::ScopedEnv unset("TRXZONE", setting);
    resetZoneNamesForTesting();
    value = 0;
    EXPECT_EQ(zoneRealValue(6, value), 1);
    EXPECT_EQ(value, 8.0f);
  }
  std::filesystem::current_path(previous);
  EXPECT_FALSE(test::fileExists(cwdZone.file("zone.lck")));
}

}  // namespace
}  // namespace pc::zonedb
