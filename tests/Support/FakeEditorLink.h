// An editor link over plain tables, for tests of the editor's pieces: the
// parameters and meters a test describes, with values it sets, and a count
// of the edit gestures the editor opened and closed.
#pragma once

#include <algorithm>
#include <vector>

#include "zen/EditorLink.h"

namespace zentest {

class FakeEditorLink : public zen::EditorLink {
public:
    std::vector<zen::ParameterInfo> parameters;
    std::vector<float> values;
    std::vector<zen::MeterInfo> meters;
    std::vector<float> meterValues;
    int openGestures = 0;
    int gestures = 0;

    std::uint32_t Add(zen::ParameterInfo info) {
        values.push_back(info.defaultValue);
        parameters.push_back(std::move(info));
        return static_cast<std::uint32_t>(parameters.size() - 1);
    }
    std::uint32_t AddMeter(zen::MeterInfo info) {
        meterValues.push_back(info.minimum);
        meters.push_back(std::move(info));
        return static_cast<std::uint32_t>(meters.size() - 1);
    }

    std::uint32_t GetParameterCount() const override { return static_cast<std::uint32_t>(parameters.size()); }
    bool GetParameterInfo(std::uint32_t index, zen::ParameterInfo& info) const override {
        if (index >= parameters.size()) return false;
        info = parameters[index];
        return true;
    }
    float GetParameter(std::uint32_t index) const override { return index < values.size() ? values[index] : 0.0f; }
    bool SetParameter(std::uint32_t index, float value) override {
        if (index >= values.size()) return false;
        values[index] = std::clamp(value, parameters[index].minimum, parameters[index].maximum);
        return true;
    }
    void BeginEdit(std::uint32_t) override { ++openGestures; }
    void EndEdit(std::uint32_t) override {
        --openGestures;
        ++gestures;
    }

    std::uint32_t GetMeterCount() const override { return static_cast<std::uint32_t>(meters.size()); }
    bool GetMeterInfo(std::uint32_t index, zen::MeterInfo& info) const override {
        if (index >= meters.size()) return false;
        info = meters[index];
        return true;
    }
    float GetMeter(std::uint32_t index) const override { return index < meterValues.size() ? meterValues[index] : 0.0f; }

    float GetSampleRate() const override { return 48000.0f; }
    std::uint32_t GetInputChannelCount() const override { return 2; }
    std::uint32_t GetOutputChannelCount() const override { return 2; }
    std::uint32_t GetLatency() const override { return 0; }
    bool IsBypassed() const override { return bypassed; }
    void SetBypass(bool on) override { bypassed = on; }
    std::vector<std::string> GetPresetNames() const override { return {}; }
    bool LoadPreset(const std::string&) override { return false; }

    bool bypassed = false;
};

}  // namespace zentest
