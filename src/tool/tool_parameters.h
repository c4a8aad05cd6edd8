// The tool parameter block: 580 numeric slots and 580 texts of 300 characters,
// read from the toolpath's parameter file, slot s at position s - 1.
#pragma once

#include <cstdint>
#include <memory>

namespace pc {

inline constexpr int kParameterSlots = 580;
inline constexpr int kParameterTextWidth = 300;

enum class ParamKind : std::int16_t { None = -1, Number = 0, Length = 1, Text = 2, Integer = 3 };

struct ToolParameters {
  std::unique_ptr<float[]> values;  // zero-filled
  std::unique_ptr<char[]> texts;    // zero-filled, kParameterTextWidth per slot

  float& slot(int s) { return values[static_cast<std::size_t>(s - 1)]; }
};

// Allocates 580 + max(extra, 0) values and texts, zero-filled, stores 580.0 in
// value position max(extra, 0) and returns the text width. A failed
// allocation leaves the corresponding pointer empty.
int allocateToolParameters(ToolParameters& block, int extra);

// Fills the block from "$TMP/outil.par"; value position 0 receives the
// outcome (the slot count on success, 0 on failure).
void readToolParameters(float* values, char* texts, int textWidth, const int* slotCount);

// Kind of slot s (0..580); ParamKind::None outside.
ParamKind parameterKind(int slot);

}  // namespace pc
