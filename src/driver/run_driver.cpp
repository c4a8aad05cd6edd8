#include "driver/run_driver.h"

namespace pc {

int runPocketClassifier(int, char**) { return 0; }

}  // namespace pc
