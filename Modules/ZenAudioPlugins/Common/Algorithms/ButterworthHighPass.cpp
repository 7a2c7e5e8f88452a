#include "ButterworthHighPass.h"

#include <QCoreApplication>
#include <cmath>

namespace {

constexpr double kPi = 3.141592653589793;
constexpr float kOn = 1.0f;

}  // namespace

ButterworthHighPass::ButterworthHighPass() : ZenAudioAlgorithm(Definitions()) {
    for (BiQuad& design : m_designs) {
        design.SetParameter(BiQuad::kShape, BiQuad::kHighPass);
        design.SetParameter(BiQuad::kIn, kOn);
    }
    SetChannelCount(1);
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
    for (BiQuad& design : m_designs) design.Prepare(sampleRate, maxBlock);
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    Reset();
    return true;
}

void ButterworthHighPass::SetChannelCount(std::uint64_t channels) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    for (zen::SvfSection& section : m_sections) section.SetChannelCount(channels);
}

bool ButterworthHighPass::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    Design();
    return true;
}

void ButterworthHighPass::Design() {
    m_fourthOrder = std::lround(GetParameter(kSlope)) == kTwentyFourDb;
    for (int s = 0; s < 2; ++s) {
        BiQuad& design = m_designs[s];
        design.SetParameter(BiQuad::kFreq, GetParameter(kFrequency));
        design.SetParameter(BiQuad::kQ, static_cast<float>(m_fourthOrder ? kFourthOrderQ[s] : kSecondOrderQ));
        m_sections[s].Set(design.GetCoefficients());
    }
}

void ButterworthHighPass::Reset() {
    for (zen::SvfSection& section : m_sections) section.Reset();
}

bool ButterworthHighPass::Process(float* const* channels, std::uint64_t count) {
    m_sections[0].Process(channels, count);
    if (m_fourthOrder) m_sections[1].Process(channels, count);
    return true;
}

double ButterworthHighPass::RingSeconds(double frequency, int slope, double decayDb) {
    // A pole pair of quality q at f decays as exp(-pi f t / q).
    const double q = slope == kTwentyFourDb ? kFourthOrderQ[1] : kSecondOrderQ;
    return decayDb / 20.0 * std::log(10.0) * q / (kPi * frequency);
}
