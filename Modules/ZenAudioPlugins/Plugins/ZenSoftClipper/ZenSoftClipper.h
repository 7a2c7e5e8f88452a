// "Soft Clipper": drives the signal into a knee and rounds off everything
// above it with a tanh curve; "Shape" blends that curve with a hard clip at
// the knee. Every sample of every channel is processed directly, each
// parameter carried by a smoothed value per channel.
#pragma once

#include <array>
#include <atomic>

#include "Common/SmoothedValueGroup.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenSoftClipper : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kThreshold, kShape, kOutputGain };

    // Meters: 0 the clipping level, then input and output peak per channel.
    static constexpr std::uint32_t kClipMeter = 0;
    static constexpr std::uint32_t InputPeakMeter(std::uint32_t channel) { return 1 + 2 * channel; }
    static constexpr std::uint32_t OutputPeakMeter(std::uint32_t channel) { return 2 + 2 * channel; }

    ZenSoftClipper();

    static const zen::ParameterTableDefinition& Definitions();

    // The curve for one driven sample with knee k and shape s; k > 0.
    static float Clip(float x, float k, float s) noexcept;

    std::uint32_t GetMeterCount() const override;
    bool GetMeterInfo(std::uint32_t index, zen::MeterInfo& info) const override;
    float GetMeter(std::uint32_t index) const override;

protected:
    bool OnParameterChanged(std::uint32_t index, float value) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    zen::SmoothedValueGroup m_threshold{kMaxChannels, 1.0f};   // linear knee/drive t
    zen::SmoothedValueGroup m_shape{kMaxChannels, 1.0f};       // s
    zen::SmoothedValueGroup m_outputGain{kMaxChannels, 1.0f};  // linear g

    // Linear peaks of the last block.
    std::array<std::atomic<float>, kMaxChannels> m_inputPeak{};
    std::array<std::atomic<float>, kMaxChannels> m_outputPeak{};
    std::atomic<float> m_clipLevel{0.0f};  // largest driven magnitude that reached the knee
};
