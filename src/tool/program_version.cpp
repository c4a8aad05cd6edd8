// Interim version reader: no version information yet.
#include "tool/program_version.h"

namespace pc {

int readVersionInfo(const char*, std::map<std::string, std::string>&, FixedVersionInfo&) { return 1; }

std::uint32_t programVersion() { return 0; }

}  // namespace pc
