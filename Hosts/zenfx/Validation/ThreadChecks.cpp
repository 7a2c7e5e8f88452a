#include "ThreadChecks.h"

#include <algorithm>
#include <atomic>
#include <chrono>
#include <sstream>
#include <thread>

namespace zenfx {

namespace {

constexpr std::uint32_t kThreadBlock = 256;
// The audio thread keeps pace with the other thread's changes, so that the
// two overlap however they are scheduled; it waits at most this long.
constexpr int kEventsPerBlock = 2;
constexpr auto kLongestWait = std::chrono::seconds(2);

// Any meter read as an editor does, while the audio thread publishes: a
// number, an array whole, or a ring drained from this reader's cursor.
float ReadMeter(const AudioPlugin& audio, std::uint32_t index, std::vector<std::uint64_t>& cursors) {
    zen::MeterInfo info;
    if (!audio.GetMeterInfo(index, info)) return 0.0f;
    if (info.kind == zen::MeterKind::Level || info.kind == zen::MeterKind::Value) return audio.GetMeter(index);
    std::vector<float> values(std::size_t{info.size} * std::max(1u, info.capacity));
    if (info.kind == zen::MeterKind::Array) {
        if (!audio.ReadMeterArray(index, values.data(), info.size)) return 0.0f;
    } else {
        cursors.resize(std::max<std::size_t>(cursors.size(), index + 1));
        const zen::MeterRingRead read = audio.ReadMeterRing(index, cursors[index], values.data(), info.capacity);
        values.resize(std::size_t{info.size} * read.records);
    }
    float sum = 0.0f;
    for (float v : values) sum += v;
    return sum;
}

}  // namespace

void ThreadChecks::Run() {
    m_context.Run("threads.parameters", [this] { return ParametersDuringProcessing(); });
}

CheckOutcome ThreadChecks::ParametersDuringProcessing() {
    const auto& parameters = m_context.Parameters();
    auto plugin = m_context.NewPrepared(ValidationContext::kSampleRate, kThreadBlock);
    AudioPlugin& audio = plugin->Audio();
    auto* controls = zen::InterfaceCast<ZenControlValueHost>(&plugin->Instance());
    const int blocks = m_context.Scaled(100);
    const Planar input =
        signals::Noise(plugin->Width(), kThreadBlock * static_cast<std::size_t>(blocks), ValidationContext::kTestLevel,
                       m_context.Random());

    // The audio thread: every block checked as it comes.
    std::atomic<bool> done{false};
    std::atomic<int> events{0};
    std::string audioFault;
    int processed = 0;
    std::thread audioThread([&] {
        std::vector<std::uint32_t> one = {kThreadBlock};
        const auto deadline = std::chrono::steady_clock::now() + kLongestWait;
        for (int b = 0; audioFault.empty() && b < blocks; ++b, ++processed) {
            while (events.load() < kEventsPerBlock * b && std::chrono::steady_clock::now() < deadline)
                std::this_thread::yield();
            Planar block = signals::Slice(input, static_cast<std::size_t>(b) * kThreadBlock, kThreadBlock);
            if (!plugin->Process(block, one)) {
                audioFault = "Process refused block " + std::to_string(b);
                break;
            }
            const std::string fault = signals::DescribeFault(signals::Inspect(block));
            if (!fault.empty()) audioFault = "block " + std::to_string(b) + ": " + fault;
        }
        done.store(true);
    });

    // This thread: changes and read-outs until the audio thread is through.
    std::mt19937 random(m_context.Random()());
    std::vector<float> last = plugin->Values();
    bool lastBypass = false;
    std::size_t changes = 0, switches = 0;
    std::vector<std::uint64_t> meterCursors;
    std::string refused;
    std::uniform_int_distribution<int> event(0, 15);
    while (!done.load()) {
        const int what = event(random);
        if (what == 0) {
            lastBypass = !lastBypass;
            audio.SetBypass(lastBypass);
            ++switches;
        } else if (what == 1) {
            volatile float sink = 0.0f;
            for (std::uint32_t m = 0; m < audio.GetMeterCount(); ++m) sink = sink + ReadMeter(audio, m, meterCursors);
            sink = sink + static_cast<float>(audio.GetLatency() + audio.GetTailLength());
            sink = sink + (audio.IsBypassed() ? 1.0f : 0.0f);
            (void)sink;
        } else if (!parameters.empty()) {
            std::uniform_int_distribution<std::uint32_t> pick(0, static_cast<std::uint32_t>(parameters.size() - 1));
            const std::uint32_t index = pick(random);
            const float value = ValidationContext::RandomValue(parameters[index], random);
            if (!audio.SetParameter(index, value) && refused.empty())
                refused = "SetParameter(" + std::to_string(index) + ", " + std::to_string(value) + ") answered false";
            last[index] = value;
            if (controls != nullptr) (void)controls->GetParameterPosition(index);
            (void)audio.GetParameter(index);
            ++changes;
        }
        events.fetch_add(1);
        std::this_thread::yield();
    }
    audioThread.join();

    Require(audioFault.empty(), "while another thread changed parameters, " + audioFault);
    Require(refused.empty(), "from the second thread, " + refused);
    for (std::uint32_t i = 0; i < last.size(); ++i)
        Require(audio.GetParameter(i) == last[i], "parameter " + std::to_string(i) + " reads " +
                                                      std::to_string(audio.GetParameter(i)) + " after the last value " +
                                                      std::to_string(last[i]) + " was set from another thread");
    Require(audio.IsBypassed() == lastBypass, "the bypass does not read as last set from another thread");
    // The last changes reach the audio path.
    RequireSane(plugin->Run(signals::Slice(input, 0, 4 * kThreadBlock), kThreadBlock), "noise after the changes");
    return Pass(Count(changes, "parameter change") + " and " + Count(switches, "bypass switch") +
                " from a second thread during " + Count(static_cast<std::size_t>(processed), "block") +
                "; output finite and bounded, values read back as last set");
}

}  // namespace zenfx
