// The reverb's processing object: the direct path through the direct
// zn_matrixing, the early path through the modulated reflection taps, the
// early zn_matrixing and the early zn_eq, and the late path, fed by the tap
// lanes, through the 15-line network and the late zn_eq. The three add into
// the output. New line lengths while running are applied inside a fade-out,
// reset and fade-in of the late path.
//
// This object runs everything at the host's rate; zn_reverb_u15_x2 and _x4
// run the early and late paths at a half or a quarter of it between
// polyphase converters (the direct path stays at the host's rate, so the dry
// signal is never filtered). ForRate picks the object for a rate.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include "Algorithms/Downsampler.h"
#include "Algorithms/LaneTranspose.h"
#include "Algorithms/Upsampler.h"
#include "Algorithms/Vec.h"
#include "Common/ZenAudioAlgorithm.h"
#include "System/AlignedBuffer.h"
#include "zn_eq.h"
#include "zn_matrixing.h"
#include "zn_reflections_mod.h"
#include "zn_reverb_u15_control.h"
#include "zn_reverb_u15_param.h"
#include "zn_reverberant_u15.h"

namespace zen::reverb {

class zn_reverb_u15 : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    static constexpr std::uint32_t kTaps = zn_reflections_param::kTaps;
    static constexpr std::uint32_t kLanes = zn_reverberant_u15::kLanes;
    static constexpr std::uint32_t kMaxChannels = 16;
    // The tap lanes enter the network at this level.
    static constexpr float kLateInputGain = 0.25f;
    // Input beyond this (60 dB over full scale) is held there, and input that
    // is not a number is taken as silence: the network would keep either for
    // ever, or overflow.
    static constexpr float kLargestInput = 1e3f;
    // Engine-rate frames of the resampled objects.
    static constexpr std::uint32_t kEngineFrame = 1024;
    // Enough for the converters to pass 20 kHz at a 44.1 kHz engine rate.
    static constexpr std::uint32_t kConverterTapsPerPhase = 48;

    zn_reverb_u15();
    ~zn_reverb_u15() override;

    // zn_reverb_u15_x4 at 176.4 and 192 kHz, _x2 at 88.2 and 96 kHz, this
    // object at any other rate.
    static std::unique_ptr<zn_reverb_u15> ForRate(float hostRate);
    // The rate the room is computed for.
    static float EngineRateFor(float hostRate);

    virtual std::uint32_t Factor() const { return 1; }
    float EngineRate() const { return m_engineRate; }

    // Everything for `inputs` and `outputs` channels (1..16), host blocks of
    // up to `maxBlock` frames and lines of up to `maxLaneLength` engine
    // samples; cleared. Allocates; the object is then ready to Configure.
    void Dimension(std::uint32_t inputs, std::uint32_t outputs, float hostRate, std::uint32_t maxBlock,
                   std::uint32_t maxLaneLength);
    // The whole settings object; sizes must match the dimensions. Does not
    // allocate unless lines longer than dimensioned arrive.
    void Configure(const zn_reverb_u15_param& param);

    // In place: `channels` holds max(inputs, outputs) buffers; inputs are
    // read from the first ones, outputs written to the first ones.
    bool Process(float* const* channels, std::uint64_t count) override;
    // As Process, for blocks of any length: the resampled objects then hold
    // back up to Factor() - 1 frames of their wet input and delay the wet
    // output by Factor() - 1 frames to match (the direct path is not delayed).
    bool ProcessAnyLength(float* const* channels, std::uint64_t count) noexcept;
    void Reset() override;

    std::uint32_t Inputs() const { return m_inputs; }
    std::uint32_t Outputs() const { return m_outputs; }
    const zn_reverberant_u15& Tail() const { return m_tail; }
    const zn_reflections_mod& Reflections() const { return m_reflections; }
    const zn_reverb_u15_control& Control() const { return m_control; }
    const zn_matrixing& Direct() const { return m_direct; }
    // Host frames the converters take at once.
    std::uint32_t InFrameSize() const { return kEngineFrame * Factor(); }

protected:
    // The early and late paths over `count` (at most m_engineFrames)
    // engine-rate input frames (channel ch at in + ch * stride), into planar m_wet.
    void ProcessWet(const float* in, std::size_t stride, std::size_t count) noexcept;
    // Host-rate blocks whose length is a multiple of Factor().
    bool ProcessResampled(float* const* channels, std::size_t count) noexcept;

private:
    // Down, wet at the engine rate, up: `count` (a multiple of Factor()) planar host frames.
    void ResampledWet(const float* in, std::size_t inStride, float* out, std::size_t outStride,
                      std::size_t count) noexcept;
    void CopyIn(float* const* channels, std::size_t count) noexcept;
    void ApplyPendingLengths() noexcept;

    std::uint32_t m_inputs = 0;
    std::uint32_t m_outputs = 0;
    std::uint32_t m_hostFrames = 0;    // largest host block
    std::uint32_t m_engineFrames = 0;  // largest engine block
    float m_engineRate = 48000.0f;
    bool m_running = false;

    zn_matrixing m_direct;
    zn_reflections_mod m_reflections;
    zn_matrixing m_early;
    zn_eq m_earlyEq;
    zn_reverberant_u15 m_tail;
    zn_eq m_lateEq;
    zn_reverb_u15_control m_control;
    zn_reverberant_u15_param m_pendingTail;
    bool m_pendingLengths = false;

    std::vector<std::unique_ptr<ora::numeric::Downsampler>> m_down;  // per input
    std::vector<std::unique_ptr<ora::numeric::Upsampler>> m_up;      // per output

    ora::AlignedBuffer<float> m_in;          // planar inputs, host rate
    ora::AlignedBuffer<float> m_directOut;   // planar outputs, host rate
    ora::AlignedBuffer<float> m_wetHost;     // planar outputs, host rate (resampled objects)
    ora::AlignedBuffer<float> m_engineIn;    // planar inputs, engine rate
    ora::AlignedBuffer<float> m_taps;        // planar, per tap
    ora::AlignedBuffer<float> m_silence;     // the tail's lane 15 input
    ora::AlignedBuffer<float> m_u;           // 16-lane tail input
    ora::AlignedBuffer<float> m_wet;         // planar: early, then late, per output; then their sum
    ora::AlignedBuffer<float> m_fade;
    // Any-length blocks of the resampled objects.
    ora::AlignedBuffer<float> m_stage;  // per input: held-back frames, then the block
    ora::AlignedBuffer<float> m_queue;  // per output: wet frames not yet sent
    std::size_t m_stageStride = 0, m_queueStride = 0;
    std::size_t m_held = 0, m_queued = 0;
    std::vector<float*> m_earlyPointers, m_latePointers;
    const float* m_tapRows[kLanes] = {};  // the tail's input lanes: taps 0..14, then silence
    ora::numeric::LaneTranspose m_transpose;
    ora::numeric::Vec m_vec;
};

}  // namespace zen::reverb
