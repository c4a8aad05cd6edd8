// Layout of "poches.res", one line per record, every field right-aligned:
//
//   line               format                         values
//   header (once)      "%10.3lf%10d%10d%6d\n"         99999.0, 0, 0, 0
//   point              "%10.3lf%10.3lf%10.3lf%6d\n"   x, y, Z of the pocket, -1003
//   contour separator  same                           99999.0 three times, 9999
//   pocket end         same                           99999.0 three times, -1004
#include "output/pocket_result_file.h"

#include <cstdio>

#include "output/fixed_format.h"
#include "output/lost_output.h"
#include "output/outline_check.h"
#include "output/outline_list.h"
#include "output/outline_writer.h"
#include "output/output_file.h"

namespace pc {

namespace {

void writeHeaderLine(OutputFile& file) {
  char* p = file.reserve(4 * kMaxFixedFieldChars);
  p = formatFixed3(p, kSeparatorValue, 10);
  p = formatInteger(p, 0, 10);
  p = formatInteger(p, 0, 10);
  p = formatInteger(p, 0, 6);
  *p++ = '\n';
  file.commit(p);
}

void closeOrLose(OutputFile& file) {
  if (!file.close()) reportLostOutput(kPocketResultFileName, kPocketResultFileMode);
}

}  // namespace

int writePocketResultFile(const CheckedArray<Pocket*>& pockets) {
  if (pockets.count < 1) return 0;
  CheckedArray<Point> outline = makeOutlineList(pockets);

  std::printf("\n");
  std::printf(" OUTPUT : %s\n", kPocketResultFileName);
  OutputFile file;
  if (!file.open(kPocketResultFileName, kPocketResultFileMode)) {
    reportLostOutput(kPocketResultFileName, kPocketResultFileMode);
  }
  writeHeaderLine(file);

  SeparatorState state;
  const bool checked = writeCheckedOutlines(pockets, outline, [&](float z) {
    writeOutlinePoints(file, outline.data, outline.count, z, kPointLineCode, state);
    writeResultLine(file, kSeparatorValue, kSeparatorValue, kSeparatorValue, kPocketEndCode);
  });
  closeOrLose(file);
  return checked ? 0 : -1;
}

}  // namespace pc
