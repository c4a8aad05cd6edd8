// Interim parameter reader: the leading number of line i goes to slot i.
#include "tool/tool_parameters.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>

#include "tool/tool_naming.h"

namespace pc {

int allocateToolParameters(ToolParameters& block, int extra) {
  const std::size_t n = static_cast<std::size_t>(kParameterSlots + (extra > 0 ? extra : 0));
  block.values.reset(new (std::nothrow) float[n]());
  block.texts.reset(new (std::nothrow) char[n * kParameterTextWidth]());
  if (block.values) block.values[static_cast<std::size_t>(extra > 0 ? extra : 0)] = 580.0f;
  return kParameterTextWidth;
}

void readToolParameters(float* values, char* /*texts*/, int /*textWidth*/, const int* slotCount) {
  char name[512];
  toolFilePathFixed(0, name, ".par");
  std::string path(name, sizeof name);
  path.erase(path.find_last_not_of(' ') + 1);
  std::FILE* f = std::fopen(path.c_str(), "rb");
  if (f == nullptr) return;
  char line[1024];
  for (int i = 0; i < *slotCount && std::fgets(line, sizeof line, f) != nullptr; ++i) {
    values[i] = std::strtof(line, nullptr);
  }
  std::fclose(f);
}

ParamKind parameterKind(int slot) {
  return slot >= 1 && slot <= kParameterSlots ? ParamKind::Number : ParamKind::None;
}

}  // namespace pc
