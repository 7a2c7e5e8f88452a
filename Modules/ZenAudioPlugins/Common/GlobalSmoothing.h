// The process-wide parameter smoother (200 ms) shared by the smoothed values
// of every plug-in, and the smoothing-running flag: set while any instance is
// processing audio. While it is clear, new targets take effect at once.
#pragma once

namespace zen {

class OnePoleSmoother;

namespace GlobalSmoothing {

constexpr int kTimeConstantMs = 200;

OnePoleSmoother& SharedSmoother();

bool IsRunning();

// Counted: an instance enters when it starts processing and leaves when it is
// prepared again or destroyed.
void EnterProcessing();
void LeaveProcessing();

}  // namespace GlobalSmoothing
}  // namespace zen
