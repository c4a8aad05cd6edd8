#include "tool/unit_scale.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <limits>

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
    queries = 0;
    unit_scale_testing::setZoneScaleQuery([this, status, value](float& out) {
      ++queries;
      if (status >= 1) out = value;
      return status;
    });
  }

  // One deciding call: the scale and the console output.
  std::pair<float, std::string> decide() {
    env_testing::resetWorkZone();
    unit_scale_testing::reset();
    float scale = -99.0f;
    testing::internal::CaptureStdout();
    unitScale(&scale);
    std::fflush(stdout);
    return {scale, testing::internal::GetCapturedStdout()};
  }

  test::TempDir tmp;
  test::ScopedEnv tmpEnv{"TRXTMPDIR", tmp.path()};
  test::ScopedEnv units{"TRXUNITS", std::nullopt};
  int queries = 0;
};

TEST_F(UnitScaleTest, DatabaseAndLocalScaleFiles) {
  const char* const none = nullptr;
  const float nan = std::numeric_limits<float>::quiet_NaN();
  // Database status and value, then ".dat" and ".tmp" contents; the scale,
  // the banner's two numbers and the ".tmp" file afterwards.
  struct Row { int status; float database; const char *dat, *tmp; float scale; const char *banner, *copy; };
  std::vector<Row> rows = {
      {3, 25.4f, none, none, 25.4f, none, none},  {-23, 0.0f, none, none, 1.0f, none, none},
      {1, -3.0f, none, none, 1.0f, none, none},   {1, nan, none, none, 1.0f, none, none},
      {-23, 0.0f, "3.0   ignored\nsecond record\n", none, 3.0f, "1.0 3.0", " 3.0\n"},
      {1, 25.4f, "2.5e-1\n", " 7.0\n old\n", 0.25f, "25.4 0.25", " 0.25\n"},  // .dat wins, replaces the copy
      {1, 2.0f, "0\n", none, 1.0f, "2.0 0.0", " 0.0\n"},  // announced, then replaced by 1
      {1, 1.0f, none, " 1.0\n", 1.0f, none, " 1.0\n"},
      {1, 2.0f, none, "0.5,3\n", 0.5f, "2.0 0.5", "0.5,3\n"}};
  for (const char* dat : {"", "\n3.0\n", "abc\n", "nan\n"}) rows.push_back({1, 2.0f, dat, none, 2.0f, none, " -1.0\n"});
  for (const Row& r : rows) {
    SCOPED_TRACE(&r - rows.data());
    test::TempDir dir;
    test::ScopedEnv dirEnv("TRXTMPDIR", dir.path());
    if (r.dat) test::writeFile(dir.file("localscale.dat"), r.dat);
    if (r.tmp) test::writeFile(dir.file("localscale.tmp"), r.tmp);
    setDatabase(r.status, r.database);
    const std::string banner =
        r.banner ? " *******\n you are using local_scale " + std::string(r.banner) + "\n *******\n" : "";
    EXPECT_EQ(decide(), std::pair(r.scale, banner));
    const auto contents = [&dir](const char* name) {
      return test::fileExists(dir.file(name)) ? test::readFile(dir.file(name)) : "(none)";
    };
    EXPECT_EQ(contents("localscale.tmp"), r.copy ? r.copy : "(none)");
    EXPECT_EQ(contents("localscale.dat"), r.dat ? r.dat : "(none)");
  }

  // A .dat that cannot be opened is skipped silently; no copy is made.
  std::filesystem::create_directory(tmp.file("localscale.dat"));
  setDatabase(1, 2.0f);
  EXPECT_EQ(decide(), std::pair(2.0f, std::string()));
  EXPECT_FALSE(test::fileExists(tmp.file("localscale.tmp")));
}

TEST_F(UnitScaleTest, RealZoneDatabaseAndUnitSystemDecidedOncePerRun) {
  test::TempDir zone;
  test::ScopedEnv zoneEnv("TRXZONE", zone.path());
  zonedb::resetZoneNamesForTesting();
  // A little-endian "zone.inf": magic, first record at 160, readable flag;
  // then one record of 23 bytes, the scale "EC".
  std::string file = "QZTB" + std::string(156, '\0');
  file[12] = static_cast<char>(160);
  file[154] = 1;
  file += std::string("\x17\0\0\0" "001C 002C 001R \0 EC", 23);
  test::putFloat(file, 25.4f);
  test::writeFile(zone.file("zone.inf"), file);
  const std::pair<std::optional<std::string>, int> cases[] = {
      {"inch", 2}, {"inch  ", 2}, {"Inch", 1}, {" inch", 1}, {std::nullopt, 1}};
  for (const auto& [value, system] : cases) {
    test::ScopedEnv setting("TRXUNITS", value);
    EXPECT_EQ(decide().first, 25.4f);
    EXPECT_EQ(unit_scale_testing::unitSystem(), system) << value.value_or("(unset)");
  }
  zonedb::resetZoneNamesForTesting();

  // Later calls give the first answer without asking or reading again.
  setDatabase(1, 8.0f);
  test::writeFile(tmp.file("localscale.dat"), "4.0\n");
  float scale = 0.0f;
  unitScale(&scale);
  EXPECT_EQ(std::pair(scale, queries), std::pair(25.4f, 0));
}

}  // namespace
}  // namespace pc
