// Common base of every audio plug-in class. It carries the host interfaces,
// the host's context and services, the sample rate and block size, the
// parameter and meter tables, latency, bypass and the bookkeeping that moves
// parameter changes to the audio thread without locks.
//
// A plug-in class derives from it and supplies:
//   - a constructor that calls InitParameters (and InitMeters) with the
//     class's tables;
//   - UpdateProcessingParameter (audio thread, before the next block, and for
//     every stepped parameter after Prepare): keep the value in a member or
//     hand it to owned algorithms;
//   - PrepareProcessing: prepare owned algorithms, size buffers, SetLatency;
//   - ProcessBlock: the signal path, at most the prepared block size; reads
//     smoothed parameters through Smoothed(index).Track(channel) and
//     publishes meters;
//   - ResetProcessing.
// Parameter changes themselves are the base's: store, convert, SetTarget of
// a smoothed parameter or hand-over of a stepped one, and a count for the
// editors (ParameterWatcher). The class actually instantiated is
// ZenAudioPlugin<Class>.
#pragma once

#include <QJsonObject>
#include <QObject>
#include <atomic>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "HostServicesClient.h"
#include "MeterTable.h"
#include "ParameterTable.h"
#include "PendingBits.h"
#include "SmoothedValueGroup.h"
#include "Algorithms/Delay.h"
#include "Algorithms/Vec.h"
#include "zen/AudioPlugin.h"
#include "zen/PluginInstance.h"
#include "zen/ZenControlValueHost.h"

class ZenAudioPluginImpl : public QObject,
                           public zen::PluginInstance,
                           public AudioPlugin,
                           public ZenControlValueHost {
    Q_OBJECT

public:
    // The largest channel limit of any plug-in of the library.
    static constexpr std::uint32_t kMaxChannels = 32;
    static constexpr int kDefaultSampleRate = 48000;
    static constexpr int kDefaultBlockSize = 1024;
    static constexpr float kMinSampleRate = 8000.0f;
    static constexpr float kMaxSampleRate = 384000.0f;
    static constexpr std::uint32_t kMaxBlockSize = 1u << 20;
    // Length of the cross-fade when bypass is switched.
    static constexpr double kBypassFadeSeconds = 0.010;
    // Input samples are held within +-kInputLimit (+200 dBFS) and NaN and
    // infinities become 0 before any plug-in sees them: far beyond real audio,
    // and low enough that squares and sums inside every plug-in stay finite.
    static constexpr float kInputLimit = 1e10f;

    ~ZenAudioPluginImpl() override;

    // Called once by the factory, right after construction.
    void AttachToHost(const zen::PluginDescriptor* descriptor, void* hostContext, zen::HostServices* hostServices);
    void* GetHostContext() const { return m_hostContext; }
    zen::HostServices* GetHostServices() const { return m_host.Services(); }
    std::int64_t GetHostChannelIndex() const { return m_hostChannelIndex; }
    std::int64_t GetHostSessionId() const { return m_hostSessionId; }

    // Runs a host action ("LoadPlugin", "SetIntParameter", ...); false when
    // the host offers no actions or refuses this one. UI thread; allocates.
    bool CallHostAction(const char* action, const std::vector<std::string>& arguments = {},
                        std::string* result = nullptr) const;

    // zen::PluginInstance
    int GetKind() const override { return zen::kAudioPluginKind; }
    const zen::PluginDescriptor* GetDescriptor() const override { return m_descriptor; }
    const char* GetName() const override;
    void* QueryInterface(const char* interfaceName) override;

    // zen::PluginParameters
    std::uint32_t GetParameterCount() const override { return m_parameters.GetCount(); }
    bool GetParameterInfo(std::uint32_t index, zen::ParameterInfo& info) const override;
    bool SetParameter(std::uint32_t index, float value) override;
    float GetParameter(std::uint32_t index) const override;
    std::string SaveState() const override;
    bool LoadState(const std::string& state) override;
    std::vector<std::string> GetPresetNames() const override;
    bool LoadPreset(const std::string& name) override;
    void* CreateEditor(void* parentWidget) override;
    void* CreateEditorFor(zen::EditorLink& link, void* parentWidget) override;

    // AudioPlugin
    bool ConfigureChannels(std::uint32_t inputs, std::uint32_t outputs) override;
    std::uint32_t GetInputChannelCount() const override { return m_inputs; }
    std::uint32_t GetOutputChannelCount() const override { return m_outputs; }
    bool Prepare(float sampleRate, std::uint32_t maxBlockSize) override;
    bool Process(float* const* channels, std::uint64_t frames) noexcept override;
    void Reset() override;
    std::uint32_t GetLatency() const override { return m_latency.load(std::memory_order_acquire); }
    void SetBypass(bool bypassed) override { m_bypass.store(bypassed, std::memory_order_release); }
    bool IsBypassed() const override { return m_bypass.load(std::memory_order_acquire); }
    // Defaults for a plug-in that works sample by sample without a tail or a
    // lock, and whose default settings pass audio unchanged.
    std::uint32_t GetTailLength() const override { return 0; }
    bool IsBlockBased() const override { return false; }
    bool LocksAudioPath() const override { return false; }
    bool ApplyNeutralSetting() override;
    // Meters come from the class's meter table (InitMeters).
    std::uint32_t GetMeterCount() const final { return m_meters.GetCount(GetProcessChannelCount()); }
    bool GetMeterInfo(std::uint32_t index, zen::MeterInfo& info) const final;
    float GetMeter(std::uint32_t index) const final;
    bool ReadMeterArray(std::uint32_t index, float* values, std::uint32_t count) const final;
    zen::MeterRingRead ReadMeterRing(std::uint32_t index, std::uint64_t& cursor, float* records,
                                     std::uint32_t maxRecords) const final;

    // ZenControlValueHost
    std::int32_t FindParameter(const char* identifierOrLabel) const override;
    float GetParameterPosition(std::uint32_t index) const override;
    bool SetParameterPosition(std::uint32_t index, float position) override;

    int GetSampleRate() const { return m_sampleRate; }
    int GetBlockSize() const { return m_blockSize; }
    bool IsPrepared() const { return m_prepared.load(std::memory_order_acquire); }
    // Channels handed to ProcessBlock: max(inputs, outputs).
    std::uint32_t GetProcessChannelCount() const { return m_inputs > m_outputs ? m_inputs : m_outputs; }
    const zen::ParameterTable& Parameters() const { return m_parameters; }

    // Called once by the factory after AttachToHost (false: the instance is
    // not created) and once before destruction. For plug-ins that build
    // resources which outlive Prepare; the defaults do nothing.
    virtual bool InitializePlugin() { return true; }
    virtual void ShutdownPlugin() {}

protected:
    ZenAudioPluginImpl();

    // Builds the parameter records and a smoothed value group for every
    // smoothed parameter, at the working value of its default.
    void InitParameters(const zen::ParameterTableDefinition& definitions);
    // Builds the meters; a plug-in without a table has none.
    void InitMeters(const zen::MeterTableDefinition& definitions);

    // A stepped parameter's value, on the audio thread before the next block
    // after a change, and for every stepped parameter after each Prepare.
    // Smoothed parameters never come here.
    virtual void UpdateProcessingParameter(std::uint32_t index, float value);

    // The group of a smoothed parameter; ProcessBlock advances it with
    // Smoothed(index).Track(channel) (element 0 for SmoothedSingle).
    zen::SmoothedValueGroup& Smoothed(std::uint32_t index) noexcept { return *m_smoothed[index]; }

    // Publishing meters by row of the meter table (channel 0 for rows that
    // are not per channel): level meters take a linear magnitude, value
    // meters their value. Audio thread; never blocks or allocates.
    void PublishMeter(std::uint32_t row, std::uint32_t channel, float value) noexcept {
        m_meters.Publish(row, channel, value);
    }
    void PublishMeter(std::uint32_t row, float value) noexcept { m_meters.Publish(row, 0, value); }
    void PublishArray(std::uint32_t row, std::uint32_t channel, const float* values) noexcept {
        m_meters.PublishArray(row, channel, values);
    }
    void PushRing(std::uint32_t row, std::uint32_t channel, const float* record) noexcept {
        m_meters.PushRing(row, channel, record);
    }
    // Level and value meters and arrays at rest, as after Reset. Audio thread
    // or while not processing.
    void ResetMeters() noexcept { m_meters.Rest(); }

    // Inputs and outputs within the descriptor's limits reach this check.
    // Default: as many outputs as inputs, or outputs only for plug-ins
    // without audio input.
    virtual bool AcceptsChannelConfiguration(std::uint32_t inputs, std::uint32_t outputs) const;

    virtual void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize);
    virtual void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept = 0;
    virtual void ResetProcessing() {}

    // State fields of the plug-in's own beside the parameters and bypass
    // (UI thread). LoadStateFields sees the parsed state before any value
    // changes; false refuses the whole state.
    virtual void SaveStateFields(QJsonObject& root) const;
    virtual bool LoadStateFields(const QJsonObject& root);

    // For plug-ins that report bad input, which the input guard replaces
    // before they see it: from then on, NaN and infinities met on the inputs
    // are counted, a running total that only grows.
    void CountNonFiniteInput() { m_countNonFinite = true; }
    std::uint64_t NonFiniteInputSamples() const noexcept { return m_nonFiniteInput; }

    // Reports the latency; call from PrepareProcessing.
    void SetLatency(std::uint32_t samples) { m_latency.store(samples, std::memory_order_release); }

    // Inside ProcessBlock: the block's input delayed by the latency, what
    // bypass plays. For a plug-in that cannot process a block and must still
    // keep the stream's timing. Null when the latency is zero and bypass is
    // settled off: the block as it stands is that path then.
    const float* BypassPath(std::uint32_t channel) const noexcept {
        return m_dryFilled ? m_dry.data() + static_cast<std::size_t>(channel) * static_cast<std::size_t>(m_blockSize)
                           : nullptr;
    }

private:
    // SetParameter once index and value are checked: store (counted for the
    // editors), then SetTarget of the working value or the hand-over.
    void OnParameterChanged(std::uint32_t index, float value);
    void ApplyPendingParameters() noexcept;
    void ResetSignalState() noexcept;
    void ProcessChunk(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept;
    void LeaveProcessing();

    const zen::PluginDescriptor* m_descriptor = nullptr;
    void* m_hostContext = nullptr;
    zen::HostServicesClient m_host;
    std::int64_t m_hostChannelIndex = -1;
    std::int64_t m_hostSessionId = 0;

    int m_sampleRate = kDefaultSampleRate;
    int m_blockSize = kDefaultBlockSize;
    std::uint32_t m_inputs = 0;
    std::uint32_t m_outputs = 0;

    zen::ParameterTable m_parameters;
    zen::PendingBits m_pending;  // stepped parameters changed since the last block
    std::vector<std::unique_ptr<zen::SmoothedValueGroup>> m_smoothed;  // by parameter; null when stepped
    zen::MeterTable m_meters;

    std::atomic<bool> m_prepared{false};
    std::atomic<bool> m_processing{false};
    std::atomic<std::uint32_t> m_latency{0};

    // Bypass: the dry signal delayed by the latency, cross-faded on a switch.
    std::atomic<bool> m_bypass{false};
    float m_bypassMix = 0.0f;  // 0 processed .. 1 bypassed; audio thread
    float m_bypassFadeStep = 1.0f;
    zen::Delay m_bypassDelay;
    std::vector<float> m_dry;  // channel-major scratch, kMaxChannels x block size at most
    bool m_dryFilled = false;  // m_dry holds this block's delayed input; audio thread

    ora::numeric::Vec m_vec;
    bool m_countNonFinite = false;
    std::uint64_t m_nonFiniteInput = 0;  // audio thread
};

