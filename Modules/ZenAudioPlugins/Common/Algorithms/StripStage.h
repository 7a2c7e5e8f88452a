// One stage of a channel strip (a filter, a gate, a compressor) that can be
// switched in and out while audio runs without a click: while its switch
// moves, the output cross-fades between the stage's input and its result.
// A stage switched fully out does not run, and starts again from cleared
// state, so nothing stale from long ago leaks into the signal.
//
// It can also measure, over the segments since the last look, what it
// changes (the peak of output minus input: the rumble a high-pass took
// away, the harmonics an exciter added) or what it puts out (its peak).
#pragma once

#include <cstdint>
#include <vector>

#include "../SmoothedRamp.h"
#include "../ZenAudioAlgorithm.h"

namespace zen {

class StripStage {
public:
    static constexpr std::uint32_t kMaxChannels = 8;
    enum class Measure { kNothing, kChange, kOutput };

    // The algorithm is driven through Process and Reset only; the owner
    // prepares it and sets its parameters.
    explicit StripStage(ZenAudioAlgorithm& algorithm, Measure measure = Measure::kNothing);

    StripStage(const StripStage&) = delete;
    StripStage& operator=(const StripStage&) = delete;

    // Sizes the copy of the input for segments of up to maxSegment frames. Allocates.
    void Prepare(std::uint32_t channels, std::uint32_t maxSegment);
    // The stage starts over: cleared at its next run.
    void Reset() noexcept;

    // Frames [offset, offset + count) of every channel, in place, count at
    // most the prepared segment; `fade` holds the switch per sample of the
    // block: 0 out, 1 in.
    void Process(float* const* channels, std::uint32_t channelCount, std::uint32_t offset, std::uint32_t count,
                 const SmoothedRamp& fade) noexcept;

    ZenAudioAlgorithm& Algorithm() { return m_algorithm; }
    // Whether the last segment ran through the stage.
    bool IsRunning() const { return m_running; }
    // The peak measured since the last call: of |output - input| or of the
    // output; 0 while the stage does not run.
    float TakePeak() noexcept;

private:
    ZenAudioAlgorithm& m_algorithm;
    const Measure m_measure;
    std::vector<float> m_input;  // channel-major, m_segment frames each
    std::uint32_t m_segment = 0;
    bool m_running = false;
    float m_peak = 0.0f;
};

}  // namespace zen
