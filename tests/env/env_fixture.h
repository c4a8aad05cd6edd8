// Common ground of the environment tests: every variable the layer reads is
// cleared for the test, the channels are recorded instead of printed, and the
// process-wide state is forgotten before and after each case.
#pragma once

#include <gtest/gtest.h>

#include <map>
#include <memory>
#include <string>
#include <vector>

#include "env/configuration_lookup.h"
#include "env/diagnostic_channels.h"
#include "env/env_testing.h"
#include "support/test_support.h"

namespace pc::test {

struct Recorded {
  static inline std::vector<std::string> warnings;
  static inline std::vector<std::string> fatals;
  static inline std::vector<std::string> traces;
  static inline std::map<std::string, ConfigurationValue> table;  // "section/KEY"

  static void warning(const char* m) { warnings.emplace_back(m); }
  static void fatal(const char* m) { fatals.emplace_back(m); }
  static void trace(const char* m) { traces.emplace_back(m); }
  static std::optional<ConfigurationValue> lookup(std::string_view section, std::string_view key) {
    std::string k(key);
    for (char& c : k) c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    const auto it = table.find(std::string(section) + "/" + k);
    if (it == table.end()) return std::nullopt;
    return it->second;
  }
};

class EnvTest : public ::testing::Test {
 protected:
  EnvTest() {
    for (const char* name : {"TRXTMPDIR", "TRXTMP", "TRXZONE", "TRXCONF", "TRXHOME", "TRXHOME_LS", "TRXNULL",
                             "TRX_TRXFILES_VERBOSE", "TRX_EXPAND_MIN_BUFFER_SIZE", "TRX_EXPAND_WATCH",
                             "TRX_EXPAND_LOGFILE_NAME", "TEMP", "TRX_BUFFER_TOO_SMALL_OPTION", "CFGPATH"}) {
      set(name, std::nullopt);
    }
    Recorded::warnings.clear();
    Recorded::fatals.clear();
    Recorded::traces.clear();
    Recorded::table.clear();
    oldWarning_ = setWarningHandler(Recorded::warning);
    oldFatal_ = setFatalHandler(Recorded::fatal);
    oldTrace_ = setTraceHandler(Recorded::trace);
    oldLookup_ = setConfigurationLookup(Recorded::lookup);
    env_testing::resetProcessState();
  }
  ~EnvTest() override {
    env_testing::resetProcessState();
    setWarningHandler(oldWarning_);
    setFatalHandler(oldFatal_);
    setTraceHandler(oldTrace_);
    setConfigurationLookup(oldLookup_);
    while (!env_.empty()) env_.pop_back();  // restore in reverse order
  }

  void set(const std::string& name, const std::optional<std::string>& value) {
    env_.push_back(std::make_unique<ScopedEnv>(name, value));
  }

 private:
  std::vector<std::unique_ptr<ScopedEnv>> env_;
  MessageHandler oldWarning_ = nullptr;
  MessageHandler oldFatal_ = nullptr;
  MessageHandler oldTrace_ = nullptr;
  ConfigurationLookup oldLookup_ = nullptr;
};

}  // namespace pc::test
