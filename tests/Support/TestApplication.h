// The one Qt application of a test process: a QApplication on the offscreen
// platform, so that tests of timers and tests of editors share it whatever
// order they run in.
#pragma once

namespace zentest {

void EnsureApplication();

}  // namespace zentest
