#include "fileio/runtime_fatal.h"

#include <gtest/gtest.h>

#include <climits>
#include <cstdio>
#include <string>
#include <vector>

#include "support/test_support.h"

namespace pc::fileio {
namespace {

std::string text(std::string_view tmpl, std::vector<int> values) { return fatalMessageText(tmpl, values); }

TEST(RuntimeFatal, ValuesTakeExactlyTheCharactersTheyNeed) {
  EXPECT_EQ(text("mode=%", {4}), "mode=4");
  EXPECT_EQ(text(" iomode= %, err= %", {2, 5}), " iomode= 2, err= 5");
  EXPECT_EQ(text("v=%;", {-12}), "v=-12;");
  EXPECT_EQ(text("%", {123456789}), "123456789");
  EXPECT_EQ(text("[%]", {1234567890}), "[*********]");
  EXPECT_EQ(text("[%]", {INT_MIN}), "[*********]");
  EXPECT_EQ(text("%%", {1, 2}), "12");
}

TEST(RuntimeFatal, TemplateBlanksAreKeptAndTheTailIsCut) {
  EXPECT_EQ(text("  a %  ", {7}), "  a 7  ");
  EXPECT_EQ(text("no values %", {}), "no values %");
  EXPECT_EQ(text("a=% b=%", {1}), "a=1 b=%");
  EXPECT_EQ(text(std::string(198, 'x'), {}), std::string(198, 'x'));
  // Beyond 198 characters the framing parenthesis goes, and one character more.
  EXPECT_EQ(text(std::string(250, 'x'), {}), std::string(198, 'x'));
  // A value growing the field pushes its end out.
  EXPECT_EQ(text(std::string(197, 'y') + "%", {12345}), std::string(197, 'y') + "1");
}

TEST(RuntimeFatal, ReportRecordsAndExitStatus) {
  test::TempDir dir;
  const std::string out = dir.file("stdout.txt");
  EXPECT_EXIT(
      {
        if (!std::freopen(out.c_str(), "w", stdout)) std::abort();
        fatalError("opensq(/w/tmp/x.dat)", "mode=%", 4);
      },
      ::testing::ExitedWithCode(kFatalStopStatus), "");
  EXPECT_EQ(test::readFile(out), " Fatal error in opensq(/w/tmp/x.dat) : \n mode=4\n Program terminated.\n");

  const int values[] = {2, 5};
  EXPECT_EXIT(
      {
        if (!std::freopen(out.c_str(), "w", stdout)) std::abort();
        fatalErrorValues("   ", " iomode= %, err= %", values);
      },
      ::testing::ExitedWithCode(kFatalStopStatus), "");
  EXPECT_EQ(test::readFile(out), "  iomode= 2, err= 5\n Program terminated.\n");
}

}  // namespace
}  // namespace pc::fileio
