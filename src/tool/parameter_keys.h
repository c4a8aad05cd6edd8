// The key table of the tool parameter file: for every slot 0..580 its kind
// and its key name. Slot 0 does not exist (kind None, empty name).
#pragma once

#include <string_view>

#include "tool/tool_parameters.h"

namespace pc {

struct ParameterKey {
  ParamKind kind;
  const char* name;
};

extern const ParameterKey kParameterKeyTable[kParameterSlots + 1];

// Key name of slot s; empty outside 1..580.
std::string_view parameterKeyName(int slot);

}  // namespace pc
