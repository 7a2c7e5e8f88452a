#include "FeedbackPath.h"

#include <algorithm>

namespace {

constexpr double kHighestCut = 0.45;  // of the rate

void Design(BiQuad& section, BiQuad::Shape shape, double frequency, bool on) {
    section.SetParameter(BiQuad::kShape, static_cast<float>(shape));
    section.SetParameter(BiQuad::kQ, static_cast<float>(FeedbackPath::kButterworthQ));
    if (on) section.SetParameter(BiQuad::kFreq, static_cast<float>(frequency));
    section.SetParameter(BiQuad::kIn, on ? 1.0f : 0.0f);
}

}  // namespace

FeedbackPath::FeedbackPath() : m_lowDesign(std::make_unique<BiQuad>()), m_highDesign(std::make_unique<BiQuad>()) {}

FeedbackPath::~FeedbackPath() = default;

void FeedbackPath::Prepare(double sampleRate, std::uint32_t channels) {
    m_sampleRate = sampleRate;
    m_lowDesign->Prepare(static_cast<float>(sampleRate), 1);
    m_highDesign->Prepare(static_cast<float>(sampleRate), 1);
    m_states.assign(channels, State{});
    SetCuts(0.0, 0.0);
}

void FeedbackPath::SetCuts(double lowCut, double highCut) {
    const double highest = kHighestCut * m_sampleRate;
    Design(*m_lowDesign, BiQuad::kHighPass, std::min(lowCut, highest), lowCut > 0.0);
    Design(*m_highDesign, BiQuad::kLowPass, highCut, highCut > 0.0 && highCut < highest);
    m_low = m_lowDesign->GetCoefficients();
    m_high = m_highDesign->GetCoefficients();
}

void FeedbackPath::Reset() noexcept { std::fill(m_states.begin(), m_states.end(), State{}); }
