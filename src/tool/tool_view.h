// The tool view of the current toolpath (a frame loaded from its view file).
#pragma once

namespace pc {

inline constexpr int kToolViewKind = 3;

// Loads frame `kind` (1..8) from `name` ("CAO", "CAD", "MACHINE" or a view
// file name) and applies the unit scale to it (see tool/frame_table.h).
// 0 on success, -1 on failure.
int loadView(int kind, double scale, const char* name);

}  // namespace pc
