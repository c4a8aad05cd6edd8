#include "report.h"

#include <charconv>
#include <cmath>
#include <cstdio>
#include <cstdlib>

namespace pc::inspect {

int reportDamage(const std::string& path, const fileio::ReadProblem& problem) {
  std::string where = "offset " + std::to_string(problem.offset);
  if (problem.record > 0) where += ", record " + std::to_string(problem.record);
  std::fprintf(stderr, "pocket-inspect: %s: %s: expected %s\n", path.c_str(), where.c_str(), problem.expected.c_str());
  return kExitUnreadable;
}

std::string numberText(float v) {
  char text[32];
  const auto result = std::to_chars(text, text + sizeof text, v);
  return std::string(text, result.ptr);
}

nlohmann::json number(float v) {
  if (!std::isfinite(v)) return nullptr;
  return std::strtod(numberText(v).c_str(), nullptr);
}

}  // namespace pc::inspect
