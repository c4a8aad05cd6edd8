#include "output/lost_output.h"

#include <cstdio>
#include <cstdlib>

namespace pc {

void reportLostOutput(const char* name, const char* mode) {
  std::printf("*** Cannot open file %s in mode %s.\n", name != nullptr ? name : "", mode != nullptr ? mode : "");
  std::fflush(stdout);
  std::exit(kLostOutputStatus);
}

}  // namespace pc
