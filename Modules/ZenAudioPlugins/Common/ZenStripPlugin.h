// Base of the plug-ins that are a strip of switchable stages ("Dialogue
// Processor", "Vocal Channel"). A subclass declares its tables, builds its
// stages (AddStage, in processing order) and the lines from its controls to
// their parameters (AddControl), sets what the controls do not
// (ConfigureStages) and publishes its stages' meters; the base does the
// rest: it prepares and resets the stages' algorithms, reads every smoothed
// parameter once per block, runs the strip on its control grid, applies
// the output level and publishes each channel's input and output peak.
// Mono or stereo as the descriptor allows; no latency.
#pragma once

#include <cstdint>
#include <vector>

#include "Algorithms/ChannelStrip.h"
#include "Algorithms/StripStage.h"
#include "ControlMap.h"
#include "SmoothedRamp.h"
#include "ZenAudioPluginImpl.h"

class ZenStripPlugin : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    // The parameter that sets the output level (smoothed, single, to a
    // linear gain) and the per-channel meter rows of input and output peak.
    struct Layout {
        std::uint32_t outputGain;
        std::uint32_t inputPeakMeter;
        std::uint32_t outputPeakMeter;
    };
    static constexpr std::uint32_t kAlwaysOn = UINT32_MAX;

protected:
    ZenStripPlugin() = default;

    // After InitParameters and InitMeters, before AddStage and AddControl.
    void InitStrip(const Layout& layout);
    // The next stage, switched by a smoothed parameter or kAlwaysOn.
    void AddStage(zen::StripStage& stage, std::uint32_t switchParameter);
    void AddControl(const zen::ControlMap::Link& link) { m_controls.Add(link); }

    // The stages' algorithms are prepared at their defaults; set here what
    // the controls do not.
    virtual void ConfigureStages() = 0;
    // After each block, the stages' own meters.
    virtual void PublishStageMeters() noexcept = 0;

    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept final;
    void ResetProcessing() override;

private:
    Layout m_layout{};
    std::vector<zen::StripStage*> m_stages;
    std::vector<std::uint32_t> m_smoothed;   // parameters read through ramps
    std::vector<zen::SmoothedRamp> m_ramps;  // one per parameter
    zen::SmoothedRamp m_alwaysOn;
    zen::ChannelStrip m_strip;
    zen::ControlMap m_controls;
};
