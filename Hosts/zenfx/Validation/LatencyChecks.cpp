#include "LatencyChecks.h"

#include <cmath>

namespace zenfx {

namespace {

// The impulse comes after some signal-free frames, so that a plug-in that
// misreports a latency of 0 cannot hide it at frame 0.
constexpr std::size_t kImpulseAt = 100;
// At least this share of the impulse must come through the neutral setting.
constexpr float kLeastThrough = 0.25f;
// Long enough for the bypass cross-fade to end.
constexpr double kSettleSeconds = 0.05;

std::vector<double> LatencyRates(int level) {
    if (level <= 1) return {48000.0};
    if (level <= 3) return {44100.0, 48000.0, 96000.0};
    return {22050.0, 44100.0, 48000.0, 88200.0, 96000.0, 176400.0, 192000.0};
}

}  // namespace

void LatencyChecks::Run() {
    m_context.Run("latency.impulse", [this] { return ImpulseDelay(); });
    m_context.Run("latency.bypass", [this] { return BypassKeepsLatency(); });
}

CheckOutcome LatencyChecks::ImpulseDelay() {
    auto probe = m_context.NewInstance();
    if (!probe->HasAudioInput()) return Skip("no audio input");
    if (!probe->Audio().ApplyNeutralSetting()) return Skip("the plug-in has no neutral setting");

    std::string summary;
    for (double rate : LatencyRates(m_context.Level())) {
        auto plugin = m_context.NewInstance();
        Require(plugin->Audio().ApplyNeutralSetting(), "ApplyNeutralSetting answered false on a second instance");
        Require(plugin->Prepare(rate, ValidationContext::kBlock), "Prepare at " + Hertz(rate) + " was refused");
        const std::uint32_t latency = plugin->Audio().GetLatency();
        const std::size_t frames = kImpulseAt + latency + 4 * ValidationContext::kBlock;
        const Planar output = plugin->Run(
            signals::Impulses(plugin->Width(), frames, kImpulseAt, frames, ValidationContext::kTestLevel),
            ValidationContext::kBlock);
        RequireSane(output, "an impulse through the neutral setting");
        for (std::size_t c = 0; c < plugin->Audio().GetOutputChannelCount(); ++c) {
            const signals::Inspection response = signals::Inspect(Planar{output[c]});
            Require(response.peak >= kLeastThrough * ValidationContext::kTestLevel,
                    "an impulse at -6 dBFS comes out of channel " + std::to_string(c + 1) + " at " +
                        signals::Decibels(response.peak) + " through the neutral setting at " + Hertz(rate));
            const auto measured = static_cast<long>(response.peakFrame) - static_cast<long>(kImpulseAt);
            Require(measured == static_cast<long>(latency),
                    "reports a latency of " + Samples(latency) + " but an impulse comes out of channel " +
                        std::to_string(c + 1) + " " + std::to_string(measured) + " samples late at " + Hertz(rate));
        }
        summary += (summary.empty() ? "" : ", ") + Samples(latency) + " at " + Hertz(rate);
    }
    return Pass("reported latency equals the measured impulse delay: " + summary);
}

CheckOutcome LatencyChecks::BypassKeepsLatency() {
    auto plugin = m_context.NewPrepared(ValidationContext::kSampleRate, ValidationContext::kBlock);
    if (!plugin->HasAudioInput()) return Skip("no audio input");
    AudioPlugin& audio = plugin->Audio();
    const std::uint32_t latency = audio.GetLatency();
    const std::uint32_t width = plugin->Width();

    plugin->Run(signals::Noise(width, ValidationContext::kBlock, ValidationContext::kTestLevel, m_context.Random()),
                ValidationContext::kBlock);
    audio.SetBypass(true);
    Require(audio.IsBypassed(), "IsBypassed is false after SetBypass(true)");
    Require(audio.GetLatency() == latency, "bypass changed the latency from " + Samples(latency) + " to " +
                                               Samples(audio.GetLatency()));
    const std::size_t settle = static_cast<std::size_t>(kSettleSeconds * plugin->SampleRate());
    const std::size_t frames = settle + latency + 4 * ValidationContext::kBlock;
    const Planar input = signals::Noise(width, frames, ValidationContext::kTestLevel, m_context.Random());
    const Planar output = plugin->Run(input, ValidationContext::kBlock);
    // Once the cross-fade is over the output is the input, delayed by the latency.
    for (std::size_t c = 0; c < audio.GetOutputChannelCount() && c < audio.GetInputChannelCount(); ++c) {
        for (std::size_t i = settle + latency; i < frames; ++i) {
            if (output[c][i] == input[c][i - latency]) continue;
            throw CheckFailure("bypassed, channel " + std::to_string(c + 1) + " at frame " + std::to_string(i) +
                               " is not the input delayed by the reported " + Samples(latency));
        }
    }
    audio.SetBypass(false);
    Require(!audio.IsBypassed() && audio.GetLatency() == latency, "leaving bypass changed the latency");
    RequireSane(plugin->Run(input, ValidationContext::kBlock), "noise after leaving bypass");
    return Pass("bypassed, the output is the input delayed by the reported " + Samples(latency) +
                "; the latency stays when bypass is switched");
}

}  // namespace zenfx
