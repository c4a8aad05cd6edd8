#include <sys/stat.h>

#include <csignal>
#include <cstring>

#include "env/path_expander.h"
#include "env_fixture.h"

namespace pc::test {
namespace {

class EntryPoints : public EnvTest {
 protected:
  std::vector<char> f = std::vector<char>(20, '#');  // a fixed-length field
  std::string text() const { return std::string(f.begin(), f.end()); }
  static std::string padded(const std::string& s, std::size_t n) { return s + std::string(n - s.size(), ' '); }
};
using EntryPointsDeathTest = EntryPoints;

TEST_F(EntryPoints, TerminatedNames) {
  set("TRXTMPDIR", "/w/tmp/");
  char buffer[512];
  EXPECT_EQ(expandName("$TMP/contour.bin", buffer, sizeof buffer), EXPAND_OK);
  EXPECT_STREQ(buffer, "/w/tmp/contour.bin");
  EXPECT_EQ(expandName("\\\\server\\share//f", buffer, sizeof buffer), EXPAND_OK);
  EXPECT_STREQ(buffer, "/server/share/f");
  set("TRXNULL", "<$>");
  EXPECT_EQ(expandName("$PCT_UNSET/x", buffer, sizeof buffer), EXPAND_UNDEFINED);
  EXPECT_STREQ(buffer, "<PCT_UNSET>/x");
  // Room for the NUL is needed; failures leave the buffer as it was.
  EXPECT_EQ(expandName("abcdefghij", buffer, 10), EXPAND_BUFFER_TOO_SMALL);
  EXPECT_STREQ(buffer, "<PCT_UNSET>/x");
  EXPECT_EQ(expandName("abcdefghij", buffer, 11), EXPAND_OK);
  EXPECT_STREQ(buffer, "abcdefghij");
  std::strcpy(buffer, "$(TMP/x");
  EXPECT_EQ(expandNameInPlace(buffer, sizeof buffer), EXPAND_SYNTAX);
  EXPECT_STREQ(buffer, "$(TMP/x");
  EXPECT_EQ(expandName(nullptr, buffer, sizeof buffer), EXPAND_INVALID_ARGUMENT);
  EXPECT_EQ(expandName("n", nullptr, 4), EXPAND_INVALID_ARGUMENT);
  const std::vector<std::string> expected = {
      "_Expand(\"abcdefghij\") = error -32 - buffer size 10 too small",
      "_Expand(\"$(TMP/x\") = error -31 - syntax error",
      "_Expand(<nullptr>) = error -44 - invalid argument",
      "_Expand(\"n\") = error -44 - invalid argument",
  };
  EXPECT_EQ(Recorded::warnings, expected);
}

TEST_F(EntryPoints, FixedFieldsAreBlankPaddedAndNeedNoTerminator) {
  set("PCT_D", "a//b\\c");
  f.resize(10);
  EXPECT_EQ(expandPath("abcdefghij  ", f), EXPAND_OK);
  EXPECT_EQ(text(), "abcdefghij");
  EXPECT_EQ(expandPath("$PCT_D", f), EXPAND_OK);
  EXPECT_EQ(text(), "a/b/c     ");
  EXPECT_EQ(expandText("$PCT_D", f), EXPAND_OK);
  EXPECT_EQ(text(), "a//b\\c    ");
  EXPECT_EQ(expandText("$PCT_UNSET\\x", f), EXPAND_UNDEFINED);
  EXPECT_EQ(text(), "\\x        ");
  f.assign(9, '#');
  EXPECT_EQ(expandPath("abcdefghij", f), EXPAND_BUFFER_TOO_SMALL);
  EXPECT_EQ(expandText("$(x", f), EXPAND_SYNTAX);
  EXPECT_EQ(text(), "#########");
  const std::vector<std::string> expected = {
      "_Expand(\"abcdefghij\") = error -32 - buffer size 9 too small",
      "_Expand(\"$(x\") = error -31 - syntax error",
  };
  EXPECT_EQ(Recorded::warnings, expected);
}

TEST_F(EntryPoints, FileNamesSearchTheListAndFallBackToTheFirstDirectory) {
  TempDir dir;
  ASSERT_EQ(::mkdir(dir.file("a").c_str(), 0777), 0);
  ASSERT_EQ(::mkdir(dir.file("b").c_str(), 0777), 0);
  set("CFGPATH", dir.file("a") + "; " + dir.file("b") + "/ ,");
  f.resize(200);
  EXPECT_EQ(expandFileName("?CFG/environ.cfg", f), EXPAND_NOT_FOUND);
  EXPECT_EQ(text(), padded(dir.file("a/environ.cfg"), 200));
  writeFile(dir.file("b/environ.cfg"), "");
  EXPECT_EQ(expandFileName("?CFG/environ.cfg", f), EXPAND_OK);
  EXPECT_EQ(text(), padded(dir.file("b/environ.cfg"), 200));
  ASSERT_EQ(::mkdir(dir.file("b/sub").c_str(), 0777), 0);
  EXPECT_EQ(expandFileName("?CFG\\sub", f), EXPAND_OK);  // a directory counts
  EXPECT_EQ(text(), padded(dir.file("b/sub"), 200));
  EXPECT_EQ(expandFileName(dir.file("b//environ.cfg"), f), EXPAND_OK);  // no list: the name itself
  EXPECT_EQ(expandFileName(dir.file("b/none"), f), EXPAND_NOT_FOUND);
  EXPECT_EQ(text(), padded(dir.file("b/none"), 200));
  EXPECT_EQ(expandFileName("   ", f), EXPAND_NOT_FOUND);
  EXPECT_EQ(text(), std::string(200, ' '));
  set("PCT_EMPTYPATH", " ; ,");  // no directory: the file part alone
  EXPECT_EQ(expandFileName("?PCT_EMPTY/f//g", f), EXPAND_NOT_FOUND);
  EXPECT_EQ(text(), padded("f/g", 200));
  EXPECT_TRUE(Recorded::warnings.empty());
}

TEST_F(EntryPoints, FileNamesRefuseBadListsAndUndefinedReferences) {
  set("TRXNULL", "<$>");
  EXPECT_EQ(expandFileName("$PCT_UNSET/x", f), EXPAND_UNDEFINED);
  EXPECT_EQ(text(), std::string(20, ' '));
  f.assign(20, '#');
  EXPECT_EQ(expandFileName("?PCT_NOLIST/x", f), EXPAND_UNDEFINED);
  EXPECT_EQ(text(), std::string(20, ' '));
  EXPECT_TRUE(Recorded::warnings.empty());
  f.assign(20, '#');
  EXPECT_EQ(expandFileName("?CFG", f), EXPAND_INVALID_ARGUMENT);
  EXPECT_EQ(expandFileName("/no/such/directory/file.txt", f), EXPAND_BUFFER_TOO_SMALL);
  const std::string big(1 << 20, 'n');
  EXPECT_EQ(expandFileName(big, f), EXPAND_BUFFER_TOO_SMALL);
  EXPECT_EQ(text(), std::string(20, '#'));
  const std::vector<std::string> expected = {
      "_Expand(\"?CFG\") = error -44 - invalid argument",
      "_Expand(\"/no/such/directory/file.txt\") = error -32 - buffer size 20 too small",
      "_Expand(\"" + big + "\") = error -32 - buffer size 20 too small",
  };
  EXPECT_EQ(Recorded::warnings, expected);
}

TEST_F(EntryPointsDeathTest, CrashOptionTrapsOnBufferTooSmall) {
  char buffer[4];
  set("TRX_BUFFER_TOO_SMALL_OPTION", "crash");
  EXPECT_EXIT(expandName("too long", buffer, sizeof buffer), testing::KilledBySignal(SIGTRAP), "");
  set("TRX_BUFFER_TOO_SMALL_OPTION", "Crash");
  EXPECT_EQ(expandName("too long", buffer, sizeof buffer), EXPAND_BUFFER_TOO_SMALL);
  EXPECT_EQ(Recorded::warnings.size(), 1u);
}

}  // namespace
}  // namespace pc::test
