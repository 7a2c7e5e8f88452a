#include "ZenAudioPluginImpl.h"

#include <QJsonObject>
#include <algorithm>
#include <cmath>
#include <cstring>

#include "GlobalSmoothing.h"
#include "OnePoleSmoother.h"
#include "Editor/InstanceEditorLink.h"
#include "Editor/ZenEditor.h"
#include "StateText.h"
#include "ScopedDenormalFlush.h"

ZenAudioPluginImpl::ZenAudioPluginImpl() = default;

ZenAudioPluginImpl::~ZenAudioPluginImpl() { LeaveProcessing(); }

void ZenAudioPluginImpl::AttachToHost(const zen::PluginDescriptor* descriptor, void* hostContext,
                                      zen::HostServices* hostServices) {
    m_descriptor = descriptor;
    m_hostContext = hostContext;
    m_host = zen::HostServicesClient(hostServices);
    m_hostChannelIndex = m_host.ChannelIndex(m_hostChannelIndex);
    m_hostSessionId = m_host.SessionId(m_hostSessionId);
    m_inputs = std::min(2u, descriptor->inputChannelLimit);
    m_outputs = std::min(2u, descriptor->outputChannelLimit);
}

bool ZenAudioPluginImpl::CallHostAction(const char* action, const std::vector<std::string>& arguments,
                                        std::string* result) const {
    return m_host.CallAction(action, arguments, result);
}

const char* ZenAudioPluginImpl::GetName() const { return m_descriptor != nullptr ? m_descriptor->name : ""; }

void* ZenAudioPluginImpl::QueryInterface(const char* interfaceName) {
    if (interfaceName == nullptr) return nullptr;
    if (std::strcmp(interfaceName, zen::PluginInstance::kInterfaceName) == 0) return static_cast<zen::PluginInstance*>(this);
    if (std::strcmp(interfaceName, AudioPlugin::kInterfaceName) == 0) return static_cast<AudioPlugin*>(this);
    if (std::strcmp(interfaceName, ZenControlValueHost::kInterfaceName) == 0)
        return static_cast<ZenControlValueHost*>(this);
    return QObject::qt_metacast(interfaceName);
}

void ZenAudioPluginImpl::InitParameters(const zen::ParameterTableDefinition& definitions) {
    m_parameters.Build(definitions);
    m_pending.Resize(m_parameters.GetCount());
    m_smoothed.clear();
    m_smoothed.resize(m_parameters.GetCount());
    for (std::uint32_t i = 0; i < m_parameters.GetCount(); ++i) {
        const zen::ParameterDefinition& d = m_parameters[i].Definition();
        if (!d.IsSmoothed()) continue;
        m_smoothed[i] = std::make_unique<zen::SmoothedValueGroup>(d.smoothedPerChannel ? kMaxChannels : 1,
                                                                  d.smoothing(d.defaultValue));
        // Ramps only while this instance processes.
        m_smoothed[i]->SetRampingFlag(&m_processing);
    }
}

void ZenAudioPluginImpl::InitMeters(const zen::MeterTableDefinition& definitions) {
    m_meters.Build(definitions, kMaxChannels);
}

bool ZenAudioPluginImpl::GetParameterInfo(std::uint32_t index, zen::ParameterInfo& info) const {
    if (!m_parameters.Contains(index)) return false;
    info = m_parameters[index].Definition().ToInfo();
    return true;
}

bool ZenAudioPluginImpl::SetParameter(std::uint32_t index, float value) {
    if (!m_parameters.Contains(index) || std::isnan(value)) return false;
    OnParameterChanged(index, m_parameters[index].Definition().Constrain(value));
    return true;
}

float ZenAudioPluginImpl::GetParameter(std::uint32_t index) const {
    return m_parameters.Contains(index) ? m_parameters[index].GetValue() : 0.0f;
}

void ZenAudioPluginImpl::OnParameterChanged(std::uint32_t index, float value) {
    m_parameters.Store(index, value);
    const zen::ParameterDefinition& d = m_parameters[index].Definition();
    if (d.IsSmoothed())
        m_smoothed[index]->SetTarget(d.smoothing(value));
    else
        m_pending.Mark(index);
}

void ZenAudioPluginImpl::UpdateProcessingParameter(std::uint32_t, float) {}

void ZenAudioPluginImpl::ApplyPendingParameters() noexcept {
    m_pending.TakeAll(
        [this](std::uint32_t index) { UpdateProcessingParameter(index, m_parameters[index].GetValue()); });
}

std::string ZenAudioPluginImpl::SaveState() const {
    QJsonObject extra;
    extra.insert(QStringLiteral("bypass"), IsBypassed());
    SaveStateFields(extra);
    return zen::StateText::Save(m_descriptor->className, m_parameters, extra);
}

bool ZenAudioPluginImpl::LoadState(const std::string& state) {
    zen::StateText::Contents contents;
    if (!zen::StateText::Parse(state, m_descriptor->className, m_parameters, contents) ||
        !LoadStateFields(contents.root))
        return false;
    for (const auto& [index, value] : contents.values) SetParameter(index, value);
    const QJsonValue bypass = contents.root.value(QStringLiteral("bypass"));
    if (bypass.isBool()) SetBypass(bypass.toBool());
    m_parameters.MarkLoaded();
    return true;
}

void ZenAudioPluginImpl::SaveStateFields(QJsonObject&) const {}

bool ZenAudioPluginImpl::LoadStateFields(const QJsonObject&) { return true; }

std::vector<std::string> ZenAudioPluginImpl::GetPresetNames() const {
    return zen::StateText::PresetNames(m_descriptor->className);
}

bool ZenAudioPluginImpl::LoadPreset(const std::string& name) {
    std::string text;
    return zen::StateText::ReadPreset(m_descriptor->className, name, text) && LoadState(text);
}

void* ZenAudioPluginImpl::CreateEditor(void* parentWidget) {
    return static_cast<QWidget*>(ZenEditor::Create(m_descriptor->className, QString::fromUtf8(GetName()), std::make_unique<InstanceEditorLink>(*this),
                             static_cast<QWidget*>(parentWidget)));
}

void* ZenAudioPluginImpl::CreateEditorFor(zen::EditorLink& link, void* parentWidget) {
    return static_cast<QWidget*>(ZenEditor::Create(m_descriptor->className, QString::fromUtf8(GetName()), link, static_cast<QWidget*>(parentWidget)));
}

bool ZenAudioPluginImpl::ApplyNeutralSetting() {
    for (std::uint32_t i = 0; i < m_parameters.GetCount(); ++i)
        SetParameter(i, m_parameters[i].Definition().defaultValue);
    return true;
}

bool ZenAudioPluginImpl::GetMeterInfo(std::uint32_t index, zen::MeterInfo& info) const {
    return m_meters.GetInfo(index, GetProcessChannelCount(), info);
}

float ZenAudioPluginImpl::GetMeter(std::uint32_t index) const { return m_meters.Read(index, GetProcessChannelCount()); }

bool ZenAudioPluginImpl::ReadMeterArray(std::uint32_t index, float* values, std::uint32_t count) const {
    return m_meters.ReadArray(index, GetProcessChannelCount(), values, count);
}

zen::MeterRingRead ZenAudioPluginImpl::ReadMeterRing(std::uint32_t index, std::uint64_t& cursor, float* records,
                                                     std::uint32_t maxRecords) const {
    return m_meters.ReadRing(index, GetProcessChannelCount(), cursor, records, maxRecords);
}

std::int32_t ZenAudioPluginImpl::FindParameter(const char* identifierOrLabel) const {
    return identifierOrLabel != nullptr ? m_parameters.Find(QString::fromUtf8(identifierOrLabel)) : -1;
}

float ZenAudioPluginImpl::GetParameterPosition(std::uint32_t index) const {
    return m_parameters.Contains(index) ? m_parameters[index].GetPosition() : 0.0f;
}

bool ZenAudioPluginImpl::SetParameterPosition(std::uint32_t index, float position) {
    if (!m_parameters.Contains(index) || std::isnan(position)) return false;
    return SetParameter(index, m_parameters[index].PositionToValue(position));
}

bool ZenAudioPluginImpl::AcceptsChannelConfiguration(std::uint32_t inputs, std::uint32_t outputs) const {
    if (m_descriptor->inputChannelLimit == 0) return inputs == 0 && outputs >= 1;
    return inputs >= 1 && inputs == outputs;
}

bool ZenAudioPluginImpl::ConfigureChannels(std::uint32_t inputs, std::uint32_t outputs) {
    if (inputs > m_descriptor->inputChannelLimit || outputs > m_descriptor->outputChannelLimit) return false;
    if (std::max(inputs, outputs) > kMaxChannels || !AcceptsChannelConfiguration(inputs, outputs)) return false;
    if (inputs == m_inputs && outputs == m_outputs) return true;
    m_inputs = inputs;
    m_outputs = outputs;
    if (IsPrepared()) return Prepare(static_cast<float>(m_sampleRate), static_cast<std::uint32_t>(m_blockSize));
    return true;
}

void ZenAudioPluginImpl::PrepareProcessing(float, std::uint32_t) {}

bool ZenAudioPluginImpl::Prepare(float sampleRate, std::uint32_t maxBlockSize) {
    if (!(sampleRate >= kMinSampleRate && sampleRate <= kMaxSampleRate)) return false;
    if (maxBlockSize < 1 || maxBlockSize > kMaxBlockSize) return false;
    m_prepared.store(false, std::memory_order_release);
    LeaveProcessing();
    m_sampleRate = static_cast<int>(sampleRate);
    m_blockSize = static_cast<int>(maxBlockSize);
    zen::OnePoleSmoother::RefreshAll(sampleRate);
    m_parameters.RefreshPositions();
    try {
        const std::uint32_t channels = GetProcessChannelCount();
        m_meters.Allocate(channels);
        PrepareProcessing(sampleRate, maxBlockSize);
        m_bypassDelay.Dimension(channels, maxBlockSize, GetLatency());
        m_dry.assign(static_cast<std::size_t>(channels) * maxBlockSize, 0.0f);
    } catch (...) {  // allocation failures never reach the host
        return false;
    }
    m_bypassFadeStep = static_cast<float>(1.0 / std::max(1.0, kBypassFadeSeconds * sampleRate));
    m_bypassMix = IsBypassed() ? 1.0f : 0.0f;
    // Every stepped parameter is applied again to the freshly prepared algorithms.
    for (std::uint32_t i = 0; i < m_parameters.GetCount(); ++i)
        if (!m_parameters[i].Definition().IsSmoothed()) m_pending.Mark(i);
    m_prepared.store(true, std::memory_order_release);
    return true;
}

void ZenAudioPluginImpl::ResetSignalState() noexcept {
    ResetProcessing();
    m_meters.Rest();
}

void ZenAudioPluginImpl::Reset() {
    ResetSignalState();
    m_bypassDelay.Reset();
    m_bypassMix = IsBypassed() ? 1.0f : 0.0f;
}

void ZenAudioPluginImpl::LeaveProcessing() {
    if (m_processing.exchange(false)) zen::GlobalSmoothing::LeaveProcessing();
}

bool ZenAudioPluginImpl::Process(float* const* channels, std::uint64_t frames) noexcept {
    if (!IsPrepared() || channels == nullptr) return false;
    if (frames == 0) return true;
    zen::ScopedDenormalFlush flushDenormals;
    if (!m_processing.load(std::memory_order_relaxed)) {
        m_processing.store(true, std::memory_order_release);
        zen::GlobalSmoothing::EnterProcessing();
    }
    ApplyPendingParameters();
    for (std::uint32_t c = 0; c < m_inputs; ++c) {
        if (m_countNonFinite)
            for (std::uint64_t i = 0; i < frames; ++i) m_nonFiniteInput += std::isfinite(channels[c][i]) ? 0 : 1;
        m_vec.Sanitize(channels[c], kInputLimit, channels[c], frames);
    }

    const std::uint32_t channelCount = GetProcessChannelCount();
    const auto maxChunk = static_cast<std::uint64_t>(m_blockSize);
    float* chunk[kMaxChannels];
    for (std::uint64_t done = 0; done < frames;) {
        const auto length = static_cast<std::uint32_t>(std::min(frames - done, maxChunk));
        for (std::uint32_t c = 0; c < channelCount; ++c) chunk[c] = channels[c] + done;
        ProcessChunk(chunk, channelCount, length);
        done += length;
    }
    return true;
}

void ZenAudioPluginImpl::ProcessChunk(float* const* io, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    const float target = IsBypassed() ? 1.0f : 0.0f;
    const bool settled = m_bypassMix == target;
    m_dryFilled = !(settled && target == 0.0f && m_bypassDelay.GetDelay() == 0);
    if (!m_dryFilled) {
        ProcessBlock(io, channelCount, frames);
        return;
    }

    // The dry path runs on every block, so a switch finds it already filled.
    const std::size_t stride = static_cast<std::size_t>(m_blockSize);
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        float* dry = m_dry.data() + c * stride;
        std::copy(io[c], io[c] + frames, dry);
        m_bypassDelay.ProcessChannel(c, dry, frames);
    }
    if (settled && target == 1.0f) {
        for (std::uint32_t c = 0; c < channelCount; ++c) std::copy_n(m_dry.data() + c * stride, frames, io[c]);
        return;
    }
    ProcessBlock(io, channelCount, frames);
    if (settled) return;

    const float step = target > m_bypassMix ? m_bypassFadeStep : -m_bypassFadeStep;
    float mix = m_bypassMix;
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        const float* dry = m_dry.data() + c * stride;
        mix = m_bypassMix;
        for (std::uint32_t i = 0; i < frames; ++i) {
            mix = std::min(std::max(mix + step, 0.0f), 1.0f);
            io[c][i] += (dry[i] - io[c][i]) * mix;
        }
    }
    m_bypassMix = mix;
    // Fully bypassed: drop state that would sound stale when switched back.
    if (m_bypassMix == 1.0f) ResetSignalState();
}

