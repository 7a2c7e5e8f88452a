#include "SpeechEntryModel.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <memory>

#include "Common/Algorithms/KWeightingFilter.h"
#include "zen/LevellerEngine.h"
#include "zen/fvad.h"

namespace zentest {

namespace {

constexpr int kRate = 48000;
constexpr std::size_t kFrame = 480;  // 10 ms
constexpr int kVadMode = 2;
constexpr double kSpeechFloorLufs = -65.0;
constexpr double kSpeechFraction = 0.3;
constexpr double kLufsOffset = -0.691;

}  // namespace

std::vector<float> MeasureSpeechEntries(const std::vector<float>& x) {
    const std::size_t entry = zen::levelling::kEntryFrames, framesPerEntry = entry / kFrame;
    std::unique_ptr<Fvad, void (*)(Fvad*)> vad(fvad_new(), fvad_free);
    fvad_set_mode(vad.get(), kVadMode);
    fvad_set_sample_rate(vad.get(), kRate);
    zen::KWeightingFilter weighting;
    weighting.Prepare(kRate, 1);
    std::vector<float> values;
    std::int16_t pcm[kFrame];
    for (std::size_t first = 0; first + entry <= x.size(); first += entry) {
        double power = 0.0;
        std::size_t voiced = 0;
        for (std::size_t f = 0; f < framesPerEntry; ++f) {
            const float* frame = x.data() + first + f * kFrame;
            double sum = 0.0;
            weighting.AccumulatePower(0, frame, kFrame, sum);
            for (std::size_t i = 0; i < kFrame; ++i)
                pcm[i] = static_cast<std::int16_t>(std::lround(std::clamp(frame[i], -1.0f, 1.0f) * 32767.0f));
            const double mean = sum / kFrame;
            if (fvad_process(vad.get(), pcm, kFrame) == 1 && kLufsOffset + 10.0 * std::log10(mean + 1e-30) >= kSpeechFloorLufs) {
                power += mean;
                ++voiced;
            }
        }
        values.push_back(voiced >= kSpeechFraction * framesPerEntry
                             ? static_cast<float>(kLufsOffset + 10.0 * std::log10(power / static_cast<double>(voiced)))
                             : zen::levelling::kNoSpeech);
    }
    return values;
}

std::vector<float> ApplyGainList(const std::vector<float>& x, const std::vector<int>& tenths, std::vector<float>* applied) {
    std::vector<float> y(x.size());
    if (applied) applied->resize(x.size());
    float g = 1.0f;
    for (std::size_t n = 0; n < x.size(); ++n) {
        const std::size_t e = std::min(n / zen::levelling::kEntryFrames, tenths.size() - 1);
        const float target = tenths[e] < -999 ? 0.0f : static_cast<float>(std::pow(10.0, tenths[e] / 200.0));
        y[n] = x[n] * g;
        if (applied) (*applied)[n] = g;
        if (n % 16 == 0) g = 0.99f * g + 0.01f * target;
    }
    return y;
}

}  // namespace zentest
