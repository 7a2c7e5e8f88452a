// What an editor talks to. An instance of the library hands its editor a link
// to itself (CreateEditor); a host that keeps the running plug-in out of the
// UI's reach (an LV2 UI, a remote panel) supplies its own link over whatever
// carries values and meters to it (ports, messages) and builds the same
// editor with CreateEditorFor on an unprepared instance of the same key.
//
// Every call comes from the UI thread. A link never blocks on the audio
// thread: reads return the last value that reached it.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "ParameterInfo.h"

namespace zen {

class EditorLink {
public:
    virtual ~EditorLink() = default;

    // Parameters, as in PluginParameters. SetParameter clamps to the range.
    virtual std::uint32_t GetParameterCount() const = 0;
    virtual bool GetParameterInfo(std::uint32_t index, ParameterInfo& info) const = 0;
    virtual float GetParameter(std::uint32_t index) const = 0;
    virtual bool SetParameter(std::uint32_t index, float value) = 0;
    // A drag or a typed entry on one control: hosts that record automation
    // group the changes between the two calls into one gesture.
    virtual void BeginEdit(std::uint32_t /*index*/) {}
    virtual void EndEdit(std::uint32_t /*index*/) {}

    // Meters, as in AudioPlugin. A link that cannot carry arrays or rings
    // (LV2 control ports carry one number each) answers false and no
    // records; the displays that need them then show no data.
    virtual std::uint32_t GetMeterCount() const = 0;
    virtual bool GetMeterInfo(std::uint32_t index, MeterInfo& info) const = 0;
    virtual float GetMeter(std::uint32_t index) const = 0;
    virtual bool ReadMeterArray(std::uint32_t /*index*/, float* /*values*/, std::uint32_t /*count*/) const {
        return false;
    }
    virtual MeterRingRead ReadMeterRing(std::uint32_t /*index*/, std::uint64_t& /*cursor*/, float* /*records*/,
                                        std::uint32_t /*maxRecords*/) const {
        return {};
    }

    // The running plug-in's context: 0 channels and the default rate (48000)
    // before it is prepared.
    virtual float GetSampleRate() const = 0;
    virtual std::uint32_t GetInputChannelCount() const = 0;
    virtual std::uint32_t GetOutputChannelCount() const = 0;
    virtual std::uint32_t GetLatency() const = 0;
    virtual bool IsBypassed() const = 0;
    virtual void SetBypass(bool bypassed) = 0;
    // False for a control plug-in: no audio, so no bypass or latency to show.
    virtual bool HasAudio() const { return true; }

    // Factory presets; an empty list when the link cannot load them.
    virtual std::vector<std::string> GetPresetNames() const = 0;
    virtual bool LoadPreset(const std::string& name) = 0;
};

}  // namespace zen
