// The loader of the layered environ.cfg files: the installation's own file,
// then the files of the directories of the ?ENV list, each overloading the
// ones read before, into the process-wide message table.
//
// Every failure the files can cause goes to the fatal channel, which ends the
// process. A replaced fatal handler may return: the loading then gives up
// where it stands, and the tables keep what was stored before.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

#include "env/message_table.h"

namespace pc {

// Makes the expander's configuration lookups answer from the process-wide
// table, loading it on the first lookup that needs it (once per process).
// A lookup made while a file is read sees the table being filled.
void installConfigurationLoader();

// Loads the whole configuration into the process-wide table; does nothing
// once it has run.
void loadEnvironment();

// Loads `directory` followed by "environ.cfg" into the process-wide table;
// `directory` ends in a separator.
void loadConfigurationDirectory(const std::string& directory);

// Loads `fileName` from every directory of `directoryList` (',' or ';'
// separated), from the last directory to the first. Gives the table to use
// from then on (a new empty one when `table` is nullptr and nothing loads).
MessageTable* loadConfigurationList(MessageTable* table, std::string_view directoryList,
                                    std::string_view fileName);

// Reads one file into `table` (a new table when nullptr). A file that does
// not exist leaves `table` as it is. nullptr when the file failed to load.
MessageTable* load_messages(MessageTable* table, const char* fileName);

// Parses `size` bytes as the contents of a file named `fileName`.
MessageTable* load_messages_from_buffer(MessageTable* table, const char* fileName,
                                        const unsigned char* data, std::size_t size);

namespace env_testing {
// Releases the process-wide table and lets the next lookup load it again.
void resetConfigurationLoader();
}  // namespace env_testing

}  // namespace pc
