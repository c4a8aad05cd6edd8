#include "config_view.h"

#include <cstdio>

#include "report.h"

namespace pc::inspect {

int showConfiguration(bool) {
  std::fprintf(stderr, "pocket-inspect: config is not available in this build\n");
  return kExitUnreadable;
}

}  // namespace pc::inspect
