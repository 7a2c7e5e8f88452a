// The de-esser's user-level controls (band frequency, band shape, amount,
// reaction, listen) turned into settings of its SibilanceControl, which does
// the work. One or two channels; no latency.
#pragma once

#include <cstdint>

#include "../ZenAudioAlgorithm.h"
#include "SibilanceControl.h"

class Deesser : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kRange, kMode, kAmount, kReaction, kListen };
    enum Mode { kNarrow, kWide, kHighFrequency };
    enum Reaction { kSlow, kMedium, kFast };
    // Meter 0: the present gain change in dB (negative while reducing).
    enum Meter : std::uint64_t { kReductionMeter };

    Deesser();

    static const zen::ParameterTableDefinition& Definitions();

    // Prepares the control, puts its detector floor at -50 dB, then applies
    // this class's defaults.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    void SetChannelCount(std::uint64_t channels) override;
    bool SetParameter(std::uint64_t index, float value) override;
    void Reset() override;
    bool Process(float* const* channels, std::uint64_t count) override;
    float GetMeter(std::uint64_t index) const override;

    const SibilanceControl& Control() const { return m_control; }

private:
    SibilanceControl m_control;
};
