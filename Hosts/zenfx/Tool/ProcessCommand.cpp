// zenfx process: a chain of plug-ins over a file or the demo material.
#include <sys/stat.h>

#include <algorithm>
#include <csignal>
#include <cstdio>
#include <iomanip>
#include <iostream>
#include <memory>
#include <sstream>

#include "AudioFile.h"
#include "Commands.h"
#include "DemoMaterial.h"
#include "LearnPass.h"
#include "PluginChain.h"
#include "ProgressBar.h"
#include "TemporaryFile.h"
#include "ZenfxError.h"

namespace zenfx {

namespace {

volatile std::sig_atomic_t g_interrupted = 0;

extern "C" void OnInterrupt(int) { g_interrupted = 1; }

// Restores the previous handlers when processing ends.
class InterruptGuard {
public:
    InterruptGuard() {
        g_interrupted = 0;
        m_int = std::signal(SIGINT, OnInterrupt);
        m_term = std::signal(SIGTERM, OnInterrupt);
    }
    ~InterruptGuard() {
        std::signal(SIGINT, m_int);
        std::signal(SIGTERM, m_term);
    }

private:
    void (*m_int)(int);
    void (*m_term)(int);
};

bool SameFile(const std::string& a, const std::string& b) {
    struct stat sa {}, sb {};
    if (stat(a.c_str(), &sa) != 0 || stat(b.c_str(), &sb) != 0) return false;
    return sa.st_dev == sb.st_dev && sa.st_ino == sb.st_ino;
}

std::string Seconds(std::int64_t frames, int rate) {
    std::ostringstream out;
    out << std::fixed << std::setprecision(2) << static_cast<double>(frames) / rate << " s";
    return out.str();
}

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

}  // namespace

int RunProcess(PluginLibrary& library, const ProcessOptions& options) {
    if (options.stages.empty()) throw ZenfxError("process needs at least one --plugin", kExitUsage);
    if (options.block < 1 || options.block > (1u << 20))
        throw ZenfxError("--block must be between 1 and 1048576 frames", kExitUsage);
    if (!options.input.empty() && (options.input == options.output || SameFile(options.input, options.output)))
        throw ZenfxError("the output '" + options.output + "' is the input file; choose another output path",
                         kExitUsage);

    const auto open = [&options]() -> std::unique_ptr<AudioSource> {
        if (options.input.empty()) return std::make_unique<DemoMaterial>();
        return std::make_unique<AudioFileReader>(options.input);
    };
    std::unique_ptr<AudioSource> source = open();
    const int channels = source->Channels();
    const int rate = source->SampleRate();
    const int format = ChooseOutputFormat(options.output, source->Format(), options.format);

    PluginChain chain;
    for (const StageSpec& spec : options.stages) chain.Add(library, spec.plugin);
    chain.ConfigureChannels(static_cast<std::uint32_t>(channels));
    for (std::size_t s = 0; s < options.stages.size(); ++s) {
        for (const auto& [action, argument] : options.stages[s].actions) {
            if (action == "--preset") PluginChain::ApplyPreset(chain.Stages()[s], argument);
            else PluginChain::ApplySetting(chain.Stages()[s], argument);
        }
    }
    chain.Prepare(rate, options.block);
    RunLearnPasses(chain, options.stages, open, options.block);
    const std::uint64_t latency = chain.Latency();

    AudioFileWriter writer(options.output, rate, channels, format);
    BlockBuffers buffers(channels, options.block);
    const std::int64_t total = source->Frames();
    std::uint64_t skip = options.compensateLatency ? latency : 0;
    std::int64_t written = 0;
    bool inputDone = false;
    {
        InterruptGuard interrupts;
        ProgressBar progress(total);
        while (written < total) {
            if (g_interrupted) throw ZenfxError("interrupted; nothing was written", kExitInterrupted);
            const std::size_t block = options.block;
            std::size_t got = 0;
            if (!inputDone) {
                got = static_cast<std::size_t>(std::max<std::int64_t>(0, source->Read(buffers.Interleaved(), block)));
                inputDone = got < block;
            }
            // After the input, silence pushes the chain's delayed tail out.
            std::fill(buffers.Interleaved() + got * channels, buffers.Interleaved() + block * channels, 0.0f);
            buffers.Deinterleave(block);
            chain.Process(buffers.Channels(), block);

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
    writer.Commit();
    if (!options.metersJson.empty()) WriteFileAtomically(options.metersJson, chain.MetersJson().dump(2) + "\n");

    std::cout << "zenfx: processed " << source->Description() << " (" << Seconds(total, rate) << ", " << channels
              << " ch, " << rate << " Hz) through " << chain.Names() << "\n"
              << "zenfx: wrote " << options.output << " (" << DescribeFormat(format) << "); chain latency "
              << latency << " samples, "
              << (options.compensateLatency ? "compensated" : "not compensated") << "\n";
    if (!options.metersJson.empty()) std::cout << "zenfx: meters in " << options.metersJson << "\n";
    return 0;
}

}  // namespace zenfx
