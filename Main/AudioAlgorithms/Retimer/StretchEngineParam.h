// Settings of the phase-vocoder stretch engine (ora::fft::stretch::pv).
#pragma once

#include <cstddef>

#include "System/ParamGroup.h"

namespace ora::fft::stretch::pv {

enum class Algorithm : int { PLPV = 0, PGHI = 1 };
enum class Mode : int { PG = 0, PV = 1, Auto = 2 };

class EngineParam : public ParamGroup {
public:
    // Capacity of the internal lists (peaks, pipeline steps, pooled vectors).
    static constexpr std::size_t kCapacity = 256;

    // `history`: analysis frames whose magnitudes and phases are kept, the
    // current one included; the time-direction gradients need 2.
    EngineParam(std::size_t frameLength, std::size_t overlap, std::size_t fftLength, int history);

    // Overlap non-zero, hop whole, transform at least a frame and even,
    // history at least 2.
    bool IsValid() const;

    std::size_t FrameLength() const { return m_frameLength; }
    std::size_t Overlap() const { return m_overlap; }
    std::size_t FftLength() const { return m_fftLength; }
    int History() const { return m_history; }
    std::size_t Bins() const { return m_bins; }
    std::size_t Hop() const { return m_hop; }
    float Gain() const { return m_gain; }
    std::size_t PeakCapacity() const { return m_peakCapacity; }
    std::size_t PipelineCapacity() const { return m_pipelineCapacity; }
    std::size_t PoolCapacity() const { return m_poolCapacity; }

    // Reconstruction settings, as the plug-in's parameters give them.
    Algorithm algorithm = Algorithm::PGHI;
    Mode mode = Mode::Auto;
    bool joint = true;
    float log10Eps = -4.0f;
    int maxPeak = 50;
    float log10Tol = -6.0f;

private:
    std::size_t m_frameLength;
    std::size_t m_overlap;
    std::size_t m_fftLength;
    int m_history;
    std::size_t m_bins;
    std::size_t m_hop;
    float m_gain = 1.0f;
    std::size_t m_peakCapacity = kCapacity;
    std::size_t m_pipelineCapacity = kCapacity;
    std::size_t m_poolCapacity = kCapacity;
};

}  // namespace ora::fft::stretch::pv
