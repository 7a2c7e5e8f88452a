// Time offset between the two channels of a stereo pair, from the peak of
// their cross-correlation: frames of the pair go through the FFT, their
// cross-spectrum and powers are averaged over "Time", and after each frame
// the lag within +- the range with the largest |correlation| is the estimate.
// The sign of the correlation there tells an inverted channel; the powers
// tell a dead one.
//
// A positive lag means the right channel comes later. The buffers are read,
// never written; NaN and infinite samples count as silence. Each estimate
// falls on a frame boundary, so callers that cut their blocks there (see
// FramesToEstimate) get the same estimates in any block split.
#pragma once

#include <cstdint>
#include <memory>
#include <vector>

#include "../ZenAudioAlgorithm.h"
#include "FFT/FFT.h"

class InterChannelOffset : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kTime };

    // A frame holds at least this many times the largest lag, so the frames
    // still overlap well at the ends of the range.
    static constexpr std::uint32_t kFramePerLag = 8;

    InterChannelOffset();
    static const zen::ParameterTableDefinition& Definitions();

    // The largest lag searched; takes effect at the next Prepare.
    void SetRange(double milliseconds) { m_rangeMs = milliseconds; }
    // Sizes the frames and the FFT for the rate and the range; allocates.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    bool SetParameter(std::uint64_t index, float value) override;
    void Reset() override;
    // Reads channels 0 and 1 (count samples); false unless there are two.
    bool Process(float* const* channels, std::uint64_t count) override;

    // Samples until the current frame is full and the next estimate is made.
    std::uint32_t FramesToEstimate() const { return m_frame - m_filled; }
    std::uint32_t GetMaxLag() const { return m_maxLag; }

    struct Estimate {
        bool valid = false;  // a frame has been analysed since the reset
        int lag = 0;               // samples, right later than left when positive
        double correlation = 0.0;  // at that lag, -1..+1; 0 when a channel is silent
        double leftPower = 0.0;    // mean squares, averaged
        double rightPower = 0.0;
    };
    const Estimate& Current() const { return m_estimate; }
    // Counts the estimates made since the reset (a new one when it changes).
    std::uint64_t GetEstimateCount() const { return m_count; }

private:
    void Analyse() noexcept;

    std::unique_ptr<ora::fft::FFT> m_fft;
    std::vector<float> m_left, m_right, m_work, m_correlation;
    std::vector<ora::fft::Complex> m_leftBins, m_rightBins;
    std::vector<std::complex<double>> m_cross;  // averaged
    double m_leftPower = 0.0, m_rightPower = 0.0;
    double m_a = 0.0;  // per frame
    double m_rangeMs = 10.0;
    std::uint32_t m_frame = 0, m_filled = 0, m_maxLag = 0;
    Estimate m_estimate;
    std::uint64_t m_count = 0;
};
