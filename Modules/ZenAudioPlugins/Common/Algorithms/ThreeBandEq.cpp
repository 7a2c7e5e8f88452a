#include "ThreeBandEq.h"

#include <QCoreApplication>
#include <cmath>

namespace {

constexpr double kPi = 3.141592653589793;
constexpr float kOn = 1.0f;
constexpr float kOff = 0.0f;
enum Band { kLow, kMid, kHigh };

}  // namespace

ThreeBandEq::ThreeBandEq() : ZenAudioAlgorithm(Definitions()) {
    m_bands[kLow].SetParameter(BiQuad::kShape, BiQuad::kLowShelf);
    m_bands[kMid].SetParameter(BiQuad::kShape, BiQuad::kBell);
    m_bands[kHigh].SetParameter(BiQuad::kShape, BiQuad::kHighShelf);
    m_bands[kLow].SetParameter(BiQuad::kQ, kShelfQ);
    m_bands[kHigh].SetParameter(BiQuad::kQ, kShelfQ);
    SetChannelCount(1);
    for (std::uint64_t i = 0; i < GetParameterCount(); ++i) SetParameter(i, GetParameter(i));
}

const zen::ParameterTableDefinition& ThreeBandEq::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "ThreeBandEq",
        {
            zen::ContinuousParameter("LOW_GAIN", QT_TRANSLATE_NOOP("ThreeBandEq", "Low Gain"), -18.0f, 18.0f, 0.0f,
                                     0.1f, "dB"),
            zen::LogarithmicParameter("LOW_FREQ", QT_TRANSLATE_NOOP("ThreeBandEq", "Low Freq"), 40.0f, 500.0f, 120.0f,
                                      1.0f, "Hz"),
            zen::ContinuousParameter("MID_GAIN", QT_TRANSLATE_NOOP("ThreeBandEq", "Mid Gain"), -18.0f, 18.0f, 0.0f,
                                     0.1f, "dB"),
            zen::LogarithmicParameter("MID_FREQ", QT_TRANSLATE_NOOP("ThreeBandEq", "Mid Freq"), 200.0f, 8000.0f,
                                      2500.0f, 1.0f, "Hz"),
            zen::ContinuousParameter("MID_Q", QT_TRANSLATE_NOOP("ThreeBandEq", "Mid Q"), 0.3f, 6.0f, 1.0f, 0.01f),
            zen::ContinuousParameter("HIGH_GAIN", QT_TRANSLATE_NOOP("ThreeBandEq", "High Gain"), -18.0f, 18.0f, 0.0f,
                                     0.1f, "dB"),
            zen::LogarithmicParameter("HIGH_FREQ", QT_TRANSLATE_NOOP("ThreeBandEq", "High Freq"), 1500.0f, 16000.0f,
                                      10000.0f, 1.0f, "Hz"),
        });
    return table;
}

bool ThreeBandEq::Prepare(float sampleRate, std::uint32_t maxBlock) {
    for (BiQuad& band : m_bands) band.Prepare(sampleRate, maxBlock);
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    Reset();
    return true;
}

void ThreeBandEq::SetChannelCount(std::uint64_t channels) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    for (BiQuad& band : m_bands) band.SetChannelCount(channels);
}

bool ThreeBandEq::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    switch (index) {
        case kLowGain:
        case kMidGain:
        case kHighGain: {
            BiQuad& band = m_bands[index == kLowGain ? kLow : index == kMidGain ? kMid : kHigh];
            band.SetParameter(BiQuad::kGain, value);
            // Switching "In" clears the band's state.
            band.SetParameter(BiQuad::kIn, value != 0.0f ? kOn : kOff);
            break;
        }
        case kLowFrequency: m_bands[kLow].SetParameter(BiQuad::kFreq, value); break;
        case kMidFrequency: m_bands[kMid].SetParameter(BiQuad::kFreq, value); break;
        case kMidQ: m_bands[kMid].SetParameter(BiQuad::kQ, value); break;
        case kHighFrequency: m_bands[kHigh].SetParameter(BiQuad::kFreq, value); break;
        default: break;
    }
    return true;
}

void ThreeBandEq::Reset() {
    for (BiQuad& band : m_bands) band.Reset();
}

bool ThreeBandEq::Process(float* const* channels, std::uint64_t count) {
    for (BiQuad& band : m_bands)
        if (band.IsEnabled()) band.Process(channels, count);
    return true;
}

double ThreeBandEq::RingSeconds(double gainDb, double frequency, double q, double decayDb) {
    const double a = std::pow(10.0, std::fabs(gainDb) / 40.0);
    return decayDb / 20.0 * std::log(10.0) * q * a / (kPi * frequency / a);
}
