// Tests of one environ.cfg file: the line source, each syntax rule, each
// condition form, and each fatal message and warning, word for word.
#include <cstdio>
#include <string>

#include "env/configuration_test_support.h"
#include "env/line_source.h"
#include "env/message_table.h"
#include "platform/platform.h"

namespace pc::test {
namespace {

// The lines a source gives, with the lengths readLine reports.
std::vector<std::pair<std::string, std::size_t>> readAll(const std::string& bytes, std::size_t size = 1024) {
  std::FILE* stream = platform::openMemoryStream(bytes.data(), bytes.size());
  std::vector<std::pair<std::string, std::size_t>> lines;
  {
    CL8BFile source(stream);
    std::vector<char> buffer(size);
    while (source.hasMore() != 0) {
      const std::size_t length = source.readLine(buffer.data(), buffer.size());
      lines.emplace_back(buffer.data(), length);
    }
  }
  std::fclose(stream);
  return lines;
}

TEST(LineSource, ByteOrderMarkLineEndsAndLongLines) {
  using Read = std::vector<std::pair<std::string, std::size_t>>;
  EXPECT_EQ(readAll("\xEF\xBB\xBF" "a\r\nb"), (Read{{"a\r\n", 3}, {"b", 1}}));
  EXPECT_EQ(readAll("\xEF\xBB\xBF"), (Read{{"", 0}}));
  // Two bytes of a mark are text.
  EXPECT_EQ(readAll("\xEF\xBB\n"), (Read{{"\xEF\xBB\n", 3}, {"", 0}}));
  // A line longer than the buffer: cut, the rest thrown away, the full
  // length reported.
  EXPECT_EQ(readAll("abcdef\nx\n", 4), (Read{{"abc", 7}, {"x\n", 2}, {"", 0}}));

  const std::string bytes = "one\r\ntwo\n";
  std::FILE* stream = platform::openMemoryStream(bytes.data(), bytes.size());
  CL8BFile source(stream);
  char buffer[16];
  EXPECT_FALSE(source.startsWithByteOrderMark());
  EXPECT_EQ(source.hasMore(), 1);
  source.readLine(buffer, sizeof buffer);
  EXPECT_EQ(source.lineEndLength(), 2u);
  EXPECT_EQ(source.hasMore(), 2);
  source.readLine(buffer, sizeof buffer);
  EXPECT_EQ(source.lineEndLength(), 1u);
  source.readLine(buffer, sizeof buffer);
  EXPECT_EQ(source.hasMore(), 0);
  std::fclose(stream);
  EXPECT_EQ(CL8BFile(nullptr).hasMore(), 0);
}

class ParserTest : public ConfigurationTest {
 protected:
  ~ParserTest() override { destroyTable(table); }
  // Parses `text` as the file "f.cfg" into the test's table (a new one the first time).
  bool parse(const std::string& text) {
    MessageTable* result = load_messages_from_buffer(table, "f.cfg", reinterpret_cast<const unsigned char*>(text.data()),
                                                     text.size());
    if (result == nullptr) return false;
    table = result;
    return true;
  }
  std::string value(const std::string& section, const std::string& key) {
    const char* found = lookup(table, findSection(table, section), key);
    return found != nullptr ? found : "<absent>";
  }
  std::string entries(const std::string& section) {
    std::string all;
    const int number = findSection(table, section);
    for (int i = 0; i < entryCount(table, number); ++i) all += std::string(entryText(table, number, i)) + "|";
    return all;
  }
  MessageTable* table = nullptr;
};

TEST_F(ParserTest, SyntaxRules) {
  ASSERT_TRUE(parse("before = ignored\n"
                    "  [var]  \n"
                    "  x = a ## b # note\n"
                    "# a comment line\n"
                    "\t\n"
                    "//not = a keyword\n"
                    "x = second\n"
                    "noequals\n"
                    "[my section]x]\n"
                    "y=1\n"
                    "[open\n"
                    "z = 2\n"));
  EXPECT_EQ(sectionCount(table), 3);
  EXPECT_EQ(sectionName(table, 1), std::string("my section"));
  EXPECT_EQ(sectionName(table, 2), std::string("open"));
  // Leading blanks stay in the stored text, the comment's blank too; the
  // first file keeps a repeated key and a text without '='.
  EXPECT_EQ(entries("var"), "  x = a # b |//not = a keyword|x = second|noequals|");
  EXPECT_EQ(value("var", "X"), "a # b ");
  EXPECT_EQ(value("var", "//not"), "a keyword");
  EXPECT_EQ(value("my section", "y"), "1");
  EXPECT_TRUE(channels.warnings.empty());
  EXPECT_EQ(lookupWithOrigin(table, 0, "x")->origin, "from 'f.cfg' line 3");

  // A later file overloads in place and reports a text without '='.
  ASSERT_TRUE(parse("[var]\nx = new;+\nbad line\n[fresh]\nk = v\n"));
  EXPECT_EQ(value("var", "x"), "new;a # b ");
  EXPECT_EQ(value("fresh", "k"), "v");
  EXPECT_EQ(channels.warnings,
            Lines{"load_messages: [file 'f.cfg' line 3] Warning - incorrect format (missing '='): [var] bad line\n"});
  EXPECT_TRUE(channels.fatals.empty());
}

TEST_F(ParserTest, LongLinesNulBytesMarksAndLineEnds) {
  const std::string longValue(1500, 'v');
  ASSERT_TRUE(parse("\xEF\xBB\xBF[var]\r\nlong = " + longValue + "\r\nnul = ab" + std::string(1, '\0') +
                    "cd\r\nexact = " + std::string(1015, 'e') + "\r\nlast = 1"));
  EXPECT_EQ(value("var", "long"), std::string(1023 - 7, 'v'));
  EXPECT_EQ(value("var", "nul"), "ab");
  // 1023 characters before "\r\n" are not too long.
  EXPECT_EQ(value("var", "exact"), std::string(1015, 'e'));
  EXPECT_EQ(value("var", "last"), "1");
  EXPECT_EQ(channels.warnings, Lines{"load_messages: file 'f.cfg', line 2 : Input line too long"});
}

TEST_F(ParserTest, ConditionForms) {
  set("PCT_A", "1");
  set("TRXTMPDIR", "/the/tmp");
  struct Case {
    std::string condition;
    bool holds;
    bool warns;
  };
  const std::vector<Case> cases = {
      {"PCT_A", true, false},           {"(PCT_A)", true, false},        {"{ PCT_A }", true, false},
      {"PCT_A == 1", true, false},      {"(PCT_A == 1)", true, false},   {"PCT_A == 2", false, false},
      {"PCT_A != 2", true, false},      {"PCT_A != 1", false, false},    {"PCT_A==1", false, false},
      {"(PCT_UNSET)", false, false},    {"{PCT_UNSET}", false, false},   {"PCT_UNSET == x", false, true},
      {"PCT_UNSET = 1", false, true},   {"TMP == /the/tmp", true, false},
      // Defined earlier in the same file.
      {"EARLIER == yes", true, false},  {"LATER", false, false},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.condition);
    channels = {};
    destroyTable(table);
    table = nullptr;
    ASSERT_TRUE(parse("[var]\nEARLIER = yes\n/if " + c.condition + "\nB = 2\n/else\nB = 3\n/endif\nLATER = 1\n"));
    EXPECT_EQ(value("var", "B"), c.holds ? "2" : "3");
    EXPECT_EQ(channels.warnings,
              c.warns ? Lines{"load_messages: file 'f.cfg' line 3, unknown variable : '/if " + c.condition + "'\n"}
                      : Lines{});
  }
}

TEST_F(ParserTest, NestingAndSkippedBranches) {
  set("PCT_A", "1");
  ASSERT_TRUE(parse("[var]\n"
                    "/if PCT_A\n"
                    "  /if PCT_UNSET\n"
                    "    /if PCT_A\n"     // skipped, counted
                    "    a = wrong\n"
                    "    /else\n"         // inside the skipped /if: ignored
                    "    a = wrong too\n"
                    "    /endif\n"
                    "  /else\n"
                    "    a = right\n"
                    "  /endif\n"
                    "  /elsewhere\n"      // an /else by its first letters
                    "  b = not used\n"
                    "/endif\n"
                    "/if PCT_UNSET\n/endif"));  // closes a false branch without a final line end
  EXPECT_EQ(entries("var"), "    a = right|");
  // Seven levels are allowed.
  std::string seven = "[var]\n";
  for (int i = 0; i < 7; ++i) seven += "/if PCT_A\n";
  seven += "deep = 7\n";
  for (int i = 0; i < 7; ++i) seven += "/endif\n";
  ASSERT_TRUE(parse(seven));
  EXPECT_EQ(value("var", "deep"), "7");
  EXPECT_TRUE(channels.fatals.empty());
}

// "[sss...]" with a name of `length` characters, and its line end.
std::string sectionLine(std::size_t length) {
  std::string line(length + 3, 's');
  line.front() = '[';
  line[length + 1] = ']';
  line.back() = '\n';
  return line;
}

TEST_F(ParserTest, EachFatalMessage) {
  set("PCT_A", "1");
  std::string tenThousand;
  for (int i = 0; i < 10000; ++i) tenThousand += "/if PCT_A\n";
  struct Case {
    std::string text;
    std::string fatal;
  };
  const std::vector<Case> cases = {
      {"[var]\n/else\n", "line 2 : '/else' without '/if'"},
      {"[var]\n\n/endif\n", "line 3 : '/endif' without '/if'"},
      {"/include x # c\n", "line 1 : Unknown keyword : '/include x '"},
      {"/\n", "line 1 : Unknown keyword : '/'"},
      {"/if PCT_A = 1\n", "line 1 : invalid condition: /if PCT_A = 1"},
      {"/if PCT_A\n[var]\n", "line -1 : '/if' without '/endif' at end of file."},
      {"/if PCT_UNSET\n[var]\nx = 1\n", "line 3 : '/if' without '/endif'"},
      {tenThousand, "line 8 : too many nested conditions: /if PCT_A"},
      {sectionLine(100) + "x = 1\n", "line 0 : Error loading file."},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.fatal);
    channels = {};
    EXPECT_FALSE(parse(c.text));
    EXPECT_EQ(channels.fatals, Lines{"load_messages: file 'f.cfg', " + c.fatal});
  }
  // A section name of 99 characters is stored.
  ASSERT_TRUE(parse(sectionLine(99) + "x = 1\n"));
  EXPECT_EQ(value(std::string(99, 's'), "x"), "1");
}

TEST_F(ParserTest, HostileContentsEndCleanly) {
  std::string garbage;
  for (int i = 0; i < 20000; ++i) garbage += static_cast<char>((i * 7919) % 256);
  parse(garbage);  // whatever it holds: no crash, a message at most
  destroyTable(table);
  table = nullptr;

  std::string sections;
  for (int i = 0; i < 100000; ++i) sections += "[s" + std::to_string(i) + "]\nk = " + std::to_string(i) + "\n";
  EXPECT_FALSE(parse(sections));
  // The table holds at most 65535 sections.
  EXPECT_EQ(channels.warnings, Lines{"Message table: too many sections, section [s65535] refused"});
  EXPECT_EQ(channels.fatals, Lines{"load_messages: file 'f.cfg', line 0 : Error loading file."});

  channels = {};
  ASSERT_TRUE(parse("[var]\nmega = " + std::string(1 << 20, 'm') + "\n"));
  EXPECT_EQ(value("var", "mega").size(), 1016u);
  EXPECT_EQ(channels.warnings.size(), 1u);
}

}  // namespace
}  // namespace pc::test
