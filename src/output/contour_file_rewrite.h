// Run mode 1: the ordered pockets written to "$TMP/contour.bin" as a tagged
// record file (see tagged_file.h): per pocket an 'n' record with its Z, the
// 'p' records of each contour closed by an 'f', and an 'e' record.
#pragma once

#include "driver/checked_array.h"
#include "output/tagged_file.h"
#include "pockets/pocket_model.h"

namespace pc {

inline constexpr const char* kContourFileName = "$TMP/contour.bin";
inline constexpr const char* kTaggedCreateMode = "w+b";

// 0 on success (an empty list creates nothing); -1 when the name cannot be
// expanded (no file) or a pocket fails the outline check (the file keeps the
// pockets written before). A file that cannot be created or completely
// written ends the run through reportLostOutput.
int rewriteContourFile(const CheckedArray<Pocket*>& pockets);

}  // namespace pc
