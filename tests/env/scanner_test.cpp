#include "env/path_expander.h"
#include "env/reference_scanner.h"
#include "env/separators.h"
#include "env/variable_lookup.h"
#include "env_fixture.h"

namespace pc::test {
namespace {

class Scanner : public EnvTest {
 protected:
  std::string result;
  int scan(std::string_view text) { return substituteReferences(text, result); }
};

TEST_F(Scanner, EscapesBracketsPlainNamesAndSyntax) {
  set("PCT_A", "x");
  set("PCT_LPATH", "/l1;/l2");
  EXPECT_EQ(scan("a$$b??c$$|$PCT_A/$(PCT_A)${PCT_A}.$PCT_A.b|?PCT_L|?(PCT_L)"), EXPAND_OK);
  EXPECT_EQ(result, "a$b?c$|x/xx.x.b|/l1;/l2|/l1;/l2");
  for (const char* text : {"$(A", "x${PCT_A", "?(L", "$PCT_UNSET?{"}) {
    result = "stale";
    EXPECT_EQ(scan(text), EXPAND_SYNTAX) << text;  // a -43 met before is forgotten
    EXPECT_EQ(result, "") << text;
  }
}

TEST_F(Scanner, NestedValuesAndTheUndefinedValueText) {
  set("PCT_V", "$(PCT_B)\\sub");
  set("PCT_B", "C:/b");
  EXPECT_EQ(scan("$PCT_V"), EXPAND_OK);
  EXPECT_EQ(result, "C:/b\\sub");
  EXPECT_EQ(scan("$PCT_UNSET/x"), EXPAND_UNDEFINED);
  EXPECT_EQ(result, "/x");
  set("TRXNULL", "<$>");
  EXPECT_EQ(scan("$PCT_UNSET/x?PCT_NOLIST"), EXPAND_UNDEFINED);
  EXPECT_EQ(result, "<PCT_UNSET>/x<PCT_NOLIST>");
  set("TRXNULL", "none");
  EXPECT_EQ(scan("$/x"), EXPAND_UNDEFINED);  // the empty name
  EXPECT_EQ(result, "none/x");
  // A replacement that expands cleanly still reports the missing name.
  set("TRXNULL", "$$(PCT_B)");
  EXPECT_EQ(scan("$PCT_UNSET/x"), EXPAND_UNDEFINED);
  EXPECT_EQ(result, "PCT_UNSETC:/b/x");
}

TEST_F(Scanner, RunawayReferencesEnd) {
  set("PCT_SELF", "a$PCT_SELF");
  EXPECT_EQ(scan("$PCT_SELF"), EXPAND_TOO_DEEP);
  EXPECT_EQ(result, "");
  set("PCT_P", "$(PCT_Q)");
  set("PCT_Q", "x/$PCT_P");
  EXPECT_EQ(scan("ok/$PCT_P"), EXPAND_TOO_DEEP);
  set("TRXNULL", "$$");  // an undefined-value text that is itself undefined
  EXPECT_EQ(scan("$PCT_UNSET"), EXPAND_TOO_DEEP);
  // The bound: the text and 63 nested values pass, one more does not.
  for (int i = 0; i <= kMaxReferenceNesting; ++i) {
    set("PCT_C" + std::to_string(i), "$PCT_C" + std::to_string(i + 1));
  }
  set("PCT_C" + std::to_string(kMaxReferenceNesting - 1), "end");
  EXPECT_EQ(scan("$PCT_C0"), EXPAND_OK);
  EXPECT_EQ(result, "end");
  set("PCT_C" + std::to_string(kMaxReferenceNesting - 1), "$PCT_C64");
  set("PCT_C64", "end");
  EXPECT_EQ(scan("$PCT_C0"), EXPAND_TOO_DEEP);
  // Values that double at every level: stopped by the reference count, or
  // by the byte count when they carry text.
  for (int i = 0; i < 40; ++i) {
    set("PCT_D" + std::to_string(i), "$PCT_D" + std::to_string(i + 1) + "$PCT_D" + std::to_string(i + 1));
  }
  set("PCT_D40", "");
  EXPECT_EQ(scan("$PCT_D0"), EXPAND_TOO_DEEP);
  set("PCT_D40", std::string(4096, 'b'));
  EXPECT_EQ(scan("$PCT_D0"), EXPAND_BUFFER_TOO_SMALL);
  EXPECT_EQ(result, "");
  char buffer[512] = "$PCT_SELF";
  EXPECT_EQ(expandNameInPlace(buffer, sizeof buffer), EXPAND_TOO_DEEP);
  EXPECT_STREQ(buffer, "$PCT_SELF");
  EXPECT_EQ(Recorded::warnings,
            std::vector<std::string>{"_Expand(\"$PCT_SELF\") = error -45 - references nested too deeply"});
}

TEST_F(Scanner, HugeAndHostileNames) {
  std::string nested;
  for (int i = 0; i < 10000; ++i) nested += "$(";
  EXPECT_EQ(scan(nested + std::string(10000, ')')), EXPAND_UNDEFINED);
  EXPECT_EQ(result, std::string(9999, ')'));
  EXPECT_EQ(scan(nested), EXPAND_SYNTAX);
  const std::string big(1 << 20, 'n');
  EXPECT_EQ(scan(big), EXPAND_OK);
  EXPECT_EQ(result, big);
  const std::string odd = std::string("\xff\xfe\x01\t\x7f") + '\0' + "z";  // passed through as bytes
  EXPECT_EQ(scan(odd), EXPAND_OK);
  EXPECT_EQ(result, odd);
  set("PCT_EQ", "=yes");  // "PCT_EQ=" must not find PCT_EQ
  EXPECT_EQ(scan("$(PCT_EQ=)"), EXPAND_UNDEFINED);
}

TEST_F(Scanner, LookupOrderAndTraceLines) {
  set("PCT_A", "env");
  set("TRXTMPDIR", "/w/tmp/");
  Recorded::table["var/PCT_A"] = {"table", "set by program"};
  Recorded::table["var/PCT_T"] = {"v \t\x01", "from '/i/config/environ.cfg' line 3"};
  Recorded::table["var/TMP"] = {"never", "set by program"};
  Recorded::table["path/PCT_L"] = {"/p ", "set by program"};
  EXPECT_EQ(scan("$PCT_A|$pct_t|$TMP|?PCT_L|$PCT_U|?PCT_U"), EXPAND_UNDEFINED);
  EXPECT_EQ(result, "env|v|/w/tmp/|/p||");
  const std::vector<std::string> expected = {
      "PCT_A = 'env' from environment",
      "pct_t = 'v' from '/i/config/environ.cfg' line 3",
      "TMP = '/w/tmp/' from environment variable TRXTMPDIR",
      "PCT_L = '/p' set by program",
      "PCT_U = <undefined variable>",
      "PCT_U = <undefined path>",
  };
  EXPECT_EQ(Recorded::traces, expected);
  set("PCT_LPATH", "/e");
  EXPECT_EQ(lookupPathList("PCT_L"), std::optional<std::string>("/e"));
  EXPECT_EQ(lookupVariable("PCT_T"), std::optional<std::string>("v"));
  EXPECT_EQ(Recorded::traces.size(), expected.size());  // plain lookups send no trace
}

TEST(Separators, BothPlatformsRewrites) {
  std::string text = "//server\\share\\\\f//";
  normaliseSeparators(text, '/');
  EXPECT_EQ(text, "/server/share/f/");
  text = "\\\\server\\share//f";
  normaliseSeparators(text, '\\');
  EXPECT_EQ(text, "\\server\\share\\f");
  text = "C:/a/\\/b";
  normaliseSeparators(text, '\\');
  EXPECT_EQ(text, "C:\\a\\b");
}

}  // namespace
}  // namespace pc::test
