#include <cstdio>

#include "driver/information_request.h"
#include "driver/run_driver.h"
#include "env/configuration_loader.h"

int main(int argc, char** argv) {
  // --help and --version are answered before anything looks at the installation.
  const pc::InformationRequest request = pc::answerInformationRequest(argc, argv, PC_VERSION_TEXT, stdout);
  if (request != pc::InformationRequest::NotHandled) return pc::informationExitStatus(request);
  // Variables missing from the environment come from the suite's environ.cfg files.
  pc::installConfigurationLoader();
  return pc::runPocketClassifier(argc, argv);
}
