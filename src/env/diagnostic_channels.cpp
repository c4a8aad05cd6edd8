#include "env/diagnostic_channels.h"

#include <cstdio>
#include <cstdlib>

#include "platform/platform.h"

namespace pc {

namespace {

MessageHandler warningHandler = defaultWarningHandler;
MessageHandler fatalHandler = defaultFatalHandler;
MessageHandler traceHandler = defaultTraceHandler;

MessageHandler install(MessageHandler& slot, MessageHandler handler, MessageHandler fallback) {
  const MessageHandler previous = slot;
  slot = handler != nullptr ? handler : fallback;
  return previous;
}

void printLine(std::FILE* stream, const char* message) {
  std::fprintf(stream, "%s\n", message != nullptr ? message : "");
  std::fflush(stream);
}

}  // namespace

bool verboseChannels() {
  const auto value = platform::getEnv("TRX_TRXFILES_VERBOSE");
  return value.has_value() && *value != "off";
}

bool traceActive() { return traceHandler != defaultTraceHandler || verboseChannels(); }

MessageHandler setWarningHandler(MessageHandler handler) {
  return install(warningHandler, handler, defaultWarningHandler);
}
MessageHandler setFatalHandler(MessageHandler handler) {
  return install(fatalHandler, handler, defaultFatalHandler);
}
MessageHandler setTraceHandler(MessageHandler handler) {
  return install(traceHandler, handler, defaultTraceHandler);
}

void defaultWarningHandler(const char* message) {
  printLine(verboseChannels() ? stdout : stderr, message);
}

void defaultFatalHandler(const char* message) {
  defaultWarningHandler(message);
  std::exit(-1);
}

void defaultTraceHandler(const char* message) {
  if (verboseChannels()) printLine(stdout, message);
}

void warning(const char* message) { warningHandler(message); }
void warning(const std::string& message) { warningHandler(message.c_str()); }
void fatal(const char* message) { fatalHandler(message); }
void fatal(const std::string& message) { fatalHandler(message.c_str()); }
void trace(const char* message) { traceHandler(message); }
void trace(const std::string& message) { traceHandler(message.c_str()); }

}  // namespace pc
