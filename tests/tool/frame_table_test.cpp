#include "tool/frame_table.h"

#include <gtest/gtest.h>

#include <cstring>
#include <filesystem>
#include <string>
#include <vector>

#include "env/diagnostic_channels.h"
#include "env/env_testing.h"
#include "support/test_support.h"
#include "tool/file_names.h"
#include "tool/tool_view.h"

namespace pc {
namespace {

std::vector<std::string>& warnings() {
  static std::vector<std::string> lines;
  return lines;
}
void keepWarning(const char* message) { warnings().push_back(message); }

const std::string kIdentityView = "view\n1 0 0 0\n0 1 0 0\n0 0 1 0\n0 0 0 1\n1 0 0 0\n0 1 0 0\n0 0 1 0\n0 0 0 1\n";
// A translation by (10, 0, 0): the fourth line is the last column.
const std::string kShiftedView = "view\n1 0 0 0\n0 1 0 0\n0 0 1 0\n10 0 0 1\n1 0 0 0\n0 1 0 0\n0 0 1 0\n0 0 0 1\n";

double at(const Matrix4& m, int r, int c) { return m[static_cast<std::size_t>(4 * r + c)]; }

Matrix4 diagonal(double a, double d) {
  Matrix4 m = scaleMatrix(a);
  m[15] = d;
  return m;
}

class FrameTableTest : public testing::Test {
 protected:
  FrameTableTest() : zoneEnv_("TRXZONE", dir_.path()) {
    env_testing::resetProcessState();
    resetFrameTable();
    warnings().clear();
    previous_ = setWarningHandler(keepWarning);
  }
  ~FrameTableTest() override {
    setWarningHandler(previous_);
    resetFrameTable();
    env_testing::resetProcessState();
  }
  std::string file(const std::string& name, const std::string& bytes) const {
    test::writeFile(dir_.file(name), bytes);
    return dir_.file(name);
  }
  std::string machineFile() const { return dir_.file("transfo.dat"); }
  Frame& frame(int index) { return frameTable()[static_cast<std::size_t>(index)]; }

  test::TempDir dir_;
  test::ScopedEnv zoneEnv_;
  MessageHandler previous_ = nullptr;
};

TEST_F(FrameTableTest, IdentityViewAtUnitAndInchScales) {
  const std::string view = file("outil12.mul", kIdentityView);
  ASSERT_EQ(loadView(kToolViewKind, 1.0, view.c_str()), 0);
  const Frame& f = frame(kToolViewFrame);
  EXPECT_TRUE(f.defined && f.loaded && f.matIsIdentity && f.matlecIsIdentity);
  EXPECT_EQ(f.mat, identityMatrix());
  EXPECT_EQ(f.inv_mat, identityMatrix());
  EXPECT_EQ(f.name[0], '\0');  // names belong to identity definitions only
  resetFrameTable();
  ASSERT_EQ(loadView(kToolViewKind, 25.4, view.c_str()), 0);
  EXPECT_EQ(f.mat, diagonal(1.0 / 25.4, 1.0));
  EXPECT_EQ(f.inv_mat, diagonal(25.4, 1.0));
  EXPECT_TRUE(f.matIsIdentity);  // flagged as read, before the scale
  EXPECT_TRUE(f.matlecIsIdentity);
  EXPECT_TRUE(warnings().empty());
}

TEST_F(FrameTableTest, CadAndCaoNeedNoFile) {
  for (const char* name : {"CAD", "CAO"}) {
    resetFrameTable();
    ASSERT_EQ(defineView(4, name), 0);
    EXPECT_TRUE(frame(4).defined && frame(4).loaded && frame(4).matIsIdentity);
    EXPECT_STREQ(frame(4).name.data(), name);
    EXPECT_EQ(frame(4).mat, identityMatrix());
  }
  EXPECT_EQ(defineView(4, "cad"), -1);  // exact names only; no file "cad"
  EXPECT_TRUE(warnings().empty());
}

TEST_F(FrameTableTest, MachineFrameAsIdentityAndFromItsFile) {
  ASSERT_EQ(loadView(kToolViewKind, 1.0, file("v.mul", kShiftedView).c_str()), 0);
  const Frame& machine = frame(kMachineFrame);
  EXPECT_TRUE(machine.defined && machine.loaded && machine.matIsIdentity);
  EXPECT_STREQ(machine.name.data(), machineFile().c_str());
  // The identity machine frame against the shifted tool view.
  EXPECT_EQ(at(machine.matlec, 0, 3), -10.0);
  EXPECT_EQ(at(machine.matecr, 0, 3), 10.0);
  EXPECT_FALSE(machine.matlecIsIdentity);
  resetFrameTable();
  ASSERT_EQ(defineView(kMachineFrame, "MACHINE"), 0);
  EXPECT_STREQ(frame(kMachineFrame).name.data(), "MACHINE");

  file("transfo.dat", kShiftedView);
  resetFrameTable();
  ASSERT_EQ(loadView(kToolViewKind, 1.0, file("v.mul", kIdentityView).c_str()), 0);
  EXPECT_TRUE(machine.defined && machine.loaded && !machine.matIsIdentity);
  EXPECT_EQ(machine.name[0], '\0');
  EXPECT_EQ(at(machine.inv_mat, 0, 3), -10.0);
  EXPECT_EQ(at(machine.matlec, 0, 3), 10.0);
  EXPECT_EQ(at(machine.matecr, 0, 3), -10.0);
  resetFrameTable();
  ASSERT_EQ(defineView(6, "MACHINE"), 0);
  EXPECT_EQ(at(frame(6).mat, 0, 3), 10.0);
  EXPECT_TRUE(warnings().empty());
}

TEST_F(FrameTableTest, ScalingTheToolViewUpdatesEveryLoadedFrame) {
  file("transfo.dat", kShiftedView);
  ASSERT_EQ(defineView(0, "CAD"), 0);
  ASSERT_EQ(defineView(7, file("seven.mul", kShiftedView).c_str()), 0);
  ASSERT_EQ(loadView(kToolViewKind, 2.0, file("v.mul", kIdentityView).c_str()), 0);
  const Matrix4& viewInverse = frame(kToolViewFrame).inv_mat;
  const Matrix4& viewMat = frame(kToolViewFrame).mat;
  for (int g : {0, 1, 2, 7}) {
    const Frame& f = frame(g);
    SCOPED_TRACE(g);
    EXPECT_EQ(f.matlec, multiply(f.mat, viewInverse));
    EXPECT_EQ(f.matecr, multiply(viewMat, f.inv_mat));
  }
  EXPECT_EQ(frame(0).matlec, diagonal(2.0, 1.0));  // the design frame in half-size units
  EXPECT_FALSE(frame(0).matlecIsIdentity);
  EXPECT_TRUE(frame(kToolViewFrame).matlecIsIdentity);
  // Frames never defined are left alone.
  EXPECT_EQ(frame(5).matlec, Matrix4{});
}

TEST_F(FrameTableTest, AbsentUnopenableAndMalformedViews) {
  EXPECT_EQ(loadView(kToolViewKind, 1.0, dir_.file("absent.mul").c_str()), -1);
  EXPECT_TRUE(warnings().empty());
  EXPECT_FALSE(frame(kToolViewFrame).loaded);
  EXPECT_FALSE(frame(kMachineFrame).loaded);  // not reached without a view

  std::filesystem::create_directory(dir_.file("dir.mul"));
  EXPECT_EQ(loadView(kToolViewKind, 1.0, dir_.file("dir.mul").c_str()), -1);
  const std::string bad = file("bad.mul", "view\n1 0 0\n0 1 0\n");
  EXPECT_EQ(loadView(kToolViewKind, 1.0, bad.c_str()), -1);
  EXPECT_EQ(warnings(), (std::vector<std::string>{"cannot open " + dir_.file("dir.mul"), "read error " + bad}));
  EXPECT_FALSE(frame(kToolViewFrame).loaded);
  EXPECT_FALSE(frame(kToolViewFrame).defined);

  EXPECT_EQ(loadView(9, 1.0, "CAD"), -1);
  EXPECT_EQ(loadView(0, 1.0, "CAD"), -1);
  EXPECT_EQ(loadView(kToolViewKind, 1.0, nullptr), -1);
}

TEST_F(FrameTableTest, MalformedMachineFileLeavesTheMachineFrameUnloaded) {
  file("transfo.dat", "machine\n1 2\n");
  ASSERT_EQ(loadView(kToolViewKind, 1.0, file("v.mul", kIdentityView).c_str()), 0);
  EXPECT_EQ(warnings(), std::vector<std::string>{"read error " + machineFile()});
  EXPECT_FALSE(frame(kMachineFrame).loaded);
  EXPECT_TRUE(frame(kToolViewFrame).loaded);
}

TEST(FileNames, KindsHaveTheirDefaultsAndKeys) {
  EXPECT_STREQ(fileNameKey(kMachineAxisSystemFile), "TARNEX_AXIS_SYSTEM");
  EXPECT_STREQ(defaultFileName(105), "$TRXDATA/*.ref");
  EXPECT_STREQ(fileNameKey(1026), "HOLDER");
  EXPECT_STREQ(defaultFileName(107), "");
  // Nothing loads the file-names table: the defaults apply.
  EXPECT_EQ(fileKindName(kMachineAxisSystemFile), "$TRXZONE/transfo.dat");
  EXPECT_EQ(fileKindName(1027), "");
}

}  // namespace
}  // namespace pc
