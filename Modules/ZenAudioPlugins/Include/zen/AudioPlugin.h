// The audio interface of an audio plug-in instance.
//
// Calling order:
//   1. ConfigureChannels(inputs, outputs)      optional; UI thread
//   2. Prepare(sampleRate, maxBlockSize)       UI thread, not while processing
//   3. SetParameter / LoadState / SetBypass    any time, any thread (state: UI thread)
//   4. Process(channels, frames)               audio thread, once per block
//   5. GetLatency / GetMeter / ReadMeterArray  any time, any thread (see each)
// Repeat 2 (and 1) after a change of rate, block size or layout; destroy the
// instance through zen::PluginInstance.
//
// Real-time promises: Process never allocates, locks, blocks, logs or throws
// (a plug-in whose design needs a lock says so through LocksAudioPath).
// SetParameter, GetParameter, SetBypass, GetLatency, the meter reads and the
// design queries (GetTailLength, IsBlockBased, LocksAudioPath) are lock-free.
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

    // Samples the output may go on sounding after the input falls silent,
    // counted after the latency (a reverb's decay, an echo's repeats): once
    // latency + tail samples of silence have gone in, the output stays below
    // -100 dBFS. 0 when silence in gives silence out. At the prepared rate and
    // the current settings. Any thread.
    virtual std::uint32_t GetTailLength() const = 0;

    // True when the output depends on how the input is split into Process
    // calls, because the design works in blocks of its own (an FFT frame, a
    // resampled engine) at the prepared rate. Otherwise any split of the same
    // signal gives the same output. Any thread.
    virtual bool IsBlockBased() const = 0;

    // True when the design takes a lock on the audio path (a shared lock that
    // guards an engine while it is rebuilt), so Process may wait briefly for
    // another thread. Any thread.
    virtual bool LocksAudioPath() const = 0;

    // Sets the parameters to a setting that passes a signal at -6 dBFS
    // unchanged but for the latency (no gain, a dry mix, no shift), so that a
    // host can measure the delay with an impulse. False, changing nothing,
    // when the plug-in has no such setting. UI thread.
    virtual bool ApplyNeutralSetting() = 0;

    // While bypassed the input passes unchanged, delayed by the latency, with
    // a short cross-fade at each switch. Any thread.
    virtual void SetBypass(bool bypassed) = 0;
    virtual bool IsBypassed() const = 0;

    // Meters, described and read by index; per-channel meters make the
    // count follow the channel layout. Level and value meters hold their
    // reading of the last processed block (GetMeter), arrays their last
    // publication; Prepare and Reset return readings to rest (silence, no
    // gain change, zeros) and Prepare empties rings. GetMeterCount and
    // GetMeter: any thread, lock-free. GetMeterInfo: any thread; allocates.
    virtual std::uint32_t GetMeterCount() const = 0;
    virtual bool GetMeterInfo(std::uint32_t index, zen::MeterInfo& info) const = 0;
    // Level meters in dB, value meters as published; 0 for arrays, rings and
    // an index out of range.
    virtual float GetMeter(std::uint32_t index) const = 0;

    // Copies an array meter's last publication, whole and consistent, into
    // `values` (info.size floats). False when the meter is not an array,
    // `count` is below its size, the instance is not prepared, or the audio
    // thread published throughout several attempts. Any thread but not
    // during Prepare or ConfigureChannels; lock-free, never waits for the
    // audio thread.
    virtual bool ReadMeterArray(std::uint32_t index, float* values, std::uint32_t count) const = 0;

    // Drains a ring meter: copies up to maxRecords records (info.size floats
    // each) written since `cursor` into `records` and advances `cursor`, a
    // position the reader owns (start at 0). The audio thread never waits for
    // readers: records overwritten before a slow reader got to them are
    // skipped and counted in `lost`. A cursor beyond what was written (after
    // Prepare emptied the ring) starts again from 0. Any thread but not
    // during Prepare or ConfigureChannels; lock-free.
    virtual zen::MeterRingRead ReadMeterRing(std::uint32_t index, std::uint64_t& cursor, float* records,
                                             std::uint32_t maxRecords) const = 0;

protected:
    ~AudioPlugin() = default;  // destroyed through zen::PluginInstance
};
