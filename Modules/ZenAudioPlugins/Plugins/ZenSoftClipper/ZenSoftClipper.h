// "Soft Clipper": drives the signal into a knee and rounds off everything
// above it with a tanh curve; "Shape" blends that curve with a hard clip at
// the knee. Every sample of every channel is processed directly, each
// parameter carried by a smoothed value per channel.
#pragma once

#include "Common/ZenAudioPluginImpl.h"

class ZenSoftClipper : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kThreshold, kShape, kOutputGain };
    // Rows of the meter table: the block's largest driven magnitude that
    // reached the knee, and each channel's input and output peak.
    enum Meter : std::uint32_t { kClipping, kInputPeak, kOutputPeak };

    ZenSoftClipper();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    // The curve for one driven sample with knee k and shape s; k > 0.
    static float Clip(float x, float k, float s) noexcept;

protected:
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
};
