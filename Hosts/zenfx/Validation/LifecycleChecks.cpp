#include "LifecycleChecks.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <sstream>

namespace zenfx {

namespace {

// Frames of noise each short run processes.
constexpr std::size_t kShortRun = 1024;
constexpr float kTestLevel = ValidationContext::kTestLevel;

std::string Layout(std::uint32_t inputs, std::uint32_t outputs) {
    return std::to_string(inputs) + "->" + std::to_string(outputs);
}

// "1->1 to 32->32" for a run of square layouts, else the list.
std::string DescribeLayouts(const std::vector<std::pair<std::uint32_t, std::uint32_t>>& layouts) {
    const bool square = std::all_of(layouts.begin(), layouts.end(), [](const auto& l) { return l.first == l.second; });
    bool contiguous = square;
    for (std::size_t i = 1; contiguous && i < layouts.size(); ++i)
        contiguous = layouts[i].first == layouts[i - 1].first + 1;
    if (contiguous && layouts.size() > 2)
        return Layout(layouts.front().first, layouts.front().second) + " to " +
               Layout(layouts.back().first, layouts.back().second);
    std::string text;
    for (const auto& [inputs, outputs] : layouts) text += (text.empty() ? "" : ", ") + Layout(inputs, outputs);
    return text;
}

}  // namespace

void LifecycleChecks::Run() {
    m_context.Run("lifecycle.create-destroy", [this] { return CreateDestroy(); });
    m_context.Run("lifecycle.process-before-prepare", [this] { return ProcessBeforePrepare(); });
    m_context.Run("lifecycle.channel-layouts", [this] { return ChannelLayouts(); });
    m_context.Run("lifecycle.sample-rates", [this] { return SampleRates(); });
    m_context.Run("lifecycle.prepare-limits", [this] { return PrepareLimits(); });
    m_context.Run("lifecycle.reset", [this] { return ResetReproduces(); });
}

CheckOutcome LifecycleChecks::CreateDestroy() {
    const int oneByOne = m_context.Scaled(8);
    for (int i = 0; i < oneByOne; ++i) {
        auto plugin = m_context.NewInstance();
        // Every other instance dies unprepared, the rest after processing.
        if (i % 2 == 0) continue;
        Require(plugin->Prepare(ValidationContext::kSampleRate, ValidationContext::kBlock), "Prepare was refused");
        RequireSane(plugin->Run(signals::Noise(plugin->Width(), kShortRun, kTestLevel, m_context.Random()),
                                ValidationContext::kBlock),
                    "noise through instance " + std::to_string(i + 1));
    }
    const int together = 2 + m_context.Scaled(2);
    std::vector<std::unique_ptr<PluginUnderTest>> alive;
    for (int i = 0; i < together; ++i) alive.push_back(m_context.NewPrepared());
    // Interleaved processing: instances must not share signal state.
    const Planar input = signals::Noise(alive[0]->Width(), kShortRun, kTestLevel, m_context.Random());
    std::vector<Planar> outputs;
    for (auto& plugin : alive) outputs.push_back(plugin->Run(input, ValidationContext::kBlock));
    for (std::size_t i = 1; i < outputs.size(); ++i)
        RequireMatch(outputs[i], outputs[0], "instances alive at the same time gave different output for the same input");
    // Destroyed in an order other than creation.
    std::reverse(alive.begin(), alive.end());
    alive.clear();
    return Pass("created and destroyed " + std::to_string(oneByOne) + " instances one by one and " +
                std::to_string(together) + " alive at once, with identical output");
}

CheckOutcome LifecycleChecks::ProcessBeforePrepare() {
    auto plugin = m_context.NewInstance();
    AudioPlugin& audio = plugin->Audio();
    Planar io = signals::Constant(plugin->Width(), 64, 0.25f);
    std::vector<float*> pointers;
    for (auto& channel : io) pointers.push_back(channel.data());
    Require(!audio.Process(pointers.data(), 64), "Process before Prepare answered true");
    for (const auto& channel : io)
        Require(std::all_of(channel.begin(), channel.end(), [](float x) { return x == 0.25f; }),
                "Process before Prepare changed the buffers");
    // Queries before Prepare must answer without crashing.
    (void)audio.GetLatency();
    (void)audio.GetTailLength();
    for (std::uint32_t i = 0; i < audio.GetMeterCount(); ++i) {
        float values[1];
        std::uint64_t cursor = 0;
        (void)audio.GetMeter(i);
        Require(!audio.ReadMeterArray(i, values, 1) && audio.ReadMeterRing(i, cursor, values, 1).records == 0,
                "meter " + std::to_string(i) + " read an array or a ring before Prepare");
    }
    audio.Reset();

    Require(plugin->Prepare(ValidationContext::kSampleRate, ValidationContext::kBlock), "Prepare was refused");
    Require(!audio.Process(nullptr, 64), "Process with no channel buffers answered true");
    Require(audio.Process(pointers.data(), 0), "Process of 0 frames answered false on a prepared instance");
    return Pass("Process before Prepare answered false and left the buffers alone; 0 frames and null buffers handled");
}

CheckOutcome LifecycleChecks::ChannelLayouts() {
    auto plugin = m_context.NewInstance();
    AudioPlugin& audio = plugin->Audio();
    const zen::PluginDescriptor& descriptor = plugin->Descriptor();
    const std::uint32_t inLimit = descriptor.inputChannelLimit;
    const std::uint32_t outLimit = descriptor.outputChannelLimit;

    const std::uint32_t defaultIn = std::min(2u, inLimit);
    const std::uint32_t defaultOut = std::min(2u, outLimit);
    Require(audio.GetInputChannelCount() == defaultIn && audio.GetOutputChannelCount() == defaultOut,
            "the layout before ConfigureChannels is " +
                Layout(audio.GetInputChannelCount(), audio.GetOutputChannelCount()) + ", not " +
                Layout(defaultIn, defaultOut));
    Require(plugin->Prepare(ValidationContext::kSampleRate, ValidationContext::kBlock), "Prepare was refused");

    std::vector<std::pair<std::uint32_t, std::uint32_t>> accepted;
    std::size_t refused = 0;
    // One past each limit, and far beyond, must be refused.
    std::vector<std::uint32_t> inputs, outputs;
    for (std::uint32_t n = 0; n <= inLimit + 1; ++n) inputs.push_back(n);
    for (std::uint32_t n = 0; n <= outLimit + 1; ++n) outputs.push_back(n);
    inputs.push_back(std::numeric_limits<std::uint32_t>::max());
    outputs.push_back(std::numeric_limits<std::uint32_t>::max());

    for (std::uint32_t in : inputs) {
        for (std::uint32_t out : outputs) {
            const std::uint32_t beforeIn = audio.GetInputChannelCount();
            const std::uint32_t beforeOut = audio.GetOutputChannelCount();
            const bool ok = audio.ConfigureChannels(in, out);
            if (!ok) {
                ++refused;
                Require(audio.GetInputChannelCount() == beforeIn && audio.GetOutputChannelCount() == beforeOut,
                        "refusing " + Layout(in, out) + " changed the layout from " + Layout(beforeIn, beforeOut) +
                            " to " + Layout(audio.GetInputChannelCount(), audio.GetOutputChannelCount()));
                continue;
            }
            Require(in <= inLimit && out <= outLimit,
                    "accepted " + Layout(in, out) + " beyond the descriptor's limits " + Layout(inLimit, outLimit));
            Require(audio.GetInputChannelCount() == in && audio.GetOutputChannelCount() == out,
                    "accepted " + Layout(in, out) + " but reports " +
                        Layout(audio.GetInputChannelCount(), audio.GetOutputChannelCount()));
            accepted.emplace_back(in, out);
            // A prepared instance prepares itself again for a new layout.
            RequireSane(plugin->Run(signals::Noise(plugin->Width(), kShortRun / 4, kTestLevel, m_context.Random()),
                                    ValidationContext::kBlock),
                        "noise through " + Layout(in, out));
        }
    }
    Require(!accepted.empty(), "no layout within the descriptor's limits was accepted");
    // A refused layout after an accepted one leaves the instance working.
    Require(!audio.ConfigureChannels(inLimit + 1, outLimit + 1), "accepted a layout beyond the limits");
    RequireSane(plugin->Run(signals::Noise(plugin->Width(), kShortRun / 4, kTestLevel, m_context.Random()),
                            ValidationContext::kBlock),
                "noise after a refused layout");
    return Pass("accepts " + DescribeLayouts(accepted) + ", each processed; refuses the other " +
                std::to_string(refused) + " tried (limits " + Layout(inLimit, outLimit) + ")");
}

CheckOutcome LifecycleChecks::SampleRates() {
    auto plugin = m_context.NewInstance();
    std::vector<double> order(std::begin(kRates), std::end(kRates));
    // Down again after the way up: preparing after processing at another rate.
    order.insert(order.end(), std::rbegin(kRates), std::rend(kRates));
    std::ostringstream latencies;
    std::uint32_t firstLatency = 0;
    bool sameLatency = true;
    for (std::size_t i = 0; i < order.size(); ++i) {
        const double rate = order[i];
        Require(plugin->Prepare(rate, ValidationContext::kBlock), "Prepare at " + Hertz(rate) + " was refused");
        const std::uint32_t latency = plugin->Audio().GetLatency();
        if (i == 0) firstLatency = latency;
        sameLatency = sameLatency && latency == firstLatency;
        if (i < std::size(kRates)) latencies << (i == 0 ? "" : ", ") << latency;
        RequireSane(plugin->Run(signals::Noise(plugin->Width(), kShortRun, kTestLevel, m_context.Random()),
                                ValidationContext::kBlock),
                    "noise at " + Hertz(rate) + (i < std::size(kRates) ? "" : " (prepared again)"));
    }
    return Pass("prepared and processed at 22.05 to 192 kHz, up and down again; latency " +
                (sameLatency ? Samples(firstLatency) + " at every rate" : latencies.str() + " samples"));
}

CheckOutcome LifecycleChecks::PrepareLimits() {
    auto plugin = m_context.NewInstance();
    AudioPlugin& audio = plugin->Audio();
    const float nan = std::numeric_limits<float>::quiet_NaN();
    const float inf = std::numeric_limits<float>::infinity();
    const std::pair<float, std::uint32_t> refusals[] = {
        {0.0f, 512}, {-48000.0f, 512}, {nan, 512}, {inf, 512}, {7999.0f, 512}, {384001.0f, 512},
        {48000.0f, 0}, {48000.0f, (1u << 20) + 1}};
    for (const auto& [rate, block] : refusals) {
        std::ostringstream call;
        call << "Prepare(" << rate << ", " << block << ")";
        Require(!audio.Prepare(rate, block), call.str() + " answered true");
    }
    // The smallest block: every longer block is split down to single frames.
    Require(plugin->Prepare(ValidationContext::kSampleRate, 1), "Prepare(48000, 1) was refused");
    RequireSane(plugin->Run(signals::Noise(plugin->Width(), 300, kTestLevel, m_context.Random()), 300),
                "noise in a 300-frame block prepared for 1");
    return Pass("refuses rates outside 8 to 384 kHz, NaN, and blocks of 0 or above 2^20; runs prepared for 1 frame");
}

CheckOutcome LifecycleChecks::ResetReproduces() {
    const std::vector<float> setting = m_context.Level() > 1 ? m_context.RandomSetting() : m_context.Defaults();
    auto used = m_context.NewInstance();
    auto fresh = m_context.NewInstance();
    Require(used->SetAll(setting) && fresh->SetAll(setting), "a parameter value was refused");
    Require(used->Prepare(ValidationContext::kSampleRate, ValidationContext::kMaxBlock) &&
                fresh->Prepare(ValidationContext::kSampleRate, ValidationContext::kMaxBlock),
            "Prepare was refused");
    const std::size_t frames = 8192;
    used->Run(signals::Noise(used->Width(), frames, 1.0f, m_context.Random()), ValidationContext::kBlock);
    used->Audio().Reset();
    const Planar input = signals::Noise(used->Width(), frames, kTestLevel, m_context.Random());
    const Planar afterReset = used->Run(input, ValidationContext::kBlock);
    const Planar expected = fresh->Run(input, ValidationContext::kBlock);
    RequireMatch(afterReset, expected, "after Reset the output differs from a fresh instance's");
    return Pass("after Reset the output matches a fresh instance's");
}

}  // namespace zenfx
