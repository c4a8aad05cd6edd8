// The svg subcommand: a contour information file drawn level by level, or
// the pockets of a pocket file in machining order.
#pragma once

#include <string>
#include <string_view>

namespace pc::inspect {

struct SvgOptions {
  std::string output;
  int level = -1;  // -1: every level
};

// Exit code: kExitClean, or kExitUnreadable (damaged input, or the output
// cannot be written).
int drawSvg(const std::string& path, const SvgOptions& options);

// Text made safe for SVG character data and attribute values.
std::string xmlEscape(std::string_view text);

}  // namespace pc::inspect
