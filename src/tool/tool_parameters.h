// The tool parameter block: 580 numeric slots and 580 texts of 300 characters,
// read from the toolpath's parameter file, slot s at position s - 1.
#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <span>
#include <string>

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

// Where the reader gets the two things that do not come from the parameter
// file: the text of a zone database record (status >= 1 when found) and the
// unit scale. The defaults ask the work-zone database and the unit scale of
// the run.
struct ParameterSources {
  std::function<int(int, std::span<char>)> zoneText;
  std::function<void(float*)> unitScale;
};

// For tools that show a given parameter file: the file, taken as it stands
// (empty for "$TMP/outil.par"), and where the number of the line that ended
// the reading as a failure goes (0 when none did).
struct ParameterFileRead {
  std::string fileName;
  int* failedLine = nullptr;
};
ParameterSources defaultParameterSources();

// Code of the zone record holding the stock-allowance increment.
inline constexpr int kStockAllowanceRecord = 31;

// Fills slots 1..*slotCount from "$TMP/outil.par", adds the zone's
// stock-allowance increment to slot 10 and multiplies the length slots by the
// unit scale. Value position 0 receives the outcome: the slot count when the
// file was read to its end or up to the last slot, 0 when it could not be
// opened or a line could not be read or converted.
void readToolParameters(float* values, char* texts, int textWidth, const int* slotCount);
void readToolParameters(float* values, char* texts, int textWidth, const int* slotCount,
                        const ParameterSources& sources);
void readToolParameters(float* values, char* texts, int textWidth, const int* slotCount,
                        const ParameterSources& sources, const ParameterFileRead& file);

// Kind of slot s (0..580); ParamKind::None outside.
ParamKind parameterKind(int slot);

}  // namespace pc
