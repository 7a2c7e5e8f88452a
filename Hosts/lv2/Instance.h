// One LV2 plug-in instance: a channel of the host core's studio model, in the
// variant's layout, driven through the ports of its PortMap. The plug-in is
// its first slot; one with background work (the "AI" rows) may load more
// after it: the plug-ins its template configures.
//
// Threads as LV2 defines them: Create, Activate and the state calls on the
// host's instantiation thread; ConnectPort and Run on the audio thread. Run
// neither allocates nor locks: changed control values go to SetParameter
// (atomic) and the enabled port to SetBypass. Background work, which may edit
// the chain, runs only in Activate and Restore, never beside Run: a template
// applies the controls it finds there.
#pragma once

#include <lv2/core/lv2.h>
#include <lv2/state/state.h>
#include <lv2/urid/urid.h>

#include <atomic>
#include <cstdint>
#include <memory>
#include <vector>

#include "Catalog.h"
#include "HostCore/Studio/StudioModel.h"
#include "Library.h"
#include "PortMap.h"

namespace zenlv2 {

class Instance {
public:
    // Largest block asked of the library when the host states none; longer
    // runs are split by the library itself.
    static constexpr std::uint32_t kDefaultMaxBlock = 4096;
    // Larger host blocks are split too rather than sizing every buffer of
    // the plug-in for them.
    static constexpr std::uint32_t kMaxPreparedBlock = 8192;
    // Length of the copies when a host hands one channel's input as another
    // channel's output buffer.
    static constexpr std::uint32_t kScratchFrames = 256;
    // Key of the plug-in's state text in a host's saved state.
    static constexpr const char* kStateKey = "urn:zenaudioplugins:state";

    // Null when the library is not loaded; throws HostError when the plug-in
    // cannot be created in the variant's layout or run at this rate.
    static std::unique_ptr<Instance> Create(Library& library, const Variant& variant, double sampleRate,
                                            const LV2_Feature* const* features);

    void ConnectPort(std::uint32_t index, void* data) noexcept;
    // Applies the connected controls, then prepares (clears all signal state),
    // so settings that fix the latency take effect before the first block.
    void Activate();
    void Run(std::uint32_t frames) noexcept;

    // The plug-in's state text, beside the port values the host keeps.
    LV2_State_Status Save(LV2_State_Store_Function store, LV2_State_Handle handle);
    LV2_State_Status Restore(LV2_State_Retrieve_Function retrieve, LV2_State_Handle handle);

private:
    static constexpr std::size_t kChannel = 0;
    static constexpr std::size_t kSlot = 0;

    Instance(std::unique_ptr<zen::host::StudioModel> studio, PortMap ports, float sampleRate);

    void ReadFeatures(const LV2_Feature* const* features);
    void SendControls() noexcept;
    void ProcessAliased(std::uint32_t frames) noexcept;
    void PublishOutputs() noexcept;

    std::unique_ptr<zen::host::StudioModel> m_studio;  // one channel
    AudioPlugin& m_audio;
    PortMap m_ports;
    float m_sampleRate;
    std::uint32_t m_maxBlock = kDefaultMaxBlock;

    std::vector<const float*> m_inputs;
    std::vector<float*> m_outputs;
    std::vector<float*> m_chunk;  // output pointers advanced through a run
    std::vector<float> m_scratch;
    std::vector<const float*> m_parameterPorts;
    std::vector<float> m_sent;  // last value handed to the plug-in, per parameter
    const float* m_enabled = nullptr;
    float m_sentEnabled = 1.0f;
    float* m_latency = nullptr;
    std::vector<float*> m_meterPorts;  // by meter index; null for arrays and rings
    // Set by Restore: every port value is sent again, so ports win over the
    // restored text for whatever they carry.
    std::atomic<bool> m_resend{false};

    LV2_URID m_stateKey = 0;
    LV2_URID m_atomString = 0;
};

}  // namespace zenlv2
