// The config subcommand: the configuration as the classifier sees it.
#pragma once

namespace pc::inspect {

int showConfiguration(bool json);

}  // namespace pc::inspect
