// The FFT engine: input is pushed in, frames of it run through a pipeline
// of frame plug-ins (analysis, spectral work, synthesis), and the pipeline's
// output plug-in overlap-adds each frame into the output.
//
// Two ways to drive it:
//   - Push: analysis hop = synthesis hop, for spectral processing in place
//     of a stream; the output is the input's timeline delayed by
//     PushLatency().
//   - Write + RunFrame: the caller picks each frame's analysis position (a
//     time-stretch does), to a fraction of a sample; after each frame the
//     next synthesis hop of output is final and readable through Emitted().
// Configure allocates; everything else is real-time safe.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include "FFT/Buffer.h"
#include "FFT/Context.h"
#include "FFT/FFT.h"
#include "FFT/Frame.h"
#include "FFT/Plugin.h"
#include "FFT/Pool.h"
#include "FFT/Window.h"

namespace ora::fft {

struct EngineConfig {
    std::size_t channels = 1;
    bool sharedRow = false;  // one extra spectral row for joint reconstruction
    std::size_t frameLength = 4096;
    std::size_t fftLength = 4096;
    std::size_t hop = 1024;           // synthesis hop; the duals are built for it
    std::size_t inputCapacity = 0;    // input history per channel; 0: four frames
    Backend backend = FFT::DefaultBackend();
    float gain = 1.0f;
    // Input beyond +-inputLimit is limited to it and non-finite input taken
    // as silence, so the transforms' sums and squares stay finite; 0: as is.
    float inputLimit = 0.0f;
    std::vector<Plugin*> pipeline;    // not owned; must end in an OUTPUT plug-in
};

class Engine {
public:
    static constexpr std::size_t kMaxChannels = 64;

    Engine();
    ~Engine();
    Engine(const Engine&) = delete;
    Engine& operator=(const Engine&) = delete;

    // Checks the configuration, allocates and configures every plug-in.
    // False (with the failed check reported) leaves the engine unconfigured.
    bool Configure(const EngineConfig& config);
    bool IsConfigured() const { return m_configured; }
    void Reset() noexcept;

    void Write(const float* const* in, std::size_t frames) noexcept;
    std::int64_t Written() const;
    // Runs one frame centred on input position `centre`, `analysisHop`
    // after the previous frame's centre (for the first frame: the hop the
    // frames will keep), its content placed in the synthesis by `map` (null:
    // a uniform stretch by the hops' ratio). The samples read are the whole
    // ones nearest the centre; earlier positions and those not yet written
    // read as silence.
    void RunFrameAt(double centre, double analysisHop, const TimeMap* map = nullptr) noexcept;
    // Runs one frame whose first sample is input position `analysisStart`,
    // a whole hop after the previous one (the synthesis hop for the first).
    void RunFrame(std::int64_t analysisStart) noexcept;
    // The synthesis hop of output that the last frame completed.
    const float* Emitted(std::size_t channel) const { return m_out[channel].data(); }

    // Streams `frames` samples through the pipeline at a fixed hop. `in` and
    // `out` must be distinct buffers. Returns the frames written to `out`.
    std::size_t Push(const float* const* in, float* const* out, std::size_t frames) noexcept;
    std::size_t PushLatency() const { return m_context.frameLength - 1; }

    Frame& GetFrame() { return *m_frame; }
    Context& GetContext() { return m_context; }
    const Context& GetContext() const { return m_context; }
    void SetJoint(bool joint) { m_context.joint = joint; }
    void SetGain(float gain) { m_context.gain = gain; }

private:
    Pool m_pool;
    std::unique_ptr<Frame> m_frame;
    std::unique_ptr<FFT> m_fft;
    Window m_window;
    std::vector<Buffer> m_in;
    std::vector<Buffer> m_out;
    std::vector<Buffer> m_pushOut;  // Push: emitted output in emission order
    std::vector<Plugin*> m_pipeline;
    Context m_context;
    double m_lastCentre = 0.0;
    std::int64_t m_pushNextStart = 0;
    float m_inputLimit = 0.0f;
    bool m_configured = false;
};

}  // namespace ora::fft
