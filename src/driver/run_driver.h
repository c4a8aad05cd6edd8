// The program entry of the pocket classifier.
#pragma once

namespace pc {

// Runs the whole classification; returns the exit status.
int runPocketClassifier(int argc, char** argv);

}  // namespace pc
