// The process-wide table of 8 coordinate frames. Frame kind k (1..8) is
// frame k - 1; frame 1 is the machine axis system, frame 2 the tool view.
// For every loaded frame the table keeps the matrices that carry
// coordinates between that frame and the tool view.
#pragma once

#include <array>
#include <cstddef>

#include "tool/frame_matrix.h"

namespace pc {

inline constexpr int kFrameCount = 8;
inline constexpr int kMachineFrame = 1;
inline constexpr int kToolViewFrame = 2;
inline constexpr std::size_t kFrameNameSize = 512;

struct Frame {
  // Set only when the frame is made an identity; NUL-terminated.
  std::array<char, kFrameNameSize> name{};
  bool defined = false;          // a definition succeeded once
  bool loaded = false;           // the matrices below are valid
  bool matIsIdentity = false;
  bool matlecIsIdentity = false;
  Matrix4 mat{};                 // the frame, from its file
  Matrix4 inv_mat{};             // its inverse
  Matrix4 matlec{};              // mat * inv_mat of the tool view
  Matrix4 matecr{};              // mat of the tool view * inv_mat
};

std::array<Frame, kFrameCount>& frameTable();
// Every frame back to its initial, undefined state (a fresh process).
void resetFrameTable();

// Defines frame `index` from `name`: "CAO" or "CAD" is the identity without
// any file, "MACHINE" the machine axis system file (identity when absent),
// anything else the view file of that name. 0, or -1 (absent or unreadable
// file, bad index).
int defineView(int index, const char* name);

// Applies the unit scale `s` to frame `index` and updates the relative
// matrices; the machine frame is made ready first (unless it is the one).
void scaleView(int index, double s);

// Loads the machine frame from the machine axis system file unless it is
// loaded already; the identity when that file is absent.
void ensureMachineFrame();

// The relative matrices of frame `index` against the tool view: of every
// defined and loaded frame when `index` is the tool view.
void updateRelativeMatrices(int index);

}  // namespace pc
