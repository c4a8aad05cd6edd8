// Shared by the configuration loader tests: every variable the loader reads
// cleared, the channels recorded (a fatal message returns, and the loader
// gives up), the loader installed and its table forgotten around each case.
#pragma once

#include <gtest/gtest.h>

#include <forward_list>
#include <optional>
#include <string>
#include <vector>

#include "env/configuration_loader.h"
#include "env/diagnostic_channels.h"
#include "env/env_testing.h"
#include "support/test_support.h"

namespace pc::test {

using Lines = std::vector<std::string>;

struct ConfigurationChannels {
  Lines warnings, fatals, traces;
};
inline ConfigurationChannels channels;

class ConfigurationTest : public ::testing::Test {
 protected:
  ConfigurationTest() {
    for (const char* name : {"TRXTMPDIR", "TRXTMP", "TRXZONE", "TRXCONF", "TRXHOME", "TRXHOME_LS", "TRXNULL",
                             "TRX_TRXFILES_VERBOSE", "ENVPATH", "PCT_A", "PCT_B"}) {
      set(name, std::nullopt);
    }
    channels = {};
    setWarningHandler([](const char* m) { channels.warnings.emplace_back(m); });
    setFatalHandler([](const char* m) { channels.fatals.emplace_back(m); });
    setTraceHandler([](const char* m) { channels.traces.emplace_back(m); });
    installConfigurationLoader();
    env_testing::resetProcessState();
    env_testing::resetConfigurationLoader();
  }
  ~ConfigurationTest() override {
    env_testing::resetConfigurationLoader();
    env_testing::resetProcessState();
    setWarningHandler(nullptr);
    setFatalHandler(nullptr);
    setTraceHandler(nullptr);
    setConfigurationLookup(nullptr);
  }
  void set(const std::string& name, const std::optional<std::string>& value) { env_.emplace_front(name, value); }

 private:
  std::forward_list<ScopedEnv> env_;
};

}  // namespace pc::test
