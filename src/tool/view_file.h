// The view file of a frame: a text file of numbered lines, each read as at
// most 511 characters (the rest of a longer line is skipped).
//
// Four-column layout (tried first; every one of lines 2 to 9 gives 4 numbers):
//   line   content   meaning
//   1      any text  title, ignored
//   2..5   a b c d   column i = line - 2 of `mat`: [0][i]=a [1][i]=b [2][i]=c [3][i]=d
//   6..9   a b c d   the same for the inverse; only checked, the inverse used
//                    is the adjugate inverse of `mat`
// Three-column layout (otherwise; lines 2 to 7 give 3 numbers each):
//   1      any text  title, ignored
//   2..4   a b c     column i = line - 2 of `mat`: [0][i]=a [1][i]=b [2][i]=c
//   5..7   a b c     column i = line - 5 of `inv_mat`, the same way
//   every other element of both matrices is the identity's.
// A line "gives k numbers" when, as k "%lf" conversions of sscanf read it,
// it begins with k decimal numbers; text after them is ignored. "nan" and
// "inf" are no numbers here (a value out of range such as 1e400 still is one).
#pragma once

#include <cstddef>
#include <cstdio>
#include <optional>
#include <string>

#include "tool/frame_matrix.h"

namespace pc {

inline constexpr std::size_t kViewLineLength = 511;

struct ViewMatrices {
  Matrix4 mat;
  Matrix4 inv_mat;
};

// Reads the first `k` numbers of `line` into `out`; true when all k are there.
bool scanNumbers(const char* line, int k, double* out);

// Reads the next line of `stream` (at most kViewLineLength characters kept,
// line end removed); false at the end of the stream with nothing read.
bool readViewLine(std::FILE* stream, std::string& line);

// Both layouts over `stream`; nullopt when neither can be read.
std::optional<ViewMatrices> readViewStream(std::FILE* stream);

}  // namespace pc
