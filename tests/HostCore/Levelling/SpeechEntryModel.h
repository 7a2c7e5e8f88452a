// What the "AI" plug-in hands the levelling engine, measured the same way
// outside it: per entry of 19200 samples, the K-weighted loudness of the
// 10 ms frames fvad calls voiced (mode 2) and that lie above -65 LUFS, or
// kNoSpeech when fewer than 30 % of the entry's frames are. Mono, 48 kHz.
#pragma once

#include <vector>

namespace zentest {

std::vector<float> MeasureSpeechEntries(const std::vector<float>& x);

// The plug-in's gain law over `x` for a list of gains in tenths of a dB per
// entry: the target moves at entry boundaries, the applied gain g starts at
// 1 and after every 16th sample becomes 0.99 g + 0.01 target. `applied`
// gets g per sample.
std::vector<float> ApplyGainList(const std::vector<float>& x, const std::vector<int>& tenths,
                                 std::vector<float>* applied = nullptr);

}  // namespace zentest
