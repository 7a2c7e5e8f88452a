// zenfx analyze: a loudness and peak report per file, measured by the
// library's "Meter" (and "Phase Meter" for the correlation of stereo files)
// through the public interface while the file streams past in blocks.
#include <algorithm>
#include <cmath>
#include <cstdio>
#include <iomanip>
#include <iostream>
#include <memory>
#include <optional>
#include <sstream>
#include <vector>

#include <nlohmann/json.hpp>

#include "AudioFile.h"
#include "Commands.h"
#include "ProgressBar.h"
#include "ZenfxError.h"

namespace zenfx {

namespace {

constexpr std::uint32_t kBlock = 4096;
constexpr std::uint32_t kMaxChannels = 32;  // "Meter" takes up to 32
constexpr double kProgressSeconds = 30.0;
// Meters read this for silence, and the integrated loudness while nothing
// lies above the gate.
constexpr double kSilence = -120.0;
constexpr double kAbsoluteGateLufs = -70.0;

struct ChannelReport {
    double truePeak = kSilence;
    double samplePeak = kSilence;
    double rms = kSilence;
};

struct FileReport {
    std::string path;
    int sampleRate = 0;
    int channels = 0;
    std::int64_t frames = 0;
    double integrated = kSilence;
    double range = 0.0;
    double maxMomentary = kSilence;
    double maxShortTerm = kSilence;
    double truePeak = kSilence;
    double samplePeak = kSilence;
    std::vector<ChannelReport> perChannel;
    std::optional<double> correlation;
    std::uint64_t invalidSamples = 0;
};

// One instance of an analyser, its meters found by identifier.
class Analyser {
public:
    Analyser(PluginLibrary& library, const std::string& name, int channels, int sampleRate, const std::string& file)
        : m_instance(library.Create(library.FindAudioPlugin(name))), m_audio(&AudioOf(*m_instance)) {
        const auto count = static_cast<std::uint32_t>(channels);
        if (!m_audio->ConfigureChannels(count, count))
            throw ZenfxError(file + ": " + std::to_string(channels) + " channels is a layout \"" + name +
                             "\" does not take");
        if (!m_audio->Prepare(static_cast<float>(sampleRate), kBlock))
            throw ZenfxError(file + ": " + std::to_string(sampleRate) + " Hz is outside the rates \"" + name +
                             "\" takes (8000 to 384000 Hz)");
    }

    void Process(float* const* channels, std::uint64_t frames) { m_audio->Process(channels, frames); }

    double Read(const std::string& identifier) const {
        for (std::uint32_t m = 0; m < m_audio->GetMeterCount(); ++m) {
            zen::MeterInfo info;
            if (m_audio->GetMeterInfo(m, info) && info.identifier == identifier) return m_audio->GetMeter(m);
        }
        throw ZenfxError("the library's meter has no reading " + identifier);
    }

private:
    std::unique_ptr<zen::PluginInstance> m_instance;
    AudioPlugin* m_audio;
};

FileReport Analyse(PluginLibrary& library, const std::string& path) {
    AudioFileReader reader(path);
    const std::string name = reader.Description();
    FileReport report;
    report.path = path;
    report.sampleRate = reader.SampleRate();
    report.channels = reader.Channels();
    report.frames = reader.Frames();
    if (report.frames <= 0) throw ZenfxError(name + ": no audio frames to measure");
    if (report.channels < 1 || static_cast<std::uint32_t>(report.channels) > kMaxChannels)
        throw ZenfxError(name + ": " + std::to_string(report.channels) + " channels; analyze takes 1 to " +
                         std::to_string(kMaxChannels));

    Analyser meter(library, "Meter", report.channels, report.sampleRate, name);
    std::unique_ptr<Analyser> phase;
    if (report.channels == 2) phase = std::make_unique<Analyser>(library, "Phase Meter", 2, report.sampleRate, name);

    const auto channels = static_cast<std::size_t>(report.channels);
    std::vector<float> interleaved(channels * kBlock);
    std::vector<float> planar(channels * kBlock);
    std::vector<float*> pointers(channels);
    for (std::size_t c = 0; c < channels; ++c) pointers[c] = planar.data() + c * kBlock;
    std::unique_ptr<ProgressBar> progress;
    if (static_cast<double>(report.frames) > kProgressSeconds * report.sampleRate)
        progress = std::make_unique<ProgressBar>(report.frames);
    std::int64_t done = 0;
    for (;;) {
        const std::int64_t got = reader.Read(interleaved.data(), kBlock);
        if (got <= 0) break;
        const auto n = static_cast<std::size_t>(got);
        for (std::size_t i = 0; i < n; ++i)
            for (std::size_t c = 0; c < channels; ++c) pointers[c][i] = interleaved[i * channels + c];
        meter.Process(pointers.data(), n);
        if (phase) phase->Process(pointers.data(), n);
        done += got;
        if (progress) progress->Update(done);
    }
    progress.reset();
    if (done == 0) throw ZenfxError(name + ": no audio frames could be read");
    report.frames = done;

    report.integrated = meter.Read("ZenMeter::INTEGRATED");
    report.range = meter.Read("ZenMeter::LOUDNESS_RANGE");
    report.maxMomentary = meter.Read("ZenMeter::MAX_MOMENTARY");
    report.maxShortTerm = meter.Read("ZenMeter::MAX_SHORT_TERM");
    report.invalidSamples = static_cast<std::uint64_t>(meter.Read("ZenMeter::INVALID_SAMPLES"));
    for (int c = 1; c <= report.channels; ++c) {
        const std::string n = std::to_string(c);
        ChannelReport ch;
        ch.truePeak = meter.Read("ZenMeter::TRUE_PEAK_" + n);
        ch.samplePeak = meter.Read("ZenMeter::SAMPLE_PEAK_" + n);
        ch.rms = meter.Read("ZenMeter::AVERAGE_RMS_" + n);
        report.truePeak = std::max(report.truePeak, ch.truePeak);
        report.samplePeak = std::max(report.samplePeak, ch.samplePeak);
        report.perChannel.push_back(ch);
    }
    if (phase) report.correlation = phase->Read("ZenPhaseMeter::OVERALL_CORRELATION");
    return report;
}

bool IsSilent(double value) { return value <= kSilence; }

std::string Fixed(double value, int decimals = 1, bool sign = false) {
    std::ostringstream out;
    out << std::fixed << std::setprecision(decimals) << (sign ? std::showpos : std::noshowpos) << value;
    return out.str();
}

std::string Level(double value, const char* unit) {
    return (IsSilent(value) ? std::string("-inf") : Fixed(value)) + " " + unit;
}

std::string Duration(std::int64_t frames, int rate) {
    const double seconds = static_cast<double>(frames) / rate;
    const auto minutes = static_cast<long long>(seconds / 60.0);
    char text[32];
    std::snprintf(text, sizeof text, "%lld:%06.3f", minutes, seconds - 60.0 * static_cast<double>(minutes));
    return text;
}

bool BelowGate(const FileReport& report) { return report.integrated < kAbsoluteGateLufs; }

void PrintText(const FileReport& r, const std::optional<double>& target) {
    std::cout << "'" << r.path << "': " << Duration(r.frames, r.sampleRate) << ", " << r.channels << " ch, "
              << r.sampleRate << " Hz\n";
    auto row = [](const char* label, const std::string& value) {
        std::cout << "  " << std::left << std::setw(20) << label << value << "\n";
    };
    row("Integrated", BelowGate(r) ? "-inf LUFS (nothing above the -70 LUFS gate)" : Level(r.integrated, "LUFS"));
    row("Loudness range", Fixed(r.range) + " LU");
    row("Max momentary", Level(r.maxMomentary, "LUFS"));
    row("Max short-term", Level(r.maxShortTerm, "LUFS"));
    row("True peak", Level(r.truePeak, "dBTP"));
    row("Sample peak", Level(r.samplePeak, "dBFS"));
    if (r.correlation) row("Correlation", Fixed(*r.correlation, 2));
    if (target) {
        row(("Gain to " + Fixed(*target) + " LUFS").c_str(),
            BelowGate(r) ? std::string("none: nothing to measure above the gate")
                         : Fixed(*target - r.integrated, 1, true) + " dB (true peak then " +
                               Level(r.truePeak + *target - r.integrated, "dBTP") + ")");
    }
    std::cout << "  " << std::left << std::setw(10) << "Channel" << std::setw(16) << "True peak" << std::setw(16)
              << "Sample peak" << "RMS\n";
    for (std::size_t c = 0; c < r.perChannel.size(); ++c) {
        const ChannelReport& ch = r.perChannel[c];
        std::cout << "  " << std::left << std::setw(10) << c + 1 << std::setw(16) << Level(ch.truePeak, "dBTP")
                  << std::setw(16) << Level(ch.samplePeak, "dBFS") << Level(ch.rms, "dBFS") << "\n";
    }
    if (r.invalidSamples > 0)
        std::cout << "  " << r.invalidSamples << " NaN or infinite samples were measured as silence\n";
}

// Levels rounded to 0.01, null for silence.
nlohmann::json JsonLevel(double value) {
    if (IsSilent(value)) return nullptr;
    return std::round(value * 100.0) / 100.0;
}

nlohmann::json Json(const FileReport& r, const std::optional<double>& target) {
    nlohmann::json channels = nlohmann::json::array();
    for (const ChannelReport& ch : r.perChannel)
        channels.push_back({{"truePeak", JsonLevel(ch.truePeak)},
                            {"samplePeak", JsonLevel(ch.samplePeak)},
                            {"rms", JsonLevel(ch.rms)}});
    nlohmann::json j = {
        {"file", r.path},
        {"sampleRate", r.sampleRate},
        {"channelCount", r.channels},
        {"frames", r.frames},
        {"seconds", static_cast<double>(r.frames) / r.sampleRate},
        {"integrated", BelowGate(r) ? nullptr : JsonLevel(r.integrated)},
        {"belowGate", BelowGate(r)},
        {"loudnessRange", std::round(r.range * 100.0) / 100.0},
        {"maxMomentary", JsonLevel(r.maxMomentary)},
        {"maxShortTerm", JsonLevel(r.maxShortTerm)},
        {"truePeak", JsonLevel(r.truePeak)},
        {"samplePeak", JsonLevel(r.samplePeak)},
        {"channels", channels},
        {"invalidSamples", r.invalidSamples},
    };
    if (r.correlation) j["correlation"] = std::round(*r.correlation * 1000.0) / 1000.0;
    if (target) {
        j["target"] = *target;
        j["gain"] = BelowGate(r) ? nullptr : JsonLevel(*target - r.integrated);
    }
    return j;
}

}  // namespace

int RunAnalyze(PluginLibrary& library, const AnalyzeOptions& options) {
    if (options.files.empty()) throw ZenfxError("analyze needs at least one file", kExitUsage);
    nlohmann::json reports = nlohmann::json::array();
    int failures = 0;
    bool first = true;
    for (const std::string& path : options.files) {
        try {
            const FileReport report = Analyse(library, path);
            if (options.json) {
                reports.push_back(Json(report, options.target));
            } else {
                if (!first) std::cout << "\n";
                PrintText(report, options.target);
                first = false;
            }
        } catch (const ZenfxError& e) {
            // One file's failure does not stop the others.
            std::cerr << "zenfx: " << e.what() << "\n";
            if (options.json) reports.push_back({{"file", path}, {"error", e.what()}});
            ++failures;
        }
    }
    if (options.json) std::cout << nlohmann::json{{"files", reports}}.dump(2) << "\n";
    return failures == 0 ? 0 : kExitFailure;
}

}  // namespace zenfx
