#include "driver/run_driver.h"

int main(int argc, char** argv) { return pc::runPocketClassifier(argc, argv); }
