#include "SignalChecks.h"

#include <time.h>

#include <algorithm>
#include <cmath>
#include <iomanip>
#include <limits>
#include <set>
#include <sstream>

namespace zenfx {

namespace {

constexpr float kFullScale = 1.0f;
// Non-finite input goes in at this block, after the plug-in has settled.
constexpr std::size_t kPoisonBlock = 4;
constexpr std::size_t kRecoveryBlocks = 8;
// Huge values also come as a burst of this many samples on every channel.
constexpr std::size_t kBurstFrames = 100;
// Each timed run lasts at least this long, so that neither the clock's
// resolution nor a stray interrupt decides.
constexpr double kShortestTimedRun = 0.002;
constexpr int kTimingRounds = 5;
constexpr std::size_t kTimedFrames = 16384;

std::size_t Seconds(double seconds, double rate) { return static_cast<std::size_t>(seconds * rate); }

double ThreadSeconds() {
    timespec now{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &now);
    return static_cast<double>(now.tv_sec) + 1e-9 * static_cast<double>(now.tv_nsec);
}

std::string Ratio(double ratio) {
    std::ostringstream out;
    out << std::fixed << std::setprecision(2) << ratio << "x";
    return out.str();
}

Planar Concatenate(const std::vector<Planar>& parts) {
    Planar whole = parts.front();
    for (std::size_t p = 1; p < parts.size(); ++p)
        for (std::size_t c = 0; c < whole.size(); ++c) whole[c].insert(whole[c].end(), parts[p][c].begin(), parts[p][c].end());
    return whole;
}

// Uniform values below the smallest normal float, both signs.
Planar DenormalNoise(std::uint32_t width, std::size_t frames, std::mt19937& random) {
    Planar x = signals::Noise(width, frames, 1.0f, random);
    for (auto& channel : x)
        for (float& v : channel) v *= 1e-38f;
    return x;
}

}  // namespace

void SignalChecks::Run() {
    m_context.Run("signals.silence", [this] { return Silence(); });
    m_context.Run("signals.tail", [this] { return Tail(); });
    m_context.Run("signals.dc", [this] {
        return Stress("DC steps (+0.5 then -1.0)", [](std::uint32_t width, double rate) {
            Planar x = signals::Constant(width, Seconds(0.5, rate), 0.5f);
            for (auto& channel : x)
                std::fill(channel.begin() + static_cast<std::ptrdiff_t>(channel.size() / 2), channel.end(), -kFullScale);
            return x;
        });
    });
    m_context.Run("signals.noise", [this] {
        return Stress("full-scale noise", [this](std::uint32_t width, double rate) {
            return signals::Noise(width, Seconds(0.5, rate), kFullScale, m_context.Random());
        });
    });
    m_context.Run("signals.impulses", [this] {
        return Stress("full-scale impulses", [](std::uint32_t width, double rate) {
            Planar x = signals::Impulses(width, Seconds(0.5, rate), 0, 997, kFullScale);
            // Every other impulse negative.
            for (auto& channel : x)
                for (std::size_t i = 997; i < channel.size(); i += 2 * 997) channel[i] = -kFullScale;
            return x;
        });
    });
    m_context.Run("signals.nyquist", [this] {
        return Stress("full-scale sines at 0.45 and 0.49 of the rate and at Nyquist", [](std::uint32_t width, double rate) {
            const std::size_t part = Seconds(0.2, rate);
            Planar nyquist = signals::Silence(width, part);
            for (auto& channel : nyquist)
                for (std::size_t i = 0; i < part; ++i) channel[i] = i % 2 == 0 ? kFullScale : -kFullScale;
            return Concatenate({signals::Sine(width, part, 0.45 * rate, rate, kFullScale),
                                signals::Sine(width, part, 0.49 * rate, rate, kFullScale), nyquist});
        });
    });
    m_context.Run("signals.non-finite", [this] { return NonFinite(); });
    m_context.Run("signals.huge", [this] { return Huge(); });
    m_context.Run("signals.denormals", [this] { return Denormals(); });
    m_context.Run("meters.readings", [this] { return Meters(); });
}

CheckOutcome SignalChecks::Silence() {
    if (!m_context.NewInstance()->HasAudioInput()) return Skip("no audio input");
    std::vector<std::vector<float>> settings = {m_context.Defaults()};
    for (int i = 0; i < m_context.Level(); ++i) settings.push_back(m_context.RandomSetting());
    for (double rate : m_context.CheckRates()) {
        for (std::size_t s = 0; s < settings.size(); ++s) {
            auto plugin = m_context.NewInstance();
            Require(plugin->SetAll(settings[s]), "a parameter value was refused");
            Require(plugin->Prepare(rate, ValidationContext::kMaxBlock), "Prepare at " + Hertz(rate) + " was refused");
            const Planar output = plugin->Run(signals::Silence(plugin->Width(), Seconds(0.5, rate)), ValidationContext::kBlock);
            const signals::Inspection found = signals::Inspect(output);
            const std::string setting = s == 0 ? "the defaults" : "random setting " + std::to_string(s);
            Require(found.finite && found.peak <= signals::kSilence,
                    "silence in gives " + (found.finite ? signals::Decibels(found.peak) : std::string("non-finite output")) +
                        " out at frame " + std::to_string(found.finite ? found.peakFrame : found.firstNonFinite) +
                        " with " + setting + " at " + Hertz(rate));
        }
    }
    return Pass("silence in gives output below -100 dBFS with the defaults and " +
                Count(settings.size() - 1, "random setting"));
}

CheckOutcome SignalChecks::Tail() {
    auto plugin = m_context.NewPrepared();
    if (!plugin->HasAudioInput()) return Skip("no audio input");
    const double rate = plugin->SampleRate();
    const std::uint64_t latency = plugin->Audio().GetLatency();
    const std::uint64_t tail = plugin->Audio().GetTailLength();
    Require(static_cast<double>(latency + tail) <= kLongestTailSeconds * rate,
            "latency " + Samples(latency) + " and tail " + Samples(tail) + " are longer than a minute");
    const std::size_t signalFrames = Seconds(0.25, rate);
    const std::size_t frames = signalFrames + latency + tail + Seconds(0.25, rate);
    Planar input = signals::Silence(plugin->Width(), frames);
    const Planar noise = signals::Noise(plugin->Width(), signalFrames, ValidationContext::kTestLevel, m_context.Random());
    for (std::size_t c = 0; c < input.size(); ++c) std::copy(noise[c].begin(), noise[c].end(), input[c].begin());
    const Planar output = plugin->Run(input, ValidationContext::kBlock);
    RequireSane(output, "noise followed by silence");

    std::size_t quietFrom = signalFrames;  // first frame after which everything is silence
    for (const auto& channel : output)
        for (std::size_t i = signalFrames; i < channel.size(); ++i)
            if (std::fabs(channel[i]) > signals::kSilence) quietFrom = std::max(quietFrom, i + 1);
    const std::uint64_t measured = quietFrom - signalFrames;
    const std::string stated = "stated latency " + std::to_string(latency) + " + tail " + std::to_string(tail);
    Require(measured <= latency + tail, "the output stays above -100 dBFS for " + Samples(measured) +
                                            " after the input stops; " + stated);
    return Pass("the output falls below -100 dBFS " + Samples(measured) + " after the input stops; " + stated);
}

CheckOutcome SignalChecks::Stress(const std::string& what,
                                  const std::function<Planar(std::uint32_t width, double rate)>& make) {
    const std::vector<std::vector<float>> settings = {m_context.Defaults(), m_context.RandomSetting()};
    for (double rate : m_context.CheckRates()) {
        for (std::size_t s = 0; s < settings.size(); ++s) {
            auto plugin = m_context.NewInstance();
            Require(plugin->SetAll(settings[s]), "a parameter value was refused");
            Require(plugin->Prepare(rate, ValidationContext::kMaxBlock), "Prepare at " + Hertz(rate) + " was refused");
            RequireSane(plugin->Run(make(plugin->Width(), rate), ValidationContext::kBlock),
                        what + " with " + (s == 0 ? "the defaults" : "a random setting") + " at " + Hertz(rate));
        }
    }
    return Pass(what + ": output finite and bounded, with the defaults and a random setting");
}

CheckOutcome SignalChecks::NonFinite() {
    if (!m_context.NewInstance()->HasAudioInput()) return Skip("no audio input");
    const std::vector<float> values = {std::numeric_limits<float>::quiet_NaN(), std::numeric_limits<float>::infinity(),
                                       -std::numeric_limits<float>::infinity()};
    const int cases = Poisoned(values, {Shape::OneSample, Shape::WholeBlock}, true);
    return Pass(std::to_string(cases) + " cases (NaN, +Inf, -Inf; one sample, a whole block; defaults and a " +
                "random setting): the output stays finite, and bounded again one block plus the latency later");
}

CheckOutcome SignalChecks::Huge() {
    if (!m_context.NewInstance()->HasAudioInput()) return Skip("no audio input");
    const std::vector<float> values = {1e18f, -1e19f, 3e38f, -std::numeric_limits<float>::max()};
    const int cases = Poisoned(values, {Shape::OneSample, Shape::Burst, Shape::WholeBlock}, false);
    return Pass(std::to_string(cases) + " cases (1e18, -1e19, 3e38, -3.4e38; one sample, " +
                std::to_string(kBurstFrames) + " samples, a whole block; defaults and a random setting): " +
                "the output stays finite");
}

int SignalChecks::Poisoned(const std::vector<float>& values, const std::vector<Shape>& shapes, bool boundedAfter) {
    const std::uint32_t block = ValidationContext::kBlock;
    const std::vector<std::vector<float>> settings = {m_context.Defaults(), m_context.RandomSetting()};
    int cases = 0;
    for (double rate : m_context.CheckRates()) {
        for (std::size_t s = 0; s < settings.size(); ++s) {
            for (float value : values) {
                for (Shape shape : shapes) {
                    auto plugin = m_context.NewInstance();
                    Require(plugin->SetAll(settings[s]), "a parameter value was refused");
                    Require(plugin->Prepare(rate, ValidationContext::kMaxBlock),
                            "Prepare at " + Hertz(rate) + " was refused");
                    const std::uint64_t latency = plugin->Audio().GetLatency();
                    // Into a block the plug-in has settled in, at an odd offset.
                    const std::size_t start = kPoisonBlock * block + (shape == Shape::WholeBlock ? 0 : 100);
                    const std::size_t length =
                        shape == Shape::OneSample ? 1 : (shape == Shape::Burst ? kBurstFrames : block);
                    const std::size_t frames = start + length + block + latency + kRecoveryBlocks * block;
                    Planar input =
                        signals::Noise(plugin->Width(), frames, ValidationContext::kTestLevel, m_context.Random());
                    for (std::size_t c = 0; c < input.size(); ++c) {
                        if (shape == Shape::OneSample && c > 0) break;
                        std::fill_n(input[c].begin() + static_cast<std::ptrdiff_t>(start), length, value);
                    }
                    const Planar output = plugin->Run(input, block);
                    const std::string what =
                        "after " +
                        (shape == Shape::OneSample ? "one sample of " + signals::ValueName(value) +
                                                         " on channel 1 at frame " + std::to_string(start)
                                                   : std::to_string(length) + " samples of " +
                                                         signals::ValueName(value) + " on every channel (frames " +
                                                         std::to_string(start) + " to " +
                                                         std::to_string(start + length - 1) + ")") +
                        " with " + (s == 0 ? "the defaults" : "a random setting") + " at " + Hertz(rate);
                    const signals::Inspection found = signals::Inspect(output);
                    Require(found.finite, what + ": " + signals::DescribeFault(found));
                    if (boundedAfter) {
                        const std::size_t from = start + length + block + latency;
                        RequireSane(output, what + ", from frame " + std::to_string(from) +
                                                " (one block plus the latency later)", from);
                    }
                    ++cases;
                }
            }
        }
    }
    return cases;
}

CheckOutcome SignalChecks::Denormals() {
    auto plugin = m_context.NewPrepared();
    if (!plugin->HasAudioInput()) return Skip("no audio input");
    const std::uint32_t width = plugin->Width();
    RequireSane(plugin->Run(DenormalNoise(width, Seconds(0.25, plugin->SampleRate()), m_context.Random()),
                            ValidationContext::kBlock),
                "denormal-range noise");
    if (m_context.Level() < 2) return Pass("denormal-range noise gives finite output (speed measured from level 2)");

    // Normal noise, denormal-range noise, and a burst that decays into silence,
    // interleaved; the fastest of several rounds of each counts.
    auto timed = [&](const Planar& input) {
        Planar io = input;
        const double start = ThreadSeconds();
        Require(plugin->Process(io, ValidationContext::kBlock), "Process refused a block");
        return ThreadSeconds() - start;
    };
    std::size_t frames = kTimedFrames;
    const double first = timed(signals::Noise(width, frames, ValidationContext::kTestLevel, m_context.Random()));
    if (first < kShortestTimedRun)
        frames = std::min<std::size_t>(frames * static_cast<std::size_t>(std::ceil(kShortestTimedRun / std::max(first, 1e-6))),
                                       Seconds(8.0, plugin->SampleRate()));
    const Planar normal = signals::Noise(width, frames, ValidationContext::kTestLevel, m_context.Random());
    const Planar denormal = DenormalNoise(width, frames, m_context.Random());
    Planar decay = signals::Silence(width, frames);
    const Planar burst = signals::Noise(width, std::min<std::size_t>(frames, 2048), ValidationContext::kTestLevel, m_context.Random());
    for (std::size_t c = 0; c < width; ++c) std::copy(burst[c].begin(), burst[c].end(), decay[c].begin());

    double best[3] = {INFINITY, INFINITY, INFINITY};
    for (int round = 0; round < kTimingRounds; ++round) {
        best[0] = std::min(best[0], timed(normal));
        best[1] = std::min(best[1], timed(denormal));
        best[2] = std::min(best[2], timed(decay));
    }
    const double denormalRatio = best[1] / best[0];
    const double decayRatio = best[2] / best[0];
    const std::string measured = "denormal-range input took " + Ratio(denormalRatio) +
                                 " and a decay into silence " + Ratio(decayRatio) + " the time of normal input";
    Require(denormalRatio <= kDenormalSlowdownLimit && decayRatio <= kDenormalSlowdownLimit,
            measured + " (limit " + Ratio(kDenormalSlowdownLimit) + ")");
    return Pass(measured);
}

CheckOutcome SignalChecks::Meters() {
    auto plugin = m_context.NewPrepared();
    AudioPlugin& audio = plugin->Audio();
    const std::uint32_t count = audio.GetMeterCount();
    if (count == 0) {
        zen::MeterInfo info;
        Require(!audio.GetMeterInfo(0, info), "no meters, but GetMeterInfo(0) answered true");
        return Skip("no meters");
    }
    std::vector<zen::MeterInfo> infos(count);
    std::set<std::string> identifiers;
    for (std::uint32_t i = 0; i < count; ++i) {
        zen::MeterInfo& info = infos[i];
        Require(audio.GetMeterInfo(i, info), "GetMeterInfo(" + std::to_string(i) + ") answered false");
        Require(!info.name.empty(), "meter " + std::to_string(i) + " has no name");
        Require(identifiers.insert(info.identifier).second && !info.identifier.empty(),
                "meter '" + info.name + "' has no identifier of its own ('" + info.identifier + "')");
        Require(std::isfinite(info.minimum) && std::isfinite(info.maximum) && info.minimum < info.maximum,
                "meter '" + info.name + "' has no display range");
        Require(info.size >= 1 && (info.kind != zen::MeterKind::Ring || info.capacity >= 1),
                "meter '" + info.name + "' holds no values");
    }
    zen::MeterInfo past;
    Require(!audio.GetMeterInfo(count, past), "GetMeterInfo answered true past the last meter");
    Require(audio.GetMeter(count) == 0.0f, "GetMeter past the last meter is not 0");

    const std::uint32_t width = plugin->Width();
    const std::uint32_t block = ValidationContext::kBlock;
    const std::uint64_t latency = audio.GetLatency();
    std::vector<std::uint64_t> cursors(count, 0);
    // Rings keep a history, so a NaN that went in stays in it: they are
    // checked after clean input only.
    auto readAll = [&](const std::string& after, bool rings) {
        for (std::uint32_t i = 0; i < count; ++i) {
            const zen::MeterInfo& info = infos[i];
            const std::string which = "meter '" + info.name + "'";
            std::vector<float> values(std::size_t{info.size} * std::max(1u, info.capacity));
            if (info.kind == zen::MeterKind::Array) {
                Require(audio.ReadMeterArray(i, values.data(), info.size),
                        which + " could not be read after " + after);
            } else if (info.kind == zen::MeterKind::Ring) {
                const zen::MeterRingRead read = audio.ReadMeterRing(i, cursors[i], values.data(), info.capacity);
                Require(read.records <= info.capacity, which + " delivered more records than it holds");
                values.resize(std::size_t{read.records} * info.size);
                if (!rings) continue;
            } else {
                values = {audio.GetMeter(i)};
            }
            for (std::size_t v = 0; v < values.size(); ++v)
                Require(std::isfinite(values[v]), which + " reads " + signals::ValueName(values[v]) +
                                                      (values.size() > 1 ? " at value " + std::to_string(v) : "") +
                                                      " after " + after);
        }
    };
    plugin->Run(signals::Noise(width, 4 * block, kFullScale, m_context.Random()), block);
    readAll("full-scale noise", true);
    plugin->Run(signals::Silence(width, 4 * block), block);
    readAll("silence", true);
    if (plugin->HasAudioInput()) {
        Planar poisoned = signals::Noise(width, block, ValidationContext::kTestLevel, m_context.Random());
        poisoned[0][10] = std::numeric_limits<float>::quiet_NaN();
        plugin->Run(poisoned, block);
        plugin->Run(signals::Noise(width, 2 * block + latency, ValidationContext::kTestLevel, m_context.Random()), block);
        readAll("a NaN and then finite input", false);
        Planar huge = signals::Noise(width, block, ValidationContext::kTestLevel, m_context.Random());
        for (auto& channel : huge) std::fill(channel.begin() + 10, channel.begin() + 110, 3e38f);
        plugin->Run(huge, block);
        readAll("100 samples of 3e+38", true);
        plugin->Run(signals::Noise(width, 2 * block + latency, ValidationContext::kTestLevel, m_context.Random()), block);
        readAll("100 samples of 3e+38 and then finite input", true);
    }
    return Pass(std::to_string(count) +
                " meters described; readings are numbers after noise, silence, NaN and huge input");
}

}  // namespace zenfx
