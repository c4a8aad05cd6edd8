// For tests only: forgets the process-wide state that the environment layer
// computes once per process, so that one test process can run many cases.
#pragma once

namespace pc::env_testing {

// The expander's debugging settings and time stamp.
void resetExpanderSettings();
// The zone number and the temporary directory name.
void resetWorkZone();
// Both of the above; the channel handlers and the configuration lookup are
// left as they are (their setters return the previous ones).
void resetProcessState();

}  // namespace pc::env_testing
