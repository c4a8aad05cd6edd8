// Runs in a work zone whose tool database holds a unit scale and a
// stock-allowance increment: lengths are scaled, printed radii are not.
#include <gtest/gtest.h>

#include <string>

#include "e2e/e2e_support.h"

namespace pc::test {
namespace {

// One zone record: state 'A', the 2-character code, then the value bytes.
std::string zoneRecord(const std::string& format, const std::string& code, const std::string& value) {
  std::string data = format + '\0' + "A" + code + value;
  std::string out;
  putInt16(out, static_cast<std::int16_t>(data.size()));
  putInt16(out, 0);
  return out + data;
}

std::string zoneFile(const std::vector<std::string>& records) {
  std::string header = "QZTB";
  putInt32(header, 0);
  putInt32(header, 160);  // last record
  putInt32(header, 160);  // first record
  putInt32(header, static_cast<std::int32_t>(records.size()));
  putInt32(header, 0);
  header.resize(152, '\0');
  header += std::string("\x01\x01\x01\x00\x00", 5);
  header.resize(160, '\0');
  for (const auto& r : records) header += r;
  return header;
}

std::string scaleRecord(float scale) {
  std::string value;
  putFloat(value, scale);
  return zoneRecord("001C 002C 001R ", "EC", value);
}

std::string textRecord(const std::string& code, const std::string& text) {
  return zoneRecord("001C 002C 001S ", code, std::string(1, static_cast<char>(text.size())) + text);
}

void prepareInchZone(const WorkZone& wz) {
  writeFile(wz.zoneFile("zone.inf"), zoneFile({scaleRecord(25.4f), textRecord("31", "0.5")}));
  // An inch part: a 1 x 1 inch square, drawn in millimetres by the slicer.
  std::vector<std::vector<float>> records;
  appendSquare(records, 0, 0, 25.4f, 1.0f);
  wz.writeContours(records);
  wz.writeParameters({{2, "12.0"}, {3, "0.25"}, {4, "0.5"}, {58, "0.1"}});
}

TEST(ZoneUnitsRun, DatabaseScaleScalesLengthsButNotThePrintedRadii) {
  WorkZone wz;
  prepareInchZone(wz);
  const std::string before = readFile(wz.zoneFile("zone.inf"));
  const RunResult r = wz.run({"x"});
  EXPECT_EQ(r.exitStatus, 0) << r.out;
  EXPECT_NE(r.out.find(" Tool : #12 BULLNOSE(r=0.25mm,R=0.50mm)\n"), std::string::npos) << r.out;
  // 0.1 inch became 2.54 mm; the 25.4 mm square is wider and stays.
  EXPECT_NE(r.out.find(" 1 pockets\n 1 pockets [width > 2.540mm]\n"), std::string::npos) << r.out;
  EXPECT_EQ(r.out.find("local_scale"), std::string::npos);
  // The database is only read, and its lock is gone after the run.
  EXPECT_EQ(readFile(wz.zoneFile("zone.inf")), before);
  EXPECT_FALSE(fileExists(wz.zoneFile("zone.lck")));
}

TEST(ZoneUnitsRun, LocalScaleFileOverridesTheDatabaseWithItsBanner) {
  WorkZone wz;
  prepareInchZone(wz);
  writeFile(wz.tmpFile("localscale.dat"), "1.0\n");
  const RunResult r = wz.run({"x"});
  EXPECT_EQ(r.exitStatus, 0) << r.out;
  EXPECT_EQ(r.out.substr(0, expectedBanner().size() + 62),
            expectedBanner() + " *******\n you are using local_scale 25.4 1.0\n *******\n\n Tool :")
      << r.out;
  // Scale 1: the radii are the file's, the width threshold stays 0.1.
  EXPECT_NE(r.out.find(" Tool : #12 BULLNOSE(r=0.25mm,R=0.50mm)\n"), std::string::npos);
  EXPECT_NE(r.out.find(" 1 pockets [width > 0.100mm]\n"), std::string::npos) << r.out;
  EXPECT_EQ(readFile(wz.tmpFile("localscale.tmp")), " 1.0\n");
}

TEST(ZoneUnitsRun, ZoneWithoutDatabaseLeavesNoFileBehind) {
  WorkZone wz;
  std::vector<std::vector<float>> records;
  appendSquare(records, 0, 0, 10, 10);
  wz.writeContours(records);
  const RunResult r = wz.run({});
  EXPECT_EQ(r.exitStatus, 0);
  EXPECT_FALSE(fileExists(wz.zoneFile("zone.inf")));
  EXPECT_FALSE(fileExists(wz.zoneFile("zone.lck")));
}

}  // namespace
}  // namespace pc::test
