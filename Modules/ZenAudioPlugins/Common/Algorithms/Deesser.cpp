#include "Deesser.h"

#include <QCoreApplication>
#include <cmath>

namespace {

constexpr float kDetectorFloorDb = -50.0f;
// Band shapes by mode: a narrow or a wide bell, or a high shelf.
constexpr float kBellShape = 4.0f;
constexpr float kHighShelfShape = 3.0f;
constexpr float kNarrowQ = 2.1f;
constexpr float kWideQ = 0.55f;
constexpr float kHighShelfQ = 0.707f;
// "Amount" in % over this is the band boost in dB: 100 % boosts 16.7 dB.
constexpr float kAmountPerDb = 6.0f;

// Reaction r in 0..2 with h = r/2: each time runs from its "Slow" value at
// h = 0 down by its span at h = 1 ("Fast").
struct ReactionLine {
    float slow;
    float span;
    float At(float h) const { return slow - span * h; }
};
constexpr ReactionLine kAttackMs{10.0f, 9.9f};
constexpr ReactionLine kHoldMs{20.0f, 19.0f};
constexpr ReactionLine kReleaseMs{80.0f, 79.0f};
constexpr ReactionLine kReactionSetting{2.0f, 1.9f};

}  // namespace

Deesser::Deesser() : ZenAudioAlgorithm(Definitions()) {
    m_control.SetParameter(SibilanceControl::kFloor, kDetectorFloorDb);
    for (std::uint64_t i = 0; i < GetParameterCount(); ++i) SetParameter(i, GetParameter(i));
}

const zen::ParameterTableDefinition& Deesser::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "Deesser",
        {
            zen::ContinuousParameter("RANGE", QT_TRANSLATE_NOOP("Deesser", "Range"), 700.0f, 9000.0f, 1000.0f, 1.0f,
                                     "Hz"),
            zen::ListParameter("MODE", QT_TRANSLATE_NOOP("Deesser", "Mode"),
                               {QT_TRANSLATE_NOOP("Deesser", "Narrow"), QT_TRANSLATE_NOOP("Deesser", "Wide"),
                                QT_TRANSLATE_NOOP("Deesser", "HF")},
                               0.0f),
            zen::ContinuousParameter("AMOUNT", QT_TRANSLATE_NOOP("Deesser", "Amount"), 0.0f, 100.0f, 50.0f, 0.1f,
                                     "%"),
            zen::ListParameter("REACTION", QT_TRANSLATE_NOOP("Deesser", "Reaction Time"),
                               {QT_TRANSLATE_NOOP("Deesser", "Slow"), QT_TRANSLATE_NOOP("Deesser", "Med"),
                                QT_TRANSLATE_NOOP("Deesser", "Fast")},
                               1.0f),
            zen::ContinuousParameter("LISTEN_SWITCH", QT_TRANSLATE_NOOP("Deesser", "Listen"), 0.0f, 1.0f, 0.0f,
                                     0.01f),
        });
    return table;
}

bool Deesser::Prepare(float sampleRate, std::uint32_t maxBlock) {
    m_control.Prepare(sampleRate, maxBlock);
    m_control.SetParameter(SibilanceControl::kFloor, kDetectorFloorDb);
    return ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
}

void Deesser::SetChannelCount(std::uint64_t channels) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    m_control.SetChannelCount(channels);
}

bool Deesser::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    switch (index) {
        case kRange: m_control.SetParameter(SibilanceControl::kFrequency, value); break;
        case kMode: {
            const float mode = std::trunc(value + 0.5f);  // 0.5 is already "Wide"
            const bool narrow = mode == static_cast<float>(kNarrow);
            const bool wide = mode == static_cast<float>(kWide);
            m_control.SetParameter(SibilanceControl::kMode, narrow || wide ? kBellShape : kHighShelfShape);
            m_control.SetParameter(SibilanceControl::kQ, narrow ? kNarrowQ : (wide ? kWideQ : kHighShelfQ));
            break;
        }
        case kAmount: m_control.SetParameter(SibilanceControl::kGain, value / kAmountPerDb); break;
        case kReaction: {
            // Passed on unclamped, even where they leave the control's ranges.
            const float h = value * 0.5f;
            m_control.SetParameter(SibilanceControl::kAttack, kAttackMs.At(h));
            m_control.SetParameter(SibilanceControl::kHold, kHoldMs.At(h));
            m_control.SetParameter(SibilanceControl::kRelease, kReleaseMs.At(h));
            m_control.SetParameter(SibilanceControl::kReaction, kReactionSetting.At(h));
            break;
        }
        case kListen: m_control.SetParameter(SibilanceControl::kListen, value); break;
        default: break;
    }
    return true;
}

void Deesser::Reset() { m_control.Reset(); }

bool Deesser::Process(float* const* channels, std::uint64_t count) { return m_control.Process(channels, count); }

float Deesser::GetMeter(std::uint64_t index) const {
    return index == kReductionMeter ? m_control.GetMeter(SibilanceControl::kReductionMeter) : 0.0f;
}
