// The tool parameter reader: one parameter per line of "$TMP/outil.par", line
// i holding slot i, converted according to the kind of the slot.
#include "tool/tool_parameters.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <new>
#include <string_view>

#include "env/fixed_field.h"
#include "fileio/list_directed.h"
#include "fileio/runtime_fatal.h"
#include "tool/line_file_table.h"
#include "tool/parameter_keys.h"
#include "tool/tool_naming.h"
#include "tool/unit_scale.h"
#include "zonedb/zone_database.h"

namespace pc {

namespace {

constexpr std::size_t kNameField = 512;
constexpr std::size_t kLineWindow = 1000;
constexpr std::size_t kZoneTextField = 60;
constexpr int kWindowMinZSlot = 17;
constexpr int kStockAllowanceSlot = 10;
constexpr float kWindowMinZOpen = -90000.0f;
constexpr float kWindowMinZUnbounded = -99999.0f;

// A text line holding this sequence stands for an empty text.
constexpr std::string_view kEmptyTextMark = "0.00000   :  ";

class Block {
 public:
  Block(float* values, char* texts, int textWidth)
      : values_(values), texts_(textWidth > 0 ? texts : nullptr),
        width_(textWidth > 0 ? static_cast<std::size_t>(textWidth) : 0) {}

  float& value(int slot) { return values_[static_cast<std::size_t>(slot - 1)]; }

  void setText(int slot, std::string_view text) {
    if (texts_ == nullptr) return;  // the caller has no text half
    setField(std::span<char>(texts_ + width_ * static_cast<std::size_t>(slot - 1), width_), text);
  }

 private:
  float* values_;
  char* texts_;
  std::size_t width_;
};

// The text of a Text line: what follows its first colon, or the whole line.
std::string_view textOfLine(std::string_view window) {
  if (window.find(kEmptyTextMark) != std::string_view::npos) return {};
  const std::size_t colon = window.find(':');
  return colon == std::string_view::npos ? window : window.substr(colon + 1);
}

// Converts one numeric line into its slot; false on a conversion error.
bool readNumericLine(Block& block, int slot, ParamKind kind, std::string_view window) {
  std::size_t pos = 0;
  float value = block.value(slot);
  if (fileio::readListReal(window, pos, value) > 0) return false;
  block.value(slot) = value;
  if (kind != ParamKind::Integer) return true;

  // The integer part as text: the first decimal point ends the number.
  std::array<char, kLineWindow> copy{};
  std::copy(window.begin(), window.end(), copy.begin());
  const std::string_view whole(copy.data(), window.size());
  const std::size_t point = whole.find('.');
  if (point != std::string_view::npos) copy[point] = ' ';
  pos = 0;
  std::int32_t integer = 0;
  const int result = fileio::readListInteger(whole, pos, integer);
  if (result > 0) return false;
  if (result == fileio::kListValue) block.setText(slot, fileio::formatListInteger(integer));
  return true;
}

// Reads the open file into slots 1..n and gives the outcome for slot 1;
// `failedLine` receives the line that failed the reading.
float readSlots(int handle, Block& block, int n, int& failedLine) {
  if (parameterKind(n) == ParamKind::None) return 0.0f;
  if (n < 1) return static_cast<float>(n);
  for (int s = 1; s <= n; ++s) {
    block.value(s) = 0.0f;
    block.setText(s, {});
  }

  std::array<char, kLineWindow> line{};
  const std::string_view window(line.data(), line.size());
  int status = 0;
  lineFileReadLine(handle, line, status);
  failedLine = 1;
  if (status == kLineEnd) return static_cast<float>(n);
  if (status != kLineOk) return 0.0f;
  for (int slot = 1;; ++slot) {
    failedLine = slot;
    const ParamKind kind = parameterKind(slot);
    if (kind == ParamKind::Text) {
      block.setText(slot, textOfLine(window));
    } else if (!readNumericLine(block, slot, kind, window)) {
      return 0.0f;
    }
    if (slot >= n) return static_cast<float>(n);
    failedLine = slot + 1;
    lineFileReadLine(handle, line, status);
    if (status == kLineEnd) return static_cast<float>(n);
    if (status != kLineOk) return 0.0f;
  }
}

// The work zone may raise the stock allowance of every toolpath.
void addStockAllowanceIncrement(Block& block, const ParameterSources& sources) {
  std::array<char, kZoneTextField> text{};
  const int found = sources.zoneText ? sources.zoneText(kStockAllowanceRecord, text)
                                     : zoneTextValue(kStockAllowanceRecord, text);
  if (found < 1) return;
  const std::string_view field(text.data(), text.size());
  const std::size_t first = field.find_first_not_of(' ');
  std::size_t pos = 0;
  float increment = 0.0f;
  if (first == std::string_view::npos || field[first] == ',' ||
      fileio::readListReal(field, pos, increment) != fileio::kListValue) {
    fileio::fatalError("readToolParameters", "zone record % (stock allowance) is not a number",
                       kStockAllowanceRecord);
  }
  block.value(kStockAllowanceSlot) += increment;
}

void applyUnitScale(Block& block, int n, const ParameterSources& sources) {
  float scale = 1.0f;
  if (sources.unitScale) sources.unitScale(&scale);
  else unitScale(&scale);
  // Only a usable factor scales anything.
  if (scale == 1.0f || !std::isfinite(scale) || scale <= 0.0f) return;
  if (parameterKind(n) == ParamKind::None) {
    block.value(1) = 0.0f;
    return;
  }
  if (n < 1) return;
  for (int s = 1; s <= n; ++s) {
    if (parameterKind(s) != ParamKind::Length) continue;
    float& v = block.value(s);
    // An open lower window bound stays open in every unit.
    if (s == kWindowMinZSlot && v <= kWindowMinZOpen) v = kWindowMinZUnbounded;
    else v *= scale;
  }
}

}  // namespace

int allocateToolParameters(ToolParameters& block, int extra) {
  const std::size_t spare = extra > 0 ? static_cast<std::size_t>(extra) : 0;
  const std::size_t n = static_cast<std::size_t>(kParameterSlots) + spare;
  block.values.reset(new (std::nothrow) float[n]());
  block.texts.reset(new (std::nothrow) char[n * static_cast<std::size_t>(kParameterTextWidth)]());
  if (block.values) block.values[spare] = static_cast<float>(kParameterSlots);
  return kParameterTextWidth;
}

ParameterSources defaultParameterSources() {
  return ParameterSources{zoneTextValue, unitScale};
}

void readToolParameters(float* values, char* texts, int textWidth, const int* slotCount) {
  readToolParameters(values, texts, textWidth, slotCount, defaultParameterSources());
}

void readToolParameters(float* values, char* texts, int textWidth, const int* slotCount,
                        const ParameterSources& sources) {
  readToolParameters(values, texts, textWidth, slotCount, sources, ParameterFileRead{});
}

void readToolParameters(float* values, char* texts, int textWidth, const int* slotCount,
                        const ParameterSources& sources, const ParameterFileRead& file) {
  if (values == nullptr) return;
  Block block(values, texts, textWidth);
  const int n = slotCount != nullptr ? *slotCount : 0;

  std::array<char, kNameField> name{};
  std::string_view fileName = file.fileName;
  if (fileName.empty()) {
    toolFilePathFixed(0, name, ".par");
    fileName = std::string_view(name.data(), name.size());
  }
  int handle = -1;
  int status = 0;
  int failedLine = 0;
  lineFileOpen(handle, fileName, 1, status);
  if (status != kLineOk) {
    block.value(1) = 0.0f;
  } else {
    block.value(1) = readSlots(handle, block, n, failedLine);
    if (block.value(1) != 0.0f || n == 0) failedLine = 0;
    int closeStatus = 0;
    lineFileClose(handle, closeStatus);
  }

  if (file.failedLine != nullptr) *file.failedLine = failedLine;
  addStockAllowanceIncrement(block, sources);
  applyUnitScale(block, n, sources);
}

ParamKind parameterKind(int slot) {
  if (slot < 0 || slot > kParameterSlots) return ParamKind::None;
  return kParameterKeyTable[slot].kind;
}

}  // namespace pc
