#include "ButterworthHighPass.h"

#include <QCoreApplication>
#include <cmath>

namespace {

constexpr double kPi = 3.141592653589793;
constexpr float kOn = 1.0f;

ora::numeric::BiquadSection Section(const BiQuad& biquad) {
    const BiQuad::Coefficients& c = biquad.GetCoefficients();
    return {c.c0, c.c1, c.c2, c.c3, c.g};
}

}  // namespace

ButterworthHighPass::ButterworthHighPass() : ZenAudioAlgorithm(Definitions()) {
    for (BiQuad& section : m_sections) section.SetParameter(BiQuad::kShape, BiQuad::kHighPass);
    Design();
}

const zen::ParameterTableDefinition& ButterworthHighPass::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "ButterworthHighPass",
        {
            zen::LogarithmicParameter("FREQ", QT_TRANSLATE_NOOP("ButterworthHighPass", "Frequency"), 20.0f, 1000.0f,
                                      80.0f, 1.0f, "Hz"),
            zen::ListParameter("SLOPE", QT_TRANSLATE_NOOP("ButterworthHighPass", "Slope"),
                               {QT_TRANSLATE_NOOP("ButterworthHighPass", "12 dB/oct"),
                                QT_TRANSLATE_NOOP("ButterworthHighPass", "24 dB/oct")},
                               1.0f),
        });
    return table;
}

bool ButterworthHighPass::Prepare(float sampleRate, std::uint32_t maxBlock) {
    for (BiQuad& section : m_sections) section.Prepare(sampleRate, maxBlock);
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    Reset();
    return true;
}

bool ButterworthHighPass::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    Design();
    return true;
}

void ButterworthHighPass::Design() {
    const bool fourth = std::lround(GetParameter(kSlope)) == kTwentyFourDb;
    const float frequency = GetParameter(kFrequency);
    for (int s = 0; s < 2; ++s) {
        BiQuad& section = m_sections[s];
        const double q = fourth ? kFourthOrderQ[s] : kSecondOrderQ;
        section.SetParameter(BiQuad::kFreq, frequency);
        section.SetParameter(BiQuad::kQ, static_cast<float>(q));
        // At order 2 the second section is a wire.
        section.SetParameter(BiQuad::kIn, fourth || s == 0 ? kOn : 0.0f);
    }
}

void ButterworthHighPass::Reset() { m_state = {}; }

bool ButterworthHighPass::Process(float* const* channels, std::uint64_t count) {
    const std::uint64_t channelCount = GetChannelCount();
    if (channelCount == 0) return true;
    if (channelCount > kMaxChannels) return false;
    const ora::numeric::BiquadSection sections[2] = {Section(m_sections[0]), Section(m_sections[1])};
    m_pair.Process(sections, m_state, channels, channelCount, count);
    // A non-finite input would otherwise ring in the state for ever.
    for (std::size_t s = 0; s < 2; ++s)
        for (std::uint64_t c = 0; c < channelCount; ++c)
            if (!std::isfinite(m_state.w1[s][c]) || !std::isfinite(m_state.w2[s][c]))
                m_state.w1[s][c] = m_state.w2[s][c] = 0.0;
    return true;
}

double ButterworthHighPass::RingSeconds(double frequency, int slope, double decayDb) {
    // A pole pair of quality q at f decays as exp(-pi f t / q).
    const double q = slope == kTwentyFourDb ? kFourthOrderQ[1] : kSecondOrderQ;
    return decayDb / 20.0 * std::log(10.0) * q / (kPi * frequency);
}
