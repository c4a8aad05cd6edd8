// Tests of the message table: sections, entries and overloading with `+`
// references, the first-match lookup with its trace, origins, the warnings of
// setEntry, and hostile values (long lines of `+`, values that double at
// every layer, references that point back at themselves).
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "env/diagnostic_channels.h"
#include "env/message_table.h"
#include "memory/tracked_memory.h"

namespace pc {
namespace {

using Lines = std::vector<std::string>;

struct Captured {
  Lines warnings, fatals, traces;
} captured;

class MessageTableTest : public ::testing::Test {
 protected:
  MessageTableTest() {
    captured = {};
    setWarningHandler([](const char* m) { captured.warnings.emplace_back(m); });
    setFatalHandler([](const char* m) { captured.fatals.emplace_back(m); });
    setTraceHandler([](const char* m) { captured.traces.emplace_back(m); });
    table = createTable();
  }
  ~MessageTableTest() override {
    destroyTable(table);
    setParameterMode(true);
    setWarningHandler(nullptr);
    setFatalHandler(nullptr);
    setTraceHandler(nullptr);
  }
  // The value looked up, "<absent>" when there is none.
  std::string value(int section, const std::string& key) {
    const char* found = lookup(table, section, key);
    return found != nullptr ? found : "<absent>";
  }
  std::string origin(int section, const std::string& key) {
    const auto found = lookupWithOrigin(table, section, key);
    return found ? found->origin : "<absent>";
  }

  MessageTable* table = nullptr;
};

TEST_F(MessageTableTest, LayeredPathListsResolveTheirReferences) {
  const int path = findOrAddSection(table, "path");
  ASSERT_EQ(path, 0);
  // Offsets in the string pool: the first name at 0 (24 bytes), the first
  // record at 24 (text at 0x24), the second name at 56, the next record at 72
  // (text at 0x54).
  const int install = storeFileName(table, "/T/config/environ.cfg");
  EXPECT_EQ(install, 0);
  EXPECT_EQ(setEntry(table, path, "ENV = /T/config/", install, 12), 0);
  const int user = storeFileName(table, "/u/environ.cfg");
  EXPECT_EQ(setEntry(table, path, "ENV = /u/;+", user, 3), 0);
  EXPECT_STREQ(entryText(table, path, 0), "ENV = /u/;+(00000024\\)");
  EXPECT_EQ(value(path, "ENV"), "/u/;/T/config/");
  const int third = storeFileName(table, "/x/environ.cfg");
  EXPECT_EQ(setEntry(table, path, "ENV = /x/,+", third, 4), 0);
  EXPECT_EQ(entryCount(table, path), 1);
  captured.traces.clear();
  EXPECT_EQ(value(path, "env"), "/x/,/u/;/T/config/");
  EXPECT_EQ(captured.traces, (Lines{"   - ENV = /x/,+(00000054\\) from '/x/environ.cfg' line 4",
                                    "   00000054 -> ENV = /u/;+(00000024\\) from '/u/environ.cfg' line 3",
                                    "/x/,/u/;+(00000024\\)",
                                    "   - ENV = /u/;+(00000024\\) from '/u/environ.cfg' line 3",
                                    "   00000024 -> ENV = /T/config/ from '/T/config/environ.cfg' line 12",
                                    "/x/,/u/;/T/config/"}));
  // An assembled value shows the origin of the entry looked up.
  EXPECT_EQ(origin(path, "ENV"), "from '/x/environ.cfg' line 4");
  std::string text;
  EXPECT_EQ(originText(text, table, lookup(table, path, "ENV")), 0);
  EXPECT_EQ(text, "from '/x/environ.cfg' line 4");

  // The same layering with the suite's Windows paths.
  const int windows = addSection(table, "path-windows");
  EXPECT_EQ(setEntry(table, windows, "ENV = C:\\T\\config\\", install, 1), 0);
  EXPECT_EQ(setEntry(table, windows, "ENV = C:\\u\\;+", user, 1), 0);
  EXPECT_EQ(value(windows, "ENV"), "C:\\u\\;C:\\T\\config\\");
  EXPECT_EQ(setEntry(table, windows, "ENV = D:\\x\\,+", third, 1), 0);
  EXPECT_EQ(value(windows, "ENV"), "D:\\x\\,C:\\u\\;C:\\T\\config\\");
  EXPECT_TRUE(captured.warnings.empty());
}

TEST_F(MessageTableTest, DoubledPlusSignsAndUnresolvableReferences) {
  const int var = addSection(table, "var");
  const int file = storeFileName(table, "/T/config/environ.cfg");
  ASSERT_EQ(addEntry(table, var, "A = a++b", file, 1), 0);
  ASSERT_EQ(addEntry(table, var, "B = a+b+", file, 2), 0);
  EXPECT_EQ(value(var, "A"), "a+b");
  EXPECT_EQ(value(var, "B"), "a+b+");  // nothing overloaded: a single + stands
  ASSERT_EQ(setEntry(table, var, "A = x++y+", file, 3), 0);
  EXPECT_EQ(value(var, "A"), "x+ya+b");
  // A reference whose offset lies outside the string pool.
  ASSERT_EQ(addEntry(table, var, "C = p+(7FFFFFF0\\)q", file, 4), 0);
  captured.traces.clear();
  EXPECT_EQ(value(var, "C"), "p$(TRXNULL)q");
  EXPECT_EQ(captured.traces, (Lines{"ref=[(7FFFFFF0\\)q]\n", "p$(TRXNULL)q"}));
}

TEST_F(MessageTableTest, DuplicatesCaseRulesAndSectionNames) {
  const int var = addSection(table, "var");
  const int first = storeFileName(table, "/a/environ.cfg");
  // Within one new table both entries stay; the lookup finds the first.
  ASSERT_EQ(addEntry(table, var, "X = 1", first, 1), 0);
  ASSERT_EQ(addEntry(table, var, "  X=2", first, 2), 0);
  EXPECT_EQ(entryCount(table, var), 2);
  EXPECT_EQ(value(var, "x"), "1");
  // A later layer overloads the first in place.
  const int later = storeFileName(table, "/b/environ.cfg");
  ASSERT_EQ(setEntry(table, var, "   X = 3+", later, 7), 0);
  EXPECT_EQ(entryCount(table, var), 2);
  EXPECT_EQ(value(var, "X"), "31");
  EXPECT_STREQ(entryText(table, var, 1), "  X=2");
  // A direct overload may change the key of a slot: the next X is found then.
  ASSERT_EQ(overloadEntry(table, var, 0, "Y = y+", later, 8), 0);
  EXPECT_EQ(value(var, "x"), "2");
  EXPECT_EQ(value(var, "y"), "y31");
  EXPECT_EQ(overloadEntry(table, var, 2, "Z = z", later, 9), -1);

  // Overloading compares keys with case, lookups without.
  const int path = addSection(table, "path");
  ASSERT_EQ(setEntry(table, path, "Path = x", first, 1), 0);
  ASSERT_EQ(setEntry(table, path, "PATH = y", later, 1), 0);
  EXPECT_EQ(entryCount(table, path), 2);
  EXPECT_EQ(value(path, "path"), "x");
  EXPECT_EQ(value(path, "PAT"), "<absent>");
  EXPECT_EQ(value(path, "nokey"), "<absent>");

  // Section names: exact, first match, at most 99 characters.
  EXPECT_EQ(findSection(table, "VAR"), -1);
  EXPECT_EQ(findOrAddSection(table, "var"), var);
  EXPECT_EQ(addSection(table, std::string(99, 's')), 2);
  EXPECT_EQ(findSection(table, std::string(99, 's')), 2);
  EXPECT_EQ(addSection(table, std::string(100, 's')), refusedSection);
  EXPECT_EQ(findOrAddSection(table, std::string(100, 's')), refusedSection);
  EXPECT_EQ(sectionCount(table), 3);
  EXPECT_EQ(value(-1, "X"), "<absent>");
  EXPECT_EQ(value(3, "X"), "<absent>");
  EXPECT_EQ(addEntry(table, 3, "X = 1", first, 1), -1);
  EXPECT_EQ(lookup(nullptr, 0, "X"), nullptr);
  EXPECT_TRUE(captured.warnings.empty());
}

TEST_F(MessageTableTest, OriginsAndTheWarningsOfSetEntry) {
  const int var = addSection(table, "var");
  const int file = storeFileName(table, "/T/config/environ.cfg");
  ASSERT_EQ(setEntry(table, var, "TRXTMP = /w/tmp/", file, 12), 0);
  ASSERT_EQ(set_parameter(table, var, "LINUX = 1"), 0);
  EXPECT_EQ(origin(var, "TRXTMP"), "from '/T/config/environ.cfg' line 12");
  EXPECT_EQ(origin(var, "linux"), "set by program");
  // The backward scan finds the record however long the entry.
  ASSERT_EQ(setEntry(table, var, "LONG = " + std::string(5000, 'v'), file, 40), 0);
  std::string text;
  EXPECT_EQ(originText(text, table, lookup(table, var, "LONG")), 0);
  EXPECT_EQ(text, "from '/T/config/environ.cfg' line 40");
  ASSERT_EQ(setEntry(table, var, "EMPTY =", file, 41), 0);
  EXPECT_EQ(originText(text, table, lookup(table, var, "EMPTY")), 0);
  EXPECT_EQ(text, "from '/T/config/environ.cfg' line 41");
  const char foreign[] = "TRXTMP = x";
  EXPECT_EQ(originText(text, table, foreign), -1);
  EXPECT_EQ(text, "");

  EXPECT_EQ(setEntry(table, var, " \t no equals here", file, 7), 0);
  EXPECT_EQ(set_parameter(table, var, "bare"), -1);
  EXPECT_EQ(captured.warnings,
            (Lines{"load_messages: [file '/T/config/environ.cfg' line 7] Warning - incorrect format (missing '='): "
                   "[var] no equals here\n",
                   "set_parameter : The program is trying to modify a non-parameter message: [var] bare\n"}));
  EXPECT_EQ(entryCount(table, var), 4);

  EXPECT_TRUE(setParameterMode(false));
  EXPECT_FALSE(setParameterMode(true));
  EXPECT_EQ(fileNamesTable(), nullptr);
  EXPECT_FALSE(lookupFileName("anything").has_value());
}

TEST_F(MessageTableTest, ExhaustedStorageRefusesEntriesAndSections) {
  const int var = addSection(table, "var");
  const std::uint64_t saved = setPermanentMaximum(memoryCounters().permanentBytesInUse + 1000);
  EXPECT_EQ(addEntry(table, var, "K = " + std::string(2000, 'k'), -1, 0), -1);
  EXPECT_EQ(setEntry(table, var, "K = " + std::string(2000, 'k'), -1, 0), -1);
  setPermanentMaximum(saved);
  const std::string expand = "Dynamic storage: no more memory, could not expand from 1024 to 2048 bytes\n";
  EXPECT_EQ(captured.warnings, (Lines{expand, expand}));
  EXPECT_EQ(entryCount(table, var), 0);
  EXPECT_EQ(value(var, "K"), "<absent>");
  setHeapFailureSeam([](HeapCall, std::size_t) { return true; });
  EXPECT_EQ(addSection(table, "more"), refusedSection);
  setHeapFailureSeam(nullptr);
  EXPECT_EQ(findSection(table, "more"), -1);
  EXPECT_EQ(addSection(table, "more"), 1);
}

TEST_F(MessageTableTest, LongLinesOfPlusSigns) {
  const int var = addSection(table, "var");
  const int file = storeFileName(table, "/T/config/environ.cfg");
  ASSERT_EQ(setEntry(table, var, "P = old", file, 1), 0);
  // 1023 characters: 510 doubled signs and one single one.
  const std::string plus = "P=" + std::string(1021, '+');
  ASSERT_EQ(setEntry(table, var, plus, file, 2), 0);
  EXPECT_EQ(value(var, "P"), std::string(510, '+') + "old");
  // 1023 characters with 511 single signs: every one becomes a reference.
  std::string singles = "Q=";
  while (singles.size() < 1021) singles += "+,";
  singles += "+";
  ASSERT_EQ(singles.size(), 1023u);
  ASSERT_EQ(setEntry(table, var, "Q = ab", file, 3), 0);
  ASSERT_EQ(setEntry(table, var, singles, file, 4), 0);
  EXPECT_EQ(std::string(entryText(table, var, 1)).size(), 2u + 511 * 12 + 510);
  std::string expected = "ab";
  for (int i = 1; i < 511; ++i) expected += ",ab";
  EXPECT_EQ(value(var, "Q"), expected);
  EXPECT_EQ(origin(var, "Q"), "from '/T/config/environ.cfg' line 4");
  EXPECT_TRUE(captured.warnings.empty());
}

TEST_F(MessageTableTest, ValuesPassingOneMebibyteAreAbsent) {
  setTraceHandler(nullptr);  // the steps of a mebibyte are not worth recording
  const int var = addSection(table, "var");
  const int file = storeFileName(table, "/T/config/environ.cfg");
  // Each layer doubles the value and adds one: 2^20 - 1 bytes after 19 layers.
  ASSERT_EQ(setEntry(table, var, "D = x", file, 1), 0);
  for (int layer = 0; layer < 19; ++layer) ASSERT_EQ(setEntry(table, var, "D = + +", file, 2), 0);
  ASSERT_EQ(setEntry(table, var, "D = y+", file, 3), 0);
  const std::string full = value(var, "D");
  EXPECT_EQ(full.size(), 1048576u);
  EXPECT_EQ(full.substr(0, 4), "yx x");
  EXPECT_EQ(value(var, "D"), full);  // a long resolution is kept for the next lookup
  EXPECT_TRUE(captured.warnings.empty());
  ASSERT_EQ(setEntry(table, var, "D = z+", file, 4), 0);
  EXPECT_EQ(value(var, "D"), "<absent>");
  EXPECT_EQ(value(var, "d"), "<absent>");
  const std::string tooLarge = "Message table: the value of [var] D passes 1048576 bytes once resolved; "
                               "it is taken as undefined";
  EXPECT_EQ(captured.warnings, (Lines{tooLarge, "Message table: the value of [var] d passes 1048576 bytes once "
                                                "resolved; it is taken as undefined"}));
  // Other keys are unaffected.
  ASSERT_EQ(setEntry(table, var, "E = e", file, 5), 0);
  EXPECT_EQ(value(var, "E"), "e");

  // A forged reference to the entry itself never ends: absent as well. The
  // first record of a fresh table holds its text at offset 12.
  MessageTable* forged = createTable();
  const int section = addSection(forged, "var");
  ASSERT_EQ(addEntry(forged, section, "S=+(0000000C\\)", -1, 0), 0);
  EXPECT_EQ(lookup(forged, section, "S"), nullptr);
  EXPECT_EQ(captured.warnings.size(), 3u);
  destroyTable(forged);
}

}  // namespace
}  // namespace pc
