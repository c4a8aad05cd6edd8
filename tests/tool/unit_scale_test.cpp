#include "tool/unit_scale.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <limits>
#include <vector>

#include "env/env_testing.h"
#include "support/test_support.h"
#include "tool/unit_scale_testing.h"
#include "zonedb/zone_database_testing.h"

namespace pc {
namespace {

class UnitScaleTest : public testing::Test {
 protected:
  ~UnitScaleTest() override {
    unit_scale_testing::setZoneScaleQuery({});
    unit_scale_testing::reset();
    env_testing::resetWorkZone();
  }

  // The zone database answers `status` and, when found, `value`.
  void setDatabase(int status, float value) {
    unit_scale_testing::setZoneScaleQuery([this, status, value](float& out) {
      ++queries;
      if (status >= 1) out = value;
      return status;
    });
  }

  // One deciding call: the scale, with the console output in `printed`.
  float decide() {
    env_testing::resetWorkZone();
    unit_scale_testing::reset();
    float scale = -99.0f;
    testing::internal::CaptureStdout();
    unitScale(&scale);
    std::fflush(stdout);
    printed = testing::internal::GetCapturedStdout();
    return scale;
  }

  test::TempDir tmp;
  test::ScopedEnv tmpEnv{"TRXTMPDIR", tmp.path()};
  test::ScopedEnv units{"TRXUNITS", std::nullopt};
  int queries = 0;
  std::string printed;
};

TEST_F(UnitScaleTest, DatabaseAndLocalScaleFiles) {
  const char* const none = nullptr;
  const float nan = std::numeric_limits<float>::quiet_NaN();
  // Database status and value, then ".dat" and ".tmp" contents; the scale,
  // the banner's two numbers and the ".tmp" file afterwards.
  struct Row { int status; float database; const char* dat; const char* tmp; float scale; const char* banner;
               const char* copy; };
  std::vector<Row> rows = {
      {1, 1.0f, none, none, 1.0f, none, none},    {3, 25.4f, none, none, 25.4f, none, none},
      {-23, 0.0f, none, none, 1.0f, none, none},  {1, -3.0f, none, none, 1.0f, none, none},
      {1, nan, none, none, 1.0f, none, none},
      {1, 25.4f, "  1.0   ignored\nsecond record\n", none, 1.0f, "25.4 1.0", " 1.0\n"},
      {1, 25.4f, "2.5e-1\n", " 7.0\n old\n", 0.25f, "25.4 0.25", " 0.25\n"},  // .dat wins, replaces the copy
      {-23, 0.0f, "3.0\n", none, 3.0f, "1.0 3.0", " 3.0\n"},
      {1, 2.0f, "0\n", none, 1.0f, "2.0 0.0", " 0.0\n"},  // announced, then replaced by 1
      {1, 2.0f, "-5\n", none, 2.0f, none, " -5.0\n"},
      {1, 1.0f, none, " 1.0\n", 1.0f, none, " 1.0\n"},
      {1, 2.0f, none, "0.5,3\n", 0.5f, "2.0 0.5", "0.5,3\n"},
      {1, 2.0f, none, " -1.0\n", 2.0f, none, " -1.0\n"}};
  for (const char* noScale : {"", "\n3.0\n", "abc\n", "nan\n"}) {
    rows.push_back({1, 2.0f, noScale, none, 2.0f, none, " -1.0\n"});
  }
  for (const Row& r : rows) {
    SCOPED_TRACE(testing::Message() << r.status << " " << r.database << " dat " << (r.dat ? r.dat : "-")
                                    << " tmp " << (r.tmp ? r.tmp : "-"));
    test::TempDir dir;
    test::ScopedEnv dirEnv("TRXTMPDIR", dir.path());
    if (r.dat) test::writeFile(dir.file("localscale.dat"), r.dat);
    if (r.tmp) test::writeFile(dir.file("localscale.tmp"), r.tmp);
    setDatabase(r.status, r.database);
    EXPECT_EQ(decide(), r.scale);
    EXPECT_EQ(printed, r.banner ? " *******\n you are using local_scale " + std::string(r.banner) + "\n *******\n"
                                : "");
    const std::string copy = dir.file("localscale.tmp");
    EXPECT_EQ(test::fileExists(copy) ? test::readFile(copy) : "(none)", r.copy ? r.copy : "(none)");
    if (r.dat) {
      EXPECT_EQ(test::readFile(dir.file("localscale.dat")), r.dat);
    }
  }

  // A .dat that cannot be opened is skipped silently; no copy is made.
  std::filesystem::create_directory(tmp.file("localscale.dat"));
  setDatabase(1, 2.0f);
  EXPECT_EQ(decide(), 2.0f);
  EXPECT_EQ(printed, "");
  EXPECT_FALSE(test::fileExists(tmp.file("localscale.tmp")));
}

TEST_F(UnitScaleTest, UnitSystemFromTrxunitsLeavesTheScaleAlone) {
  setDatabase(1, 25.4f);
  const std::pair<std::optional<std::string>, int> cases[] = {
      {"inch", 2}, {"inch  ", 2}, {"Inch", 1}, {" inch", 1}, {std::nullopt, 1}};
  for (const auto& [value, system] : cases) {
    test::ScopedEnv setting("TRXUNITS", value);
    EXPECT_EQ(decide(), 25.4f);
    EXPECT_EQ(unit_scale_testing::unitSystem(), system) << value.value_or("(unset)");
  }
}

TEST_F(UnitScaleTest, DecidedOncePerRun) {
  setDatabase(1, 25.4f);
  test::writeFile(tmp.file("localscale.dat"), "2.0\n");
  EXPECT_EQ(decide(), 2.0f);
  test::writeFile(tmp.file("localscale.dat"), "4.0\n");
  setDatabase(1, 8.0f);
  float scale = 0.0f;
  unitScale(&scale);
  EXPECT_EQ(scale, 2.0f);
  EXPECT_EQ(queries, 1);
  EXPECT_EQ(test::readFile(tmp.file("localscale.tmp")), " 2.0\n");
}

TEST_F(UnitScaleTest, RealZoneDatabase) {
  test::TempDir zone;
  test::ScopedEnv zoneEnv("TRXZONE", zone.path());
  zonedb::resetZoneNamesForTesting();
  unit_scale_testing::setZoneScaleQuery({});
  // A little-endian "zone.inf": 160-byte header, then one real record.
  std::string file = "QZTB";
  for (const int field : {0, 160, 160, 1}) test::putInt32(file, field);
  file.resize(160, '\0');
  file[154] = 1;
  std::string record("001C 002C 001R \0 EC", 19);  // format, NUL, state, code
  test::putFloat(record, 25.4f);
  test::putInt16(file, static_cast<std::int16_t>(record.size()));
  test::putInt16(file, 0);
  test::writeFile(zone.file("zone.inf"), file + record);
  EXPECT_EQ(decide(), 25.4f);
  zonedb::resetZoneNamesForTesting();
}

}  // namespace
}  // namespace pc
