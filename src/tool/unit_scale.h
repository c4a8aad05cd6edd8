// The unit scale of the run: decided once, remembered for every later call.
#pragma once

namespace pc {

// Writes the unit scale (> 0) into `*scale`.
void unitScale(float* scale);

}  // namespace pc
