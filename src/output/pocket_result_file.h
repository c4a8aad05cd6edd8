// The pocket result file "poches.res": a text file in the current directory
// with every ordered pocket as point lines, separator lines between its
// contours and an end line after it.
#pragma once

#include "driver/checked_array.h"
#include "pockets/pocket_model.h"

namespace pc {

inline constexpr const char* kPocketResultFileName = "poches.res";
inline constexpr const char* kPocketResultFileMode = "w";

// Writes the result file. 0 on success (nothing is created for an empty
// list); -1 when a pocket fails the outline check (the file keeps the lines
// written before). A file that cannot be created or completely written ends
// the run through reportLostOutput.
int writePocketResultFile(const CheckedArray<Pocket*>& pockets);

}  // namespace pc
