#include "tool/unit_scale.h"

#include <gtest/gtest.h>

#include <cmath>
#include <filesystem>
#include <limits>

#include "env/env_testing.h"
#include "support/test_support.h"
#include "tool/unit_scale_testing.h"
#include "zonedb/zone_database_testing.h"
#include "zonedb/zone_file_builder.h"

namespace pc {
namespace {

const char* const kBanner = " *******\n you are using local_scale ";

class UnitScaleTest : public testing::Test {
 protected:
  UnitScaleTest() {
    env_testing::resetWorkZone();
    unit_scale_testing::reset();
    setDatabase(0, 0.0f);
  }
  ~UnitScaleTest() override {
    unit_scale_testing::setZoneScaleQuery({});
    unit_scale_testing::reset();
    env_testing::resetWorkZone();
  }

  // The zone database answers `status` and, when found, `value`.
  void setDatabase(int status, float value) {
    unit_scale_testing::setZoneScaleQuery([this, status, value](float& out) {
      ++queries_;
      if (status >= 1) out = value;
      return status;
    });
  }

  // One deciding call: the scale, with the console output in `printed_`.
  float decide() {
    unit_scale_testing::reset();
    float scale = -99.0f;
    testing::internal::CaptureStdout();
    unitScale(&scale);
    std::fflush(stdout);
    printed_ = testing::internal::GetCapturedStdout();
    return scale;
  }

  std::string dat() const { return tmp_.file("localscale.dat"); }
  std::string copy() const { return tmp_.file("localscale.tmp"); }

  test::TempDir tmp_;
  test::ScopedEnv tmpEnv_{"TRXTMPDIR", tmp_.path()};
  test::ScopedEnv units_{"TRXUNITS", std::nullopt};
  int queries_ = 0;
  std::string printed_;
};

TEST_F(UnitScaleTest, DatabaseScaleWithoutLocalFiles) {
  setDatabase(1, 1.0f);
  EXPECT_EQ(decide(), 1.0f);
  EXPECT_EQ(printed_, "");
  setDatabase(3, 25.4f);
  EXPECT_EQ(decide(), 25.4f);
  EXPECT_EQ(printed_, "");
  EXPECT_TRUE(std::filesystem::is_empty(tmp_.path()));
  EXPECT_EQ(unit_scale_testing::unitSystem(), 1);
}

TEST_F(UnitScaleTest, LocalScaleFileOverridesAndIsCopied) {
  setDatabase(1, 25.4f);
  test::writeFile(dat(), "  1.0   ignored\nsecond record\n");
  EXPECT_EQ(decide(), 1.0f);
  EXPECT_EQ(printed_, std::string(kBanner) + "25.4 1.0\n *******\n");
  EXPECT_EQ(test::readFile(copy()), " 1.0\n");
  EXPECT_EQ(test::readFile(dat()), "  1.0   ignored\nsecond record\n");

  // The .dat file wins over an existing copy, which it replaces.
  test::writeFile(dat(), "2.5e-1\n");
  test::writeFile(copy(), " 7.0\n old\n");
  EXPECT_EQ(decide(), 0.25f);
  EXPECT_EQ(printed_, std::string(kBanner) + "25.4 0.25\n *******\n");
  EXPECT_EQ(test::readFile(copy()), " 0.25\n");
}

TEST_F(UnitScaleTest, CopyIsUsedWhenTheDatFileIsAbsent) {
  setDatabase(1, 1.0f);
  test::writeFile(copy(), " 1.0\n");
  EXPECT_EQ(decide(), 1.0f);
  EXPECT_EQ(printed_, "");
  setDatabase(1, 2.0f);
  test::writeFile(copy(), "0.5,3\n");
  EXPECT_EQ(decide(), 0.5f);
  EXPECT_EQ(printed_, std::string(kBanner) + "2.0 0.5\n *******\n");
  EXPECT_EQ(test::readFile(copy()), "0.5,3\n");
  EXPECT_FALSE(test::fileExists(dat()));
}

TEST_F(UnitScaleTest, FilesWithoutAUsableScale) {
  setDatabase(1, 2.0f);
  const struct {
    const char* content;
    const char* copied;
  } cases[] = {{"-5\n", " -5.0\n"}, {"", " -1.0\n"}, {"\n3.0\n", " -1.0\n"}, {"abc\n", " -1.0\n"}, {"nan\n", " -1.0\n"}};
  for (const auto& c : cases) {
    test::writeFile(dat(), c.content);
    EXPECT_EQ(decide(), 2.0f) << c.content;
    EXPECT_EQ(printed_, "") << c.content;
    EXPECT_EQ(test::readFile(copy()), c.copied) << c.content;
  }
  // The copy holding -1.0 is no local scale either.
  std::filesystem::remove(dat());
  EXPECT_EQ(decide(), 2.0f);
  EXPECT_EQ(printed_, "");
  // A .dat that cannot be opened is skipped silently; no copy is made.
  std::filesystem::remove(copy());
  std::filesystem::create_directory(dat());
  EXPECT_EQ(decide(), 2.0f);
  EXPECT_EQ(printed_, "");
  EXPECT_FALSE(test::fileExists(copy()));
}

TEST_F(UnitScaleTest, FallbacksToOne) {
  setDatabase(-23, 0.0f);
  EXPECT_EQ(decide(), 1.0f);
  test::writeFile(dat(), "3.0\n");
  EXPECT_EQ(decide(), 3.0f);
  EXPECT_EQ(printed_, std::string(kBanner) + "1.0 3.0\n *******\n");
  std::filesystem::remove(dat());
  std::filesystem::remove(copy());

  for (const float bad : {0.0f, -3.0f, std::numeric_limits<float>::quiet_NaN(),
                          std::numeric_limits<float>::infinity()}) {
    setDatabase(1, bad);
    EXPECT_EQ(decide(), 1.0f) << bad;
    EXPECT_EQ(printed_, "");
  }
  // A zero local scale is announced, then replaced by 1.
  setDatabase(1, 2.0f);
  test::writeFile(dat(), "0\n");
  EXPECT_EQ(decide(), 1.0f);
  EXPECT_EQ(printed_, std::string(kBanner) + "2.0 0.0\n *******\n");
}

TEST_F(UnitScaleTest, UnitSystemFromTrxunitsLeavesTheScaleAlone) {
  setDatabase(1, 25.4f);
  const struct {
    std::optional<std::string> value;
    int system;
  } cases[] = {{"inch", 2}, {"inch  ", 2}, {"Inch", 1}, {" inch", 1}, {"mm", 1}, {std::nullopt, 1}};
  for (const auto& c : cases) {
    test::ScopedEnv units("TRXUNITS", c.value);
    EXPECT_EQ(decide(), 25.4f);
    EXPECT_EQ(unit_scale_testing::unitSystem(), c.system) << c.value.value_or("(unset)");
  }
}

TEST_F(UnitScaleTest, DecidedOncePerRun) {
  setDatabase(1, 25.4f);
  test::writeFile(dat(), "2.0\n");
  EXPECT_EQ(decide(), 2.0f);
  EXPECT_EQ(queries_, 1);
  test::writeFile(dat(), "4.0\n");
  setDatabase(1, 8.0f);
  queries_ = 0;
  float scale = 0.0f;
  testing::internal::CaptureStdout();
  unitScale(&scale);
  std::fflush(stdout);
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
  EXPECT_EQ(scale, 2.0f);
  EXPECT_EQ(queries_, 0);
  EXPECT_EQ(test::readFile(copy()), " 2.0\n");
}

TEST_F(UnitScaleTest, RealZoneDatabase) {
  test::TempDir zone;
  test::ScopedEnv zoneEnv("TRXZONE", zone.path());
  zonedb::resetZoneNamesForTesting();
  unit_scale_testing::setZoneScaleQuery({});
  const test::ZoneBytes z;
  test::writeFile(zone.file("zone.inf"),
                  z.file({test::ZoneBytes::record("001C 002C 001R ", 'X', "EC", z.real(5.0f)),
                          test::ZoneBytes::record("001C 002C 001R ", ' ', "EC", z.real(25.4f))}));
  EXPECT_EQ(decide(), 25.4f);
  std::filesystem::remove(zone.file("zone.inf"));
  EXPECT_EQ(decide(), 1.0f);
  EXPECT_TRUE(std::filesystem::is_empty(zone.path()));
  zonedb::resetZoneNamesForTesting();
}

}  // namespace
}  // namespace pc
