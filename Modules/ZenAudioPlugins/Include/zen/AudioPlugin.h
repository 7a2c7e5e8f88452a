// The audio interface of an audio plug-in instance.
//
// Calling order:
//   1. ConfigureChannels(inputs, outputs)      optional; UI thread
//   2. Prepare(sampleRate, maxBlockSize)       UI thread, not while processing
//   3. SetParameter / LoadState / SetBypass    any time, any thread (state: UI thread)
//   4. Process(channels, frames)               audio thread, once per block
//   5. GetLatency / GetMeter                   any time, any thread
// Repeat 2 (and 1) after a change of rate, block size or layout; destroy the
// instance through zen::PluginInstance.
//
// Real-time promises: Process never allocates, locks, blocks, logs or throws.
// SetParameter, GetParameter, SetBypass, GetLatency and GetMeter are lock-free.
#pragma once

#include <cstdint>

#include "ParameterInfo.h"
#include "PluginParameters.h"

class AudioPlugin : public zen::PluginParameters {
public:
    static constexpr const char* kInterfaceName = "AudioPlugin";

    // Accepts or refuses a channel layout. The descriptor's channel limits
    // bound it; most plug-ins need as many outputs as inputs. Before the first
    // call the layout is min(2, limit) in and out. After a change of layout on
    // a prepared instance, the instance prepares itself again. UI thread, not
    // while processing.
    virtual bool ConfigureChannels(std::uint32_t inputs, std::uint32_t outputs) = 0;
    virtual std::uint32_t GetInputChannelCount() const = 0;
    virtual std::uint32_t GetOutputChannelCount() const = 0;

    // Prepares for a sample rate (8000 to 384000 Hz) and the largest block
    // the host will pass (1 to 1048576 frames). Allocates. Resets all signal
    // state; parameters keep their values. False for values out of range.
    virtual bool Prepare(float sampleRate, std::uint32_t maxBlockSize) = 0;

    // Processes one block in place: channels[c][i] for c below
    // max(inputs, outputs) and i below frames. Any frame count works; blocks
    // longer than the prepared maximum are split internally. Returns false,
    // leaving the buffers untouched, when the instance is not prepared.
    // Audio thread.
    virtual bool Process(float* const* channels, std::uint64_t frames) noexcept = 0;

    // Clears all signal state (delays, envelopes, tails) without touching
    // parameters. Not while processing.
    virtual void Reset() = 0;

    // Delay of the output against the input, in samples, at the prepared rate.
    // Bypass does not change it.
    virtual std::uint32_t GetLatency() const = 0;

    // While bypassed the input passes unchanged, delayed by the latency, with
    // a short cross-fade at each switch. Any thread.
    virtual void SetBypass(bool bypassed) = 0;
    virtual bool IsBypassed() const = 0;

    // Meters of the last processed block; the count may change with the
    // channel layout. Any thread; GetMeterInfo allocates.
    virtual std::uint32_t GetMeterCount() const = 0;
    virtual bool GetMeterInfo(std::uint32_t index, zen::MeterInfo& info) const = 0;
    virtual float GetMeter(std::uint32_t index) const = 0;

protected:
    ~AudioPlugin() = default;  // destroyed through zen::PluginInstance
};
