#include "Instance.h"

#include <lv2/atom/atom.h>
#include <lv2/buf-size/buf-size.h>
#include <lv2/options/options.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <limits>
#include <mutex>

namespace zenlv2 {

namespace {

const void* FindFeature(const LV2_Feature* const* features, const char* uri) {
    for (; features != nullptr && *features != nullptr; ++features)
        if (std::strcmp((*features)->URI, uri) == 0) return (*features)->data;
    return nullptr;
}

}  // namespace

std::unique_ptr<Instance> Instance::Create(Library& library, const Variant& variant, double sampleRate,
                                           const LV2_Feature* const* features) {
    if (!library.IsLoaded()) return nullptr;
    // The library hands the services set on its interface to each instance
    // it creates; hosts may instantiate from several threads at once.
    static std::mutex creating;
    std::lock_guard<std::mutex> lock(creating);
    auto studio = std::make_unique<zen::host::StudioModel>(library.Interface());
    const std::uint32_t source = variant.inputs == 0 ? variant.outputs : variant.inputs;
    studio->AddChannel(variant.name, variant.outputs, source);
    studio->InsertPlugin(kChannel, variant.key);  // throws when the layout is refused
    PortMap ports(studio->PluginAt(kChannel, kSlot), variant.inputs, variant.outputs);
    std::unique_ptr<Instance> self(new Instance(std::move(studio), std::move(ports), static_cast<float>(sampleRate)));
    self->ReadFeatures(features);
    self->m_studio->Prepare(sampleRate, self->m_maxBlock);
    return self;
}

Instance::Instance(std::unique_ptr<zen::host::StudioModel> studio, PortMap ports, float sampleRate)
    : m_studio(std::move(studio)),
      m_audio(m_studio->PluginAt(kChannel, kSlot)),
      m_ports(std::move(ports)),
      m_sampleRate(sampleRate),
      m_inputs(m_ports.Inputs(), nullptr),
      m_outputs(m_ports.Outputs(), nullptr),
      m_chunk(m_ports.Outputs(), nullptr),
      m_scratch(static_cast<std::size_t>(m_ports.Inputs()) * kScratchFrames),
      m_parameterPorts(m_ports.ParameterCount(), nullptr),
      m_sent(m_ports.ParameterCount(), std::numeric_limits<float>::quiet_NaN()),
      m_meterPorts(m_audio.GetMeterCount(), nullptr) {}

void Instance::ReadFeatures(const LV2_Feature* const* features) {
    const auto* map = static_cast<const LV2_URID_Map*>(FindFeature(features, LV2_URID__map));
    if (map == nullptr) return;  // no state text and no block-length options
    m_stateKey = map->map(map->handle, kStateKey);
    m_atomString = map->map(map->handle, LV2_ATOM__String);
    const LV2_URID atomInt = map->map(map->handle, LV2_ATOM__Int);
    const LV2_URID maxBlock = map->map(map->handle, LV2_BUF_SIZE__maxBlockLength);
    const LV2_URID nominalBlock = map->map(map->handle, LV2_BUF_SIZE__nominalBlockLength);
    const auto* options = static_cast<const LV2_Options_Option*>(FindFeature(features, LV2_OPTIONS__options));
    std::int32_t nominal = 0, maximum = 0;
    for (; options != nullptr && options->key != 0; ++options) {
        if (options->type != atomInt || options->size != sizeof(std::int32_t) || options->value == nullptr) continue;
        const std::int32_t value = *static_cast<const std::int32_t*>(options->value);
        if (options->key == maxBlock) maximum = value;
        if (options->key == nominalBlock) nominal = value;
    }
    const std::int32_t stated = maximum > 0 ? maximum : nominal;
    if (stated > 0) m_maxBlock = std::min(static_cast<std::uint32_t>(stated), kMaxPreparedBlock);
}

void Instance::ConnectPort(std::uint32_t index, void* data) noexcept {
    const std::vector<Port>& ports = m_ports.Ports();
    if (index >= ports.size()) return;
    const Port& port = ports[index];
    switch (port.type) {
        case PortType::AudioInput: m_inputs[port.source] = static_cast<const float*>(data); break;
        case PortType::AudioOutput: m_outputs[port.source] = static_cast<float*>(data); break;
        case PortType::Enabled: m_enabled = static_cast<const float*>(data); break;
        case PortType::Latency: m_latency = static_cast<float*>(data); break;
        case PortType::Parameter: m_parameterPorts[port.source] = static_cast<const float*>(data); break;
        case PortType::Meter: m_meterPorts[port.source] = static_cast<float*>(data); break;
    }
}

void Instance::Activate() {
    SendControls();
    try {
        m_studio->RunBackgroundTasks(kChannel, false);
        m_studio->Prepare(m_sampleRate, m_maxBlock);
    } catch (const std::exception&) {  // it was prepared at this rate once; Run then does nothing
    }
}

void Instance::SendControls() noexcept {
    if (m_resend.exchange(false, std::memory_order_acq_rel)) {
        std::fill(m_sent.begin(), m_sent.end(), std::numeric_limits<float>::quiet_NaN());
        m_sentEnabled = std::numeric_limits<float>::quiet_NaN();
    }
    for (std::size_t p = 0; p < m_parameterPorts.size(); ++p) {
        const float* port = m_parameterPorts[p];
        if (port == nullptr || *port == m_sent[p]) continue;
        m_sent[p] = *port;
        m_audio.SetParameter(static_cast<std::uint32_t>(p), *port);
    }
    if (m_enabled != nullptr && *m_enabled != m_sentEnabled) {
        m_sentEnabled = *m_enabled;
        m_audio.SetBypass(m_sentEnabled < 0.5f);
    }
}

void Instance::Run(std::uint32_t frames) noexcept {
    SendControls();
    bool connected = true;
    bool aliased = false;
    for (std::size_t c = 0; c < m_outputs.size(); ++c) {
        connected = connected && m_outputs[c] != nullptr;
        for (std::size_t d = 0; d < m_inputs.size(); ++d) aliased = aliased || (c != d && m_outputs[c] == m_inputs[d]);
    }
    if (connected && frames > 0) {
        if (aliased) {
            ProcessAliased(frames);
        } else {
            // Inputs are copied into the outputs, which the library then
            // processes in place; a host that shares the buffers skips the copy.
            for (std::size_t c = 0; c < m_outputs.size(); ++c) {
                const float* in = c < m_inputs.size() ? m_inputs[c] : nullptr;
                if (in == nullptr) std::fill_n(m_outputs[c], frames, 0.0f);
                else if (in != m_outputs[c]) std::copy_n(in, frames, m_outputs[c]);
            }
            m_studio->Process(kChannel, m_outputs.data(), frames);
        }
    }
    PublishOutputs();
}

void Instance::ProcessAliased(std::uint32_t frames) noexcept {
    for (std::uint32_t done = 0; done < frames;) {
        const std::uint32_t length = std::min(frames - done, kScratchFrames);
        for (std::size_t c = 0; c < m_inputs.size(); ++c) {
            float* scratch = m_scratch.data() + c * kScratchFrames;
            if (m_inputs[c] == nullptr) std::fill_n(scratch, length, 0.0f);
            else std::copy_n(m_inputs[c] + done, length, scratch);
        }
        for (std::size_t c = 0; c < m_outputs.size(); ++c) {
            m_chunk[c] = m_outputs[c] + done;
            if (c < m_inputs.size()) std::copy_n(m_scratch.data() + c * kScratchFrames, length, m_chunk[c]);
            else std::fill_n(m_chunk[c], length, 0.0f);
        }
        m_studio->Process(kChannel, m_chunk.data(), length);
        done += length;
    }
}

void Instance::PublishOutputs() noexcept {
    if (m_latency != nullptr) *m_latency = static_cast<float>(m_studio->Latency(kChannel));
    for (std::size_t m = 0; m < m_meterPorts.size(); ++m)
        if (m_meterPorts[m] != nullptr) *m_meterPorts[m] = m_audio.GetMeter(static_cast<std::uint32_t>(m));
}

LV2_State_Status Instance::Save(LV2_State_Store_Function store, LV2_State_Handle handle) {
    if (m_stateKey == 0) return LV2_STATE_ERR_NO_FEATURE;
    const std::string text = m_audio.SaveState();
    return store(handle, m_stateKey, text.c_str(), text.size() + 1, m_atomString,
                 LV2_STATE_IS_POD | LV2_STATE_IS_PORTABLE);
}

LV2_State_Status Instance::Restore(LV2_State_Retrieve_Function retrieve, LV2_State_Handle handle) {
    if (m_stateKey == 0) return LV2_STATE_ERR_NO_FEATURE;
    std::size_t size = 0;
    std::uint32_t type = 0, flags = 0;
    const auto* text = static_cast<const char*>(retrieve(handle, m_stateKey, &size, &type, &flags));
    if (text == nullptr) return LV2_STATE_SUCCESS;  // saved by ports alone
    if (type != m_atomString) return LV2_STATE_ERR_BAD_TYPE;
    if (!m_audio.LoadState(std::string(text, strnlen(text, size)))) return LV2_STATE_ERR_UNKNOWN;
    m_resend.store(true, std::memory_order_release);
    try {
        m_studio->RunBackgroundTasks(kChannel, false);
    } catch (const std::exception&) {  // a target that cannot load leaves the chain as it was
    }
    return LV2_STATE_SUCCESS;
}

}  // namespace zenlv2
