// show for the tool parameter file: every slot as the program reads it.
#include <cstdio>
#include <fstream>
#include <string>

#include "json_stream.h"
#include "show.h"
#include "tool/parameter_keys.h"
#include "tool/tool_parameters.h"

namespace pc::inspect {

namespace {

constexpr int kNoZoneRecord = -23;
constexpr std::size_t kLongestLine = 1022;

const char* kindText(ParamKind kind) {
  switch (kind) {
    case ParamKind::Number: return "number";
    case ParamKind::Length: return "length";
    case ParamKind::Text: return "text";
    case ParamKind::Integer: return "integer";
    case ParamKind::None: break;
  }
  return "none";
}

struct ReadBlock {
  ToolParameters block;
  int failedLine = 0;
};

// One reading of the file by the program's reader, with the given scale and
// without the zone's stock-allowance increment (the file as it stands).
ReadBlock readBlock(const std::string& path, double scale) {
  ReadBlock read;
  allocateToolParameters(read.block, 0);
  ParameterSources sources{[](int, std::span<char>) { return kNoZoneRecord; },
                           [scale](float* s) { *s = static_cast<float>(scale); }};
  const int slots = kParameterSlots;
  readToolParameters(read.block.values.get(), read.block.texts.get(), kParameterTextWidth, &slots, sources,
                     ParameterFileRead{path, &read.failedLine});
  return read;
}

std::string slotText(const ToolParameters& block, int slot) {
  std::string text(block.texts.get() + static_cast<std::size_t>(slot - 1) * kParameterTextWidth, kParameterTextWidth);
  const std::size_t end = text.find_last_not_of(' ');
  return end == std::string::npos ? std::string{} : text.substr(0, end + 1);
}

// Why line `number` stopped the reader, told from its bytes.
fileio::ReadProblem lineProblem(const std::string& path, int number) {
  std::ifstream in(path, std::ios::binary);
  std::string line;
  std::int64_t offset = 0;
  for (int i = 1; i < number && std::getline(in, line); ++i) offset += static_cast<std::int64_t>(line.size()) + 1;
  const bool got = static_cast<bool>(std::getline(in, line));
  const bool lineFeed = got && !in.eof();
  std::string expected;
  if (got && line.size() > kLongestLine) {
    expected = "at most 1022 bytes before the line feed, found " + std::to_string(line.size());
  } else if (got && !lineFeed) {
    expected = "a line feed at the end of the line";
  } else {
    expected = std::string("a ") + kindText(parameterKind(number)) + " value in free form for slot " +
               std::to_string(number) + " " + std::string(parameterKeyName(number));
  }
  return fileio::ReadProblem{offset, number, expected};
}

}  // namespace

int showToolParameters(const std::string& path, const ShowOptions& options) {
  if (!std::ifstream(path)) return reportDamage(path, fileio::ReadProblem{0, 0, "a readable file"});
  const ReadBlock asFile = readBlock(path, 1.0);
  const ReadBlock scaled = readBlock(path, options.scale);
  const bool scaling = options.scale != 1.0;
  JsonStream json(stdout);
  if (options.json) {
    json.beginObject();
    json.value("file", path);
    json.value("kind", "tool-parameters");
    json.value("unit_scale", options.scale);
    json.beginArray("slots");
  } else {
    std::printf("tool parameter file %s, unit scale %g %s\n", path.c_str(), options.scale,
                scaling ? "applied to the length slots" : "(lengths as the file has them)");
  }
  for (int slot = 1; slot <= kParameterSlots; ++slot) {
    const ParamKind kind = parameterKind(slot);
    const std::string name(parameterKeyName(slot));
    const float value = asFile.block.values[static_cast<std::size_t>(slot - 1)];
    const float scaledValue = scaled.block.values[static_cast<std::size_t>(slot - 1)];
    const std::string text = slotText(asFile.block, slot);
    if (options.json) {
      nlohmann::json j{{"slot", slot}, {"key", name}, {"kind", kindText(kind)}};
      if (kind != ParamKind::Text) j["value"] = number(value);
      if (kind == ParamKind::Length) j["scaled"] = number(scaledValue);
      if (kind == ParamKind::Text || kind == ParamKind::Integer) j["text"] = text;
      json.element(j);
    } else if (kind == ParamKind::Text) {
      std::printf("%3d  %-44s text     \"%s\"\n", slot, name.c_str(), text.c_str());
    } else {
      std::printf("%3d  %-44s %-8s %s", slot, name.c_str(), kindText(kind), numberText(value).c_str());
      if (kind == ParamKind::Length && scaling) std::printf("  (scaled %s)", numberText(scaledValue).c_str());
      std::printf("\n");
    }
  }
  if (options.json) {
    json.end();
    json.value("outcome", number(asFile.block.values[0]));
    json.end();
  }
  std::fflush(stdout);
  if (asFile.failedLine > 0) return reportDamage(path, lineProblem(path, asFile.failedLine));
  return kExitClean;
}

}  // namespace pc::inspect
