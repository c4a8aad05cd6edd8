// pocket-inspect: shows, draws and checks the files of a pocket classifier
// run, through the classifier's own readers.
//   pocket-inspect show [--json] [--points] [--type KIND] [--scale F] FILE
//   pocket-inspect svg FILE -o OUT.svg [--level N]
//   pocket-inspect check [--json] FILE
//   pocket-inspect config [--json]
#include <cstdio>
#include <exception>
#include <optional>
#include <string>

#include <CLI/CLI.hpp>

#include "check.h"
#include "config_view.h"
#include "file_kind.h"
#include "show.h"
#include "svg_writer.h"

namespace {

using namespace pc::inspect;

int run(int argc, char** argv) {
  CLI::App app{"pocket-inspect: shows, draws and checks the files of a pocket classifier run", "pocket-inspect"};
  app.require_subcommand(1);
  app.set_version_flag("--version", "pocket-inspect 1.0");

  ShowOptions showOptions;
  std::string showFileName, showType;
  CLI::App* show = app.add_subcommand("show", "print a file of the run readably, told by its content");
  show->add_flag("--json", showOptions.json, "print JSON instead of text");
  show->add_flag("--points", showOptions.points, "add every point");
  show->add_option("--type", showType, "read the file as this kind: " + kindNames());
  show->add_option("--scale", showOptions.scale, "unit scale applied to the length slots of a parameter file")
      ->check(CLI::PositiveNumber);
  show->add_option("FILE", showFileName, "the file to show")->required();

  SvgOptions svgOptions;
  std::string svgFileName;
  CLI::App* svg = app.add_subcommand("svg", "draw a contour information file or a pocket file as SVG");
  svg->add_option("FILE", svgFileName, "contour information file, tagged or record contour file")->required();
  svg->add_option("-o,--output", svgOptions.output, "the SVG file to write")->required();
  svg->add_option("--level", svgOptions.level, "draw only this level (0-based)")->check(CLI::NonNegativeNumber);

  CheckOptions checkOptions;
  std::string checkFileName;
  CLI::App* check = app.add_subcommand(
      "check", "check the geometry of a contour information file (exit 0 clean, 1 problems, 2 unreadable)");
  check->add_flag("--json", checkOptions.json, "print JSON instead of text");
  check->add_option("FILE", checkFileName, "the contour information file")->required();

  bool configJson = false;
  CLI::App* config = app.add_subcommand("config", "print the configuration as the classifier sees it, with origins");
  config->add_flag("--json", configJson, "print JSON instead of text");

  try {
    app.parse(argc, argv);
  } catch (const CLI::ParseError& e) {
    const int code = app.exit(e);
    return code == 0 ? kExitClean : kExitUnreadable;
  }

  if (*show) {
    std::optional<FileKind> forced;
    if (!showType.empty()) {
      forced = kindFromName(showType);
      if (!forced) {
        std::fprintf(stderr, "pocket-inspect: unknown --type %s (one of %s)\n", showType.c_str(), kindNames().c_str());
        return kExitUnreadable;
      }
    }
    return showFile(showFileName, forced, showOptions);
  }
  if (*svg) return drawSvg(svgFileName, svgOptions);
  if (*check) return checkFile(checkFileName, checkOptions);
  if (*config) return showConfiguration(configJson);
  return kExitUnreadable;
}

}  // namespace

int main(int argc, char** argv) {
  // Nothing may escape as a crash: an exception of a library (allocation,
  // JSON) ends the run with the unreadable-input status.
  try {
    return run(argc, argv);
  } catch (const std::exception& e) {
    std::fprintf(stderr, "pocket-inspect: %s\n", e.what());
  } catch (...) {
    std::fprintf(stderr, "pocket-inspect: unexpected failure\n");
  }
  return kExitUnreadable;
}
