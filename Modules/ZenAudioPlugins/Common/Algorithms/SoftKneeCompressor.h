// The Compressor's peak law with a quadratic soft knee, for one band of a
// multiband compressor: a linked peak detector in log units, floored at the
// knee's lower edge; a one-pole envelope with attack and release; and the
// gain, in log units (dB/20) with W the knee's width and s = 1 - 1/ratio,
//   0                            for E <= T - W/2,
//   -s (E - T + W/2)^2 / (2 W)   inside the knee,
//   (T - E) s                    above it,
// never below the reduction limit, plus the makeup. With no knee this is the
// Compressor's law (no hold, a 50 dB limit), the level's logarithm taken by
// way of log2 (faster, a few units in the last place apart).
//
// The owner may hand the law's four settings sample by sample (an automated
// threshold glides instead of stepping); otherwise the parameters hold.
#pragma once

#include <atomic>
#include <cstdint>
#include <vector>

#include "../ZenAudioAlgorithm.h"
#include "EnvelopeCoefficients.h"

class SoftKneeCompressor : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kThreshold, kRatio, kKnee, kAttack, kRelease, kMakeup };
    // The gain reduction at the last sample, in dB (<= 0, makeup not included).
    enum Meter : std::uint64_t { kGainReductionMeter };

    // The deepest reduction, as the Compressor's default limit.
    static constexpr float kReductionLimitDb = 50.0f;
    // Process links at most this many channels (and refuses more).
    static constexpr std::size_t kMaxChannels = 32;

    // The static law's settings in log units; slope = 1 - 1/ratio.
    struct Law {
        float threshold = -1.0f;
        float slope = 0.5f;
        float knee = 0.3f;
        float makeup = 0.0f;
    };

    SoftKneeCompressor();

    static const zen::ParameterTableDefinition& Definitions();

    static float SlopeOfRatio(float ratio) { return ratio > 1.0f ? 1.0f - 1.0f / ratio : 0.0f; }
    // The reduction (log units, <= 0, makeup not included) at envelope E.
    static float Reduction(float envelope, const Law& law) noexcept;

    // Sizes the scratch gains for Process, then the defaults and Reset.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    bool SetParameter(std::uint64_t index, float value) override;
    void Reset() override;
    // Reset with the envelope resting at the knee of `law` (an owner's law).
    void Reset(const Law& law);
    // Linked over every channel, in place.
    bool Process(float* const* channels, std::uint64_t count) override;
    float GetMeter(std::uint64_t index) const override;

    // Linear gains (makeup included) for `count` samples from the loudest of
    // the detector channels; `law`, when given, holds the law per sample.
    void ComputeGains(const float* const* detectors, std::size_t detectorCount, float* gains, std::size_t count,
                      const Law* law = nullptr) noexcept;
    // The same with one law for the whole block.
    void ComputeGains(const float* const* detectors, std::size_t detectorCount, float* gains, std::size_t count,
                      const Law& law) noexcept;

    const Law& GetLaw() const { return m_law; }

private:
    template <bool kPerSample>
    void Run(const float* const* detectors, std::size_t detectorCount, float* gains, std::size_t count,
             const Law* law) noexcept;

    Law m_law;
    float m_envelope = -1.15f;  // log units
    zen::EnvelopeCoefficients m_attack;
    zen::EnvelopeCoefficients m_release;
    float m_reduction = 0.0f;  // log units, of the last sample
    std::vector<float> m_gains;  // Process
    std::atomic<float> m_reductionDb{0.0f};
};
