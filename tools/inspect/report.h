// What every subcommand shares: its options, its exit codes, the report of a
// damaged file, and numbers printed the way a float is stored.
#pragma once

#include <string>

#include <nlohmann/json.hpp>

#include "fileio/byte_stream.h"

namespace pc::inspect {

inline constexpr int kExitClean = 0;
inline constexpr int kExitProblems = 1;
inline constexpr int kExitUnreadable = 2;

struct ShowOptions {
  bool json = false;
  bool points = false;
  double scale = 1.0;  // unit scale applied to the length slots of a parameter file
};

// "pocket-inspect: FILE: offset N, record M: expected ..." on standard
// error; returns kExitUnreadable.
int reportDamage(const std::string& path, const fileio::ReadProblem& problem);

// The shortest decimal that reads back as the float, as a JSON number
// (null for NaN and infinities).
nlohmann::json number(float v);
// The same digits as text, "nan" and "inf" included.
std::string numberText(float v);

}  // namespace pc::inspect
