#include "ThreeBandEq.h"

#include <QCoreApplication>
#include <cmath>

namespace {

constexpr double kPi = 3.141592653589793;
constexpr float kOn = 1.0f;
enum Band { kLow, kMid, kHigh };

}  // namespace

ThreeBandEq::ThreeBandEq() : ZenAudioAlgorithm(Definitions()) {
    m_designs[kLow].SetParameter(BiQuad::kShape, BiQuad::kLowShelf);
    m_designs[kMid].SetParameter(BiQuad::kShape, BiQuad::kBell);
    m_designs[kHigh].SetParameter(BiQuad::kShape, BiQuad::kHighShelf);
    m_designs[kLow].SetParameter(BiQuad::kQ, kShelfQ);
    m_designs[kHigh].SetParameter(BiQuad::kQ, kShelfQ);
    for (BiQuad& design : m_designs) design.SetParameter(BiQuad::kIn, kOn);
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
    for (BiQuad& design : m_designs) design.Prepare(sampleRate, maxBlock);
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    Reset();
    return true;
}

void ThreeBandEq::SetChannelCount(std::uint64_t channels) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    for (zen::SvfSection& band : m_bands) band.SetChannelCount(channels);
}

bool ThreeBandEq::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    // The band and BiQuad parameter of each of ours, in our index order.
    static constexpr struct {
        int band;
        std::uint64_t parameter;
    } kTargets[] = {{kLow, BiQuad::kGain},  {kLow, BiQuad::kFreq},  {kMid, BiQuad::kGain}, {kMid, BiQuad::kFreq},
                    {kMid, BiQuad::kQ},     {kHigh, BiQuad::kGain}, {kHigh, BiQuad::kFreq}};
    const auto [band, parameter] = kTargets[index];
    m_designs[band].SetParameter(parameter, value);
    if (parameter == BiQuad::kGain) {
        const bool enabled = value != 0.0f;
        if (enabled && !m_enabled[band]) m_bands[band].Reset();
        m_enabled[band] = enabled;
    }
    m_bands[band].Set(m_designs[band].GetCoefficients());
    return true;
}

void ThreeBandEq::Reset() {
    for (zen::SvfSection& band : m_bands) band.Reset();
}

bool ThreeBandEq::Process(float* const* channels, std::uint64_t count) {
    for (int band = 0; band < 3; ++band)
        if (m_enabled[band]) m_bands[band].Process(channels, count);
    return true;
}

double ThreeBandEq::RingSeconds(double gainDb, double frequency, double q, double decayDb) {
    const double a = std::pow(10.0, std::fabs(gainDb) / 40.0);
    return decayDb / 20.0 * std::log(10.0) * q * a / (kPi * frequency / a);
}
