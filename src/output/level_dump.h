// The level dump "$TMP/wlevel.tmp" of run mode 4: the outlines of every
// outer contour of every level as point records, with an index per level.
#pragma once

#include <cstdint>

#include "pockets/pocket_model.h"

namespace pc {

inline constexpr const char* kLevelDumpName = "$TMP/wlevel.tmp";
inline constexpr const char* kLevelDumpMode = "w+b";

// Writes the dump of `levels[0..levelCount)`. 1 on success; -1 when the name
// cannot be expanded, the file cannot be created or an outline fails the
// outline check (the levels before it stay indexed); such a dump does not
// stop the run. A dump whose file was created but could not be completely
// written (a full disk) ends the run through reportLostOutput.
int writeLevelDump(ZLevel* levels, std::int32_t levelCount);

}  // namespace pc
