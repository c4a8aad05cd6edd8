// Names of the work zone's database and lock: the directory in TRXZONE (the
// current directory when unset or empty) followed by "/zone.inf" and
// "/zone.lck". Built on first use and kept for the run.
#pragma once

#include <string>

namespace pc::zonedb {

const std::string& zoneDatabaseName();
const std::string& zoneLockName();

}  // namespace pc::zonedb
