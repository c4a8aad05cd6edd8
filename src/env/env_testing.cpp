#include "env/env_testing.h"

namespace pc::env_testing {

void resetProcessState() {
  resetExpanderSettings();
  resetWorkZone();
}

}  // namespace pc::env_testing
