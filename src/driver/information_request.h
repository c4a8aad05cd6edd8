// The two words a user of a console tool tries first: --help and --version.
#pragma once

#include <cstdio>

namespace pc {

// Outcome of looking at the first argument before a run.
enum class InformationRequest {
  NotHandled,  // any other argument: the run goes on, its mode from the first character
  Answered,    // usage or version written: exit 0
  WriteFailed  // the answer could not be written: exit 255
};

// When the first argument is exactly "--help" or "--version", writes a short
// usage or "pocket-classifier <versionText>" to `out` and touches no file.
// Every other argument (including "--HELP", "--helpx", "-h") is not ours, so
// that callers of the suite relying on the first-character modes see no change.
InformationRequest answerInformationRequest(int argc, char** argv, const char* versionText, std::FILE* out);

// The process exit status for an answered request.
int informationExitStatus(InformationRequest request);

}  // namespace pc
