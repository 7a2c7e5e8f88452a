// Stereo image of two channels: the correlation of left and right (+1 the
// same signal, 0 unrelated, -1 opposite polarity), their balance and the
// levels of mid (L+R)/2 and side (L-R)/2. The mean squares and the mean
// product of the channels are averaged with one time constant ("Time"),
// and everything follows from those three; plain sums since the reset give
// the same readings over the whole programme.
//
// The buffers are read, never written. NaN and infinite samples count as
// silence. Readings are for the owner's thread, between blocks.
#pragma once

#include <cstdint>

#include "../ZenAudioAlgorithm.h"

class CorrelationMeter : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kTime };

    // Below this mean square (-100 dBFS) a channel counts as silent: the
    // correlation and balance of silence are 0.
    static constexpr double kSilentPower = 1e-10;

    CorrelationMeter();
    static const zen::ParameterTableDefinition& Definitions();

    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    bool SetParameter(std::uint64_t index, float value) override;
    void Reset() override;
    // Reads channels 0 and 1; false unless the channel count is 2.
    bool Process(float* const* channels, std::uint64_t count) override;

    struct Image {
        double correlation = 0.0;  // -1..+1
        double balance = 0.0;      // -1 (left only)..+1 (right only), by power
        double midRms = 0.0;       // linear
        double sideRms = 0.0;
        double leftRms = 0.0;
        double rightRms = 0.0;
    };
    // Averaged with "Time".
    Image Current() const { return ImageOf(m_ll, m_rr, m_lr); }
    // Over everything since the reset.
    Image Overall() const;

    static Image ImageOf(double ll, double rr, double lr);

private:
    double m_a = 0.0;  // one-pole coefficient of "Time"
    double m_ll = 0.0, m_rr = 0.0, m_lr = 0.0;
    double m_sumLl = 0.0, m_sumRr = 0.0, m_sumLr = 0.0;
    std::uint64_t m_frames = 0;
};
