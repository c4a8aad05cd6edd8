#include "driver/fatal_report.h"

#include <cstdio>
#include <cstdlib>

namespace pc {

void FatalReport(const char* sourceFile, int line, const char* message) {
  std::printf("\n");
  std::printf("*************************************\n");
  std::printf("*** ERROR : %s\n", message != nullptr ? message : "");
  std::printf("*** FILE  : %s\n", sourceFile != nullptr ? sourceFile : "");
  std::printf("*** LINE  : %d\n", line);
  std::printf("*************************************\n\n");
  std::exit(1);
}

}  // namespace pc
