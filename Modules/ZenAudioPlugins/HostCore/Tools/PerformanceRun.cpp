#include "PerformanceRun.h"

#include <strings.h>
#include <time.h>

#include <algorithm>
#include <memory>

#include "HostCore/Devices/NullDevice.h"
#include "HostCore/HostError.h"

namespace zen::host {

namespace {

double ThreadCpuSeconds() {
    timespec t{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &t);
    return static_cast<double>(t.tv_sec) + static_cast<double>(t.tv_nsec) * 1e-9;
}

// Walks a second of noise block by block, so the input keeps changing, and
// processes it in place in the device's outputs.
class PluginLoad : public AudioCallback {
public:
    PluginLoad(AudioPlugin& audio, std::uint32_t channels, int sampleRate)
        : m_audio(audio), m_noise(channels, std::vector<float>(static_cast<std::size_t>(sampleRate))) {
        std::uint32_t seed = 12345;
        for (auto& channel : m_noise)
            for (float& v : channel) {
                seed = seed * 1664525u + 1013904223u;
                v = static_cast<float>(seed) / 2147483648.0f - 1.0f;
            }
    }

    void ProcessBlock(const float* const*, float* const* outputs, std::uint32_t frames) noexcept override {
        const std::size_t length = m_noise.front().size();
        if (m_position + frames > length) m_position = 0;
        for (std::size_t c = 0; c < m_noise.size(); ++c)
            std::copy_n(m_noise[c].begin() + static_cast<std::ptrdiff_t>(m_position), frames, outputs[c]);
        m_position += frames;
        m_audio.Process(outputs, frames);
    }

private:
    AudioPlugin& m_audio;
    std::vector<std::vector<float>> m_noise;
    std::size_t m_position = 0;
};

// The settings' channel count when the plug-in takes it, else the most it takes below.
std::uint32_t Configure(AudioPlugin& audio, const zen::PluginDescriptor& descriptor, std::uint32_t wanted) {
    const std::uint32_t limit = std::max(descriptor.inputChannelLimit, descriptor.outputChannelLimit);
    for (std::uint32_t n = std::min(wanted, limit); n >= 1; --n)
        if (audio.ConfigureChannels(descriptor.inputChannelLimit == 0 ? 0 : n, n)) return n;
    return 0;
}

}  // namespace

PerformanceResult PerformanceRun::RunPlugin(zen::PluginInterface& library, const std::string& key,
                                            const zen::PluginListEntry& entry, const Settings& settings) {
    PerformanceResult result;
    result.name = entry.name;
    result.key = key;
    std::unique_ptr<zen::PluginInstance> instance(library.CreatePlugin(zen::kAudioPluginKind, key));
    AudioPlugin* audio = zen::InterfaceCast<AudioPlugin>(instance.get());
    if (audio == nullptr || instance->GetDescriptor() == nullptr) {
        result.error = "could not be created";
        return result;
    }
    result.channels = Configure(*audio, *instance->GetDescriptor(), static_cast<std::uint32_t>(settings.channels));
    if (result.channels == 0) {
        result.error = "takes no channel layout up to " + std::to_string(settings.channels);
        return result;
    }
    if (!audio->Prepare(static_cast<float>(settings.sampleRate), static_cast<std::uint32_t>(settings.blockSize))) {
        result.error = "cannot run at " + std::to_string(settings.sampleRate) + " Hz";
        return result;
    }
    DeviceFormat format;
    format.sampleRate = settings.sampleRate;
    format.blockSize = static_cast<std::uint32_t>(settings.blockSize);
    format.inputs = 0;
    format.outputs = result.channels;
    NullDevice device(format);
    PluginLoad load(*audio, result.channels, settings.sampleRate);

    const double warmUp = std::min(kMaximumWarmUp, settings.duration * kWarmUpFraction);
    device.Run(load, static_cast<std::uint64_t>(warmUp * settings.sampleRate));
    const auto frames = static_cast<std::uint64_t>(settings.duration * settings.sampleRate);
    const double start = ThreadCpuSeconds();
    device.Run(load, frames);
    result.cpuSeconds = ThreadCpuSeconds() - start;
    result.audioSeconds = static_cast<double>(frames) / settings.sampleRate;
    result.realtimeFactor = result.cpuSeconds > 0.0 ? result.audioSeconds / result.cpuSeconds : 0.0;
    result.cpuLoad = result.audioSeconds > 0.0 ? 100.0 * result.cpuSeconds / result.audioSeconds : 0.0;
    return result;
}

std::vector<PerformanceResult> PerformanceRun::Run(zen::PluginInterface& library, const Settings& settings,
                                                   const std::function<void(const PerformanceResult&)>& progress) {
    const auto list = library.GetPluginList(zen::kAudioPluginKind);
    for (const std::string& name : settings.plugins) {
        const bool known = std::any_of(list.begin(), list.end(), [&](const auto& row) {
            return strcasecmp(row.second.name.c_str(), name.c_str()) == 0 ||
                   strcasecmp(row.first.c_str(), name.c_str()) == 0;
        });
        if (!known) throw HostError("Performance Testing names '" + name + "', which the library does not have");
    }
    std::vector<PerformanceResult> results;
    for (const auto& [key, entry] : list) {
        const bool chosen =
            settings.plugins.empty() ||
            std::any_of(settings.plugins.begin(), settings.plugins.end(), [&](const std::string& name) {
                return strcasecmp(entry.name.c_str(), name.c_str()) == 0 || strcasecmp(key.c_str(), name.c_str()) == 0;
            });
        if (!chosen) continue;
        results.push_back(RunPlugin(library, key, entry, settings));
        if (progress) progress(results.back());
    }
    return results;
}

}  // namespace zen::host
