#include "driver/information_request.h"

#include <cstring>

namespace pc {
namespace {

constexpr const char* kUsage =
    "Usage: pocket-classifier [mode]\n"
    "\n"
    "Reads the Z-level contours $TMP/trxcon.inf and the tool parameters $TMP/outil.par\n"
    "of the work zone, builds the pockets of every level and writes them.\n"
    "Only the first character of the mode counts:\n"
    "  none, C...  $TMP/contour.bin as a tagged binary record file\n"
    "  F...        $TMP/contour.bin as unformatted records (level-based order)\n"
    "  w...        the level dump $TMP/wlevel.tmp, then as F\n"
    "  other       the text file poches.res in the current directory\n"
    "\n"
    "Environment: TRXZONE (work zone), TRXTMPDIR or TRXTMP (temporary directories),\n"
    "TRXHOME (installation; found from the program's path when unset).\n"
    "Exit status: 0 done, 1 memory or index report, 2 file layer failure,\n"
    "255 output not written or configuration fatal.\n"
    "\n"
    "  --help     show this text\n"
    "  --version  show the version\n"
    "See pocket-classifier(1) and environ.cfg(5).\n";

bool writeAll(std::FILE* out, const char* first, const char* second) {
  if (std::fputs(first, out) < 0) return false;
  if (second != nullptr && std::fputs(second, out) < 0) return false;
  // A closed or full standard output must show in the exit status, not be lost
  // in the buffer at exit.
  return std::fflush(out) == 0 && std::ferror(out) == 0;
}

}  // namespace

InformationRequest answerInformationRequest(int argc, char** argv, const char* versionText, std::FILE* out) {
  if (argc < 2 || argv[1] == nullptr) return InformationRequest::NotHandled;
  bool written = false;
  if (std::strcmp(argv[1], "--help") == 0) {
    written = writeAll(out, kUsage, nullptr);
  } else if (std::strcmp(argv[1], "--version") == 0) {
    written = writeAll(out, "pocket-classifier ", versionText) && writeAll(out, "\n", nullptr);
  } else {
    return InformationRequest::NotHandled;
  }
  return written ? InformationRequest::Answered : InformationRequest::WriteFailed;
}

int informationExitStatus(InformationRequest request) {
  return request == InformationRequest::Answered ? 0 : 255;
}

}  // namespace pc
