// Interim unit scale until the zone database is read.
#include "tool/unit_scale.h"

namespace pc {

void unitScale(float* scale) { *scale = 1.0f; }

}  // namespace pc
