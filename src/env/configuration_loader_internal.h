// Shared by the files of the configuration loader.
#pragma once

#include <cstdio>

#include "env/message_table.h"

namespace pc {

// What reading one file gave: the table to use from then on (nullptr when a
// first file does not exist, or the file failed), and whether a fatal
// message was sent, after which the loading gives up.
struct LoadOutcome {
  MessageTable* table;
  bool gaveUp;
};

LoadOutcome loadMessagesFile(MessageTable* table, const char* fileName);
LoadOutcome loadMessagesFromStream(MessageTable* table, const char* fileName, std::FILE* stream);

// The table that a file is being read into, for the lookups its conditions
// make; nullptr between files.
MessageTable*& tableBeingRead();

}  // namespace pc
