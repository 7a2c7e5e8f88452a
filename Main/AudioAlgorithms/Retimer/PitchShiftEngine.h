// The pitch shifter: stretch by the pitch ratio, read back at that ratio so
// the duration is kept, mix with the delayed dry input. Musical settings
// (semitones, cents, dry/wet, algorithm and mode) are applied through a set
// of pending-change bits, in a fixed order, until none is left.
#pragma once

#include <cstddef>
#include <cstdint>

#include "Retimer/PitchShiftEngineParam.h"
#include "Retimer/RetimerEngine.h"

namespace ora::pitchshift {

class Engine {
public:
    enum ChangeBits : std::uint32_t {
        kPitchChanged = 1,
        kMixChanged = 2,
        kAlgorithmChanged = 4,
        kAllChanged = 7,
    };
    // Range of the transposition: an octave and a semitone either way.
    static constexpr double kMaxCents = 1300.0;
    // Coarse and fine below this difference count as unchanged.
    static constexpr double kChangeEpsilon = 1e-7;

    struct Settings {
        std::int32_t coarse = 0;  // semitones
        float fine = 0.0f;        // cents
        float dryWet = 100.0f;    // percent processed
        std::int32_t algorithmType = 1;  // 0 "PLPV", 1 "PGHI"
        std::int32_t algorithmMode = 2;  // 0 "PG", 1 "PV", 2 "Auto"
    };

    static double Ratio(std::int32_t coarse, float fine);
    static double MinRatio();
    static double MaxRatio();

    // The latency of an engine built from `param`, with or without one.
    static std::size_t LatencyFor(const EngineParam& param);

    explicit Engine(EngineParam& param);
    Engine(const Engine&) = delete;
    Engine& operator=(const Engine&) = delete;

    bool Configure(std::size_t channels, fft::Backend backend = fft::FFT::DefaultBackend());
    std::size_t Channels() const { return m_channels; }
    bool Reset() noexcept;

    // The bits `wanted` would change against the settings last applied.
    std::uint32_t Changes(const Settings& wanted) const;
    // Applies `wanted` for the pending bits plus `changes`, in order: pitch,
    // mix, algorithm.
    void Apply(const Settings& wanted, std::uint32_t changes) noexcept;
    std::uint32_t Pending() const { return m_pending; }
    const Settings& Applied() const { return m_applied; }
    // Back to the construction state of the mix, with every change pending.
    void ForgetSettings() noexcept;

    // Settings outside the change bits, applied at once.
    void SetJoint(bool joint) noexcept;
    void SetLog10Eps(float value) noexcept;
    void SetMaxPeak(int value) noexcept;
    void SetLog10Tol(float value) noexcept;

    // `in` and `out` must not be the same buffers.
    bool Process(const float* const* in, float* const* out, std::size_t frames) noexcept;
    std::size_t Latency() const { return static_cast<std::size_t>(m_retimer.Latency()); }
    retimer::Engine& Retimer() { return m_retimer; }

private:
    EngineParam& m_param;
    retimer::Engine m_retimer;
    Settings m_applied;
    std::uint32_t m_pending = kAllChanged;
    std::size_t m_channels = 0;
};

}  // namespace ora::pitchshift
