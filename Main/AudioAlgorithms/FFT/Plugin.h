// A frame plug-in: one step of the FFT engine's pipeline. It creates the
// frame variables it writes when the pipeline is configured (allocation
// happens there) and works on them for every frame without allocating.
#pragma once

#include "FFT/Context.h"
#include "FFT/Frame.h"

namespace ora::fft {

namespace plugin {
// INPUT plug-ins fill the frame from the input history; an OUTPUT plug-in
// ends the pipeline by adding the frame into the output.
enum traits { PROCESS = 0, INPUT = 1, OUTPUT = 2 };
}  // namespace plugin

class Plugin {
public:
    struct Config {
        plugin::traits m_traits = plugin::PROCESS;
    };

    explicit Plugin(plugin::traits traits) { config.m_traits = traits; }
    virtual ~Plugin() = default;
    Plugin(const Plugin&) = delete;
    Plugin& operator=(const Plugin&) = delete;

    virtual const char* Name() const = 0;
    // Creates this plug-in's variables (or finds those it reads) and sizes
    // its state. False refuses the pipeline.
    virtual bool Configure(Frame& frame, const Context& context) = 0;
    // Clears state carried from frame to frame.
    virtual void Reset() noexcept {}
    virtual void Process(Frame& frame, Context& context) noexcept = 0;

    Config config;
};

}  // namespace ora::fft
