// zenfx process: a chain of plug-ins over a file or the demo material, on one
// channel of the host core's studio model.
#include <algorithm>
#include <iomanip>
#include <iostream>
#include <memory>
#include <sstream>

#include "AudioFile.h"
#include "ChainReport.h"
#include "Commands.h"
#include "DemoMaterial.h"
#include "HostCore/Settings/AtomicFile.h"
#include "HostCore/Studio/StudioModel.h"
#include "LearnPass.h"
#include "LevellingPasses.h"
#include "MeterRecorder.h"
#include "ProgressBar.h"
#include "RunFiles.h"
#include "StageSettings.h"
#include "ZenfxError.h"

namespace zenfx {

namespace {

// The rates AudioPlugin::Prepare promises to take.
constexpr int kLowestRate = 8000;
constexpr int kHighestRate = 384000;
constexpr std::uint32_t kLongestBlock = 1u << 20;

std::string Seconds(std::int64_t frames, int rate) {
    std::ostringstream out;
    out << std::fixed << std::setprecision(2) << static_cast<double>(frames) / rate << " s";
    return out.str();
}

void Warn(const std::string& message) { std::cerr << "zenfx: warning: " << message << "\n"; }

// Channel buffers for the chain and the interleaved frames of the files.
class BlockBuffers {
public:
    BlockBuffers(int channels, std::uint32_t block)
        : m_channels(static_cast<std::size_t>(channels)),
          m_planar(m_channels * block),
          m_interleaved(m_channels * block),
          m_pointers(m_channels) {
        for (std::size_t c = 0; c < m_channels; ++c) m_pointers[c] = m_planar.data() + c * block;
    }
    float* Interleaved() { return m_interleaved.data(); }
    float* const* Channels() { return m_pointers.data(); }

    void Deinterleave(std::size_t frames) {
        for (std::size_t i = 0; i < frames; ++i)
            for (std::size_t c = 0; c < m_channels; ++c) m_pointers[c][i] = m_interleaved[i * m_channels + c];
    }
    void Interleave(std::size_t first, std::size_t count) {
        for (std::size_t i = 0; i < count; ++i)
            for (std::size_t c = 0; c < m_channels; ++c)
                m_interleaved[i * m_channels + c] = m_pointers[c][first + i];
    }

private:
    std::size_t m_channels;
    std::vector<float> m_planar;
    std::vector<float> m_interleaved;
    std::vector<float*> m_pointers;
};

std::unique_ptr<AudioSource> OpenSource(const std::string& input) {
    if (input.empty()) return std::make_unique<DemoMaterial>();
    auto source = std::make_unique<AudioFileReader>(input);
    if (source->DeclaredFrames() > source->Frames())
        Warn("'" + input + "' is cut off: its header declares " + std::to_string(source->DeclaredFrames()) +
             " frames, the file holds " + std::to_string(source->Frames()) + "; processing those");
    if (source->SampleRate() < kLowestRate || source->SampleRate() > kHighestRate)
        throw ZenfxError("'" + input + "' is at " + std::to_string(source->SampleRate()) +
                         " Hz; the plug-ins run at " + std::to_string(kLowestRate) + " to " +
                         std::to_string(kHighestRate) + " Hz (resample it first)");
    return source;
}

}  // namespace

int RunProcess(PluginLibrary& library, const ProcessOptions& options) {
    if (options.stages.empty()) throw ZenfxError("process needs at least one --plugin", kExitUsage);
    if (options.block < 1 || options.block > kLongestBlock)
        throw ZenfxError("--block must be between 1 and " + std::to_string(kLongestBlock) + " frames", kExitUsage);
    RunFiles files;
    if (!options.input.empty()) files.AddInput(options.input);
    files.AddOutput("-o", options.output);
    if (!options.metersJson.empty()) files.AddOutput("--meters-json", options.metersJson);

    const auto open = [&options] { return OpenSource(options.input); };
    const std::unique_ptr<AudioSource> source = open();
    const int channels = source->Channels();
    const int rate = source->SampleRate();
    const int format = ChooseOutputFormat(options.output, source->Format(), options.format);

    zen::host::StudioModel studio(library.Interface());
    const std::size_t channel = studio.AddChannel("zenfx", static_cast<std::uint32_t>(channels));
    std::vector<MeterRecorder::Plugin> plugins;
    for (const StageSpec& spec : options.stages) {
        const PluginEntry plugin = library.FindAudioPlugin(spec.plugin);
        const std::size_t slot = studio.InsertPlugin(channel, plugin.key);
        StageSettings(studio.PluginAt(channel, slot), plugin.entry.name, Warn).Apply(spec.actions);
        plugins.push_back({plugin.entry.name, plugin.key, &studio.PluginAt(channel, slot)});
    }
    // Plug-ins that set up their channel (a template loading and setting its
    // targets) do it off the audio path, before Prepare: their settings hold
    // from the first sample, as in an LV2 host at activation.
    ChainReport report(studio, options.verbose);
    studio.RunBackgroundTasks(channel, false);
    if (!report.Records().empty()) report.Print(std::cout, channel);
    studio.Prepare(rate, options.block);
    std::vector<AudioPlugin*> stagePlugins;
    for (const MeterRecorder::Plugin& plugin : plugins) stagePlugins.push_back(plugin.audio);
    RunLearnPasses(studio, channel, options.stages, stagePlugins, open, options.block);
    RunLevellingPasses(studio, channel, open, options.block);
    const std::uint64_t latency = studio.Latency(channel);

    // Every destination is taken before the run, so that one that cannot be
    // written fails now rather than after an hour of processing.
    AudioFileWriter writer(options.output, rate, channels, format);
    std::unique_ptr<zen::host::AtomicFile> metersFile;
    if (!options.metersJson.empty()) metersFile = std::make_unique<zen::host::AtomicFile>(options.metersJson);

    MeterRecorder meters(plugins);
    BlockBuffers buffers(channels, options.block);
    const std::int64_t total = source->Frames();
    std::uint64_t skip = options.compensateLatency ? latency : 0;
    std::int64_t written = 0;
    bool inputDone = false;
    {
        ProgressBar progress(total);
        while (written < total) {
            const std::size_t block = options.block;
            std::size_t got = 0;
            if (!inputDone) {
                got = static_cast<std::size_t>(std::max<std::int64_t>(0, source->Read(buffers.Interleaved(), block)));
                inputDone = got < block;
            }
            // After the input, silence pushes the chain's delayed tail out.
            std::fill(buffers.Interleaved() + got * channels, buffers.Interleaved() + block * channels, 0.0f);
            buffers.Deinterleave(block);
            if (!studio.Process(channel, buffers.Channels(), block))
                throw ZenfxError("a plug-in of the chain refused to process a block");
            meters.Update();

            const std::size_t first = static_cast<std::size_t>(std::min<std::uint64_t>(skip, block));
            skip -= first;
            const auto count = static_cast<std::size_t>(
                std::min<std::int64_t>(static_cast<std::int64_t>(block - first), total - written));
            buffers.Interleave(first, count);
            writer.Write(buffers.Interleaved(), static_cast<std::int64_t>(count));
            written += static_cast<std::int64_t>(count);
            progress.Update(written);
        }
    }
    // Every output complete before any replaces what was there.
    writer.Close();
    if (metersFile) metersFile->Write(meters.Json().dump(2) + "\n");
    writer.Commit();
    if (metersFile) metersFile->Commit();

    std::string names;
    for (const MeterRecorder::Plugin& plugin : plugins) names += (names.empty() ? "" : " -> ") + plugin.name;
    std::cout << "zenfx: processed " << source->Description() << " (" << Seconds(total, rate) << ", " << channels
              << " ch, " << rate << " Hz) through " << names << "\n"
              << "zenfx: wrote " << options.output << " (" << DescribeFormat(format) << "); chain latency "
              << latency << " samples, " << (options.compensateLatency ? "compensated" : "not compensated") << "\n";
    if (metersFile) std::cout << "zenfx: meters in " << options.metersJson << "\n";
    return 0;
}

}  // namespace zenfx
