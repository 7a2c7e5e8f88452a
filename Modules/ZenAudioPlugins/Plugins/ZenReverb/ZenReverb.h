// "Reverb": a room reverb. The room (dimensions, decay, brightness, source
// distance, pre-delay) becomes 16 image-source reflections and a 15-line
// feedback network tuned to the room's modes; the dry, early and late parts
// are balanced by "Dry/Wet" along the distance law, with their own gains and
// tone controls. Mono to 8 channels, zero latency, at any rate (above
// 88.2 kHz the reflections and the tail run at half or a quarter of it).
//
// Parameters reach the engine's record on the audio thread; the engine's
// update steps then recompute only what the change touches, before the block.
//
// "Room Length", "Room Width" and "Room Height" are the room. "Room Size"
// and "Room Ratio" are stored for the host and for an editor that edits the
// floor linked (setting length and width); the engine never reads them.
#pragma once

#include <memory>

#include "Common/Reverb/zn_reverb.h"
#include "Common/Reverb/zn_reverb_u15.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenReverb : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t {
        kRoomHeight, kRoomLength, kRoomWidth, kRoomSize, kRoomRatio,
        kPreDelay, kT60, kDistance, kBrightness, kModulation,
        kEarlyLowFreq, kEarlyHighFreq, kEarlyLowGain, kEarlyHighGain,
        kLateLowFreq, kLateHighFreq, kLateLowGain, kLateHighGain,
        kDryWet, kDirectGain, kEarlyGain, kLateGain,
        kParameterCount
    };

    // The host's ranges of the room; the lines are sized for the largest.
    static constexpr float kMinRoomDimension = 1.0f;
    static constexpr float kMaxRoomLength = 100.0f;  // also the width
    static constexpr float kMaxRoomHeight = 30.0f;

    ZenReverb();
    ~ZenReverb() override;

    static const zen::ParameterTableDefinition& Definitions();
    // The engine's record entry that a parameter drives, and the value in the record's unit.
    static std::uint32_t RecordEntry(std::uint32_t parameter);
    static float ToRecord(std::uint32_t parameter, float value);

    // The decay to -100 dBFS, with headroom for full-scale input and the late boosts.
    std::uint32_t GetTailLength() const override;
    // Fully dry: the input passes unchanged.
    bool ApplyNeutralSetting() override;

    // For tests: the engine and the processing object of the current preparation.
    const zen::reverb::zn_reverb* Engine() const { return m_engine.get(); }
    const zen::reverb::zn_reverb_u15* Processor() const { return m_processor.get(); }

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    std::unique_ptr<zen::reverb::zn_reverb> m_engine;
    std::unique_ptr<zen::reverb::zn_reverb_u15> m_processor;
};
