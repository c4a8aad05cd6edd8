// Test seams of the unit scale.
#pragma once

#include <functional>

namespace pc::unit_scale_testing {

// Forgets the decision, so that the next unitScale call decides again.
void reset();
// Replaces the zone database query for the scale (status, value written);
// an empty function restores the real query.
void setZoneScaleQuery(std::function<int(float&)> query);
// The unit system remembered: 0 undecided, 1 metric, 2 inch.
int unitSystem();

}  // namespace pc::unit_scale_testing
