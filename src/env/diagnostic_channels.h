// The three message channels of the environment and memory layers: warning,
// fatal and trace. Each has a replaceable handler so that a host program (or a
// test) can route the messages elsewhere.
#pragma once

#include <string>

namespace pc {

// A handler receives one message text, without an added line end.
using MessageHandler = void (*)(const char* message);

// Each setter installs `handler` (nullptr restores the default) and returns
// the handler that was installed before.
MessageHandler setWarningHandler(MessageHandler handler);
MessageHandler setFatalHandler(MessageHandler handler);
MessageHandler setTraceHandler(MessageHandler handler);

// The defaults:
// - warning: "%s\n" on standard error, or on standard output when
//   TRX_TRXFILES_VERBOSE is set to anything but "off";
// - fatal: printed as a warning, then the process ends with exit code -1;
// - trace: "%s\n" on standard output only when TRX_TRXFILES_VERBOSE is set to
//   anything but "off".
void defaultWarningHandler(const char* message);
[[noreturn]] void defaultFatalHandler(const char* message);
void defaultTraceHandler(const char* message);

// True when TRX_TRXFILES_VERBOSE is set to anything but "off" (exact case).
bool verboseChannels();

// True when a trace message would go anywhere: a replaced handler, or the
// default one in verbose mode. Lets callers skip composing long trace lines.
bool traceActive();

void warning(const char* message);
void warning(const std::string& message);
// With a replaced handler the fatal entry returns: callers must then give up
// what they were doing and return their failure value.
void fatal(const char* message);
void fatal(const std::string& message);
void trace(const char* message);
void trace(const std::string& message);

}  // namespace pc
