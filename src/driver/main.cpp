#include "driver/run_driver.h"
#include "env/configuration_loader.h"

int main(int argc, char** argv) {
  // Variables missing from the environment come from the suite's environ.cfg files.
  pc::installConfigurationLoader();
  return pc::runPocketClassifier(argc, argv);
}
