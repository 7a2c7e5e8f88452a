// Plug-ins with one deliberate fault each, so that the validator's tests can
// show the matching check failing: a smoothed "Gain" in dB on up to two
// channels, and the fault. Only ever linked into libZenFaultyPlugins.so, a
// test library of its own.
#include <algorithm>
#include <cmath>
#include <map>
#include <mutex>
#include <string>
#include <vector>

#include "Common/Algorithms/Delay.h"
#include "Common/Decibels.h"
#include "Common/ZenAudioPlugin.h"
#include "Common/ZenAudioPluginImpl.h"

// Two channels, code "Zt" and two letters. Constant, so that it is ready
// before any registration runs.
constexpr zen::PluginDescriptor Faulty(const char* name, const char* className, char c, char d) {
    return {name, 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 't', c, d), 2, 2, className, 0, 0, -1, nullptr};
}

// The healthy base, never registered itself.
class ZenFaultyGain : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    enum Parameter : std::uint32_t { kGain, kSmoothing };

    // The table carries the subclass's name, as a plug-in's identifiers do.
    static const zen::ParameterTableDefinition& Definitions(const char* className) {
        static std::mutex mutex;
        static std::map<std::string, zen::ParameterTableDefinition> tables;
        std::lock_guard<std::mutex> lock(mutex);
        auto table = tables.find(className);
        if (table == tables.end()) {
            zen::ParameterTableDefinition rows = zen::MakeParameterTable(
                className, {zen::ContinuousParameter("GAIN", "Gain", -24.0f, 12.0f, 0.0f, 0.1f, "dB")
                                .Smoothed(zen::working::DbToGain),
                            zen::ContinuousParameter("SMOOTHING", "Smoothing", 0.0f, 0.99f, 0.0f, 0.01f)});
            table = tables.emplace(className, std::move(rows)).first;
        }
        return table->second;
    }

protected:
    explicit ZenFaultyGain(const char* className) { InitParameters(Definitions(className)); }

    void UpdateProcessingParameter(std::uint32_t index, float value) override {
        if (index == kSmoothing) m_smoothing = value;
    }

    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override {
        for (std::uint32_t c = 0; c < channelCount; ++c) {
            auto gain = Smoothed(kGain).Track(c);
            for (std::uint32_t i = 0; i < frames; ++i) channels[c][i] *= static_cast<float>(gain.Next());
        }
    }

    float m_smoothing = 0.0f;  // audio thread
};

// "Test Allocating": sizes a scratch vector on the audio thread instead of in
// Prepare.
class ZenTestAllocating : public ZenFaultyGain {
    Q_OBJECT

public:
    static constexpr zen::PluginDescriptor kDescriptor = Faulty("Test Allocating", "ZenTestAllocating", 'A', 'l');
    ZenTestAllocating() : ZenFaultyGain(kDescriptor.className) {}

protected:
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override {
        std::vector<float> scratch(channels[0], channels[0] + frames);
        m_scratch.swap(scratch);
        ZenFaultyGain::ProcessBlock(channels, channelCount, frames);
    }

private:
    std::vector<float> m_scratch;
};

// "Test Block Peak": a naive limiter with one gain for whatever block the
// host passes, so its output depends on the split, and which does not
// declare itself block-based.
class ZenTestBlockPeak : public ZenFaultyGain {
    Q_OBJECT

public:
    static constexpr zen::PluginDescriptor kDescriptor = Faulty("Test Block Peak", "ZenTestBlockPeak", 'B', 'p');
    static constexpr float kCeiling = 0.25f;
    ZenTestBlockPeak() : ZenFaultyGain(kDescriptor.className) {}

protected:
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override {
        for (std::uint32_t c = 0; c < channelCount; ++c) {
            float peak = 0.0f;
            for (std::uint32_t i = 0; i < frames; ++i) peak = std::max(peak, std::fabs(channels[c][i]));
            const float gain = peak > kCeiling ? kCeiling / peak : 1.0f;
            for (std::uint32_t i = 0; i < frames; ++i) channels[c][i] *= gain;
        }
        ZenFaultyGain::ProcessBlock(channels, channelCount, frames);
    }
};

// "Test Ignored Parameter": acknowledges changes of "Gain" and drops them.
class ZenTestIgnoredParameter : public ZenFaultyGain {
    Q_OBJECT

public:
    static constexpr zen::PluginDescriptor kDescriptor =
        Faulty("Test Ignored Parameter", "ZenTestIgnoredParameter", 'I', 'g');
    ZenTestIgnoredParameter() : ZenFaultyGain(kDescriptor.className) {}

    bool SetParameter(std::uint32_t index, float value) override {
        return index == kGain || ZenFaultyGain::SetParameter(index, value);
    }
};

// "Test Locking": takes a mutex in every block and does not declare it.
class ZenTestLocking : public ZenFaultyGain {
    Q_OBJECT

public:
    static constexpr zen::PluginDescriptor kDescriptor = Faulty("Test Locking", "ZenTestLocking", 'L', 'k');
    ZenTestLocking() : ZenFaultyGain(kDescriptor.className) {}

protected:
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override {
        std::lock_guard<std::mutex> lock(m_mutex);
        ZenFaultyGain::ProcessBlock(channels, channelCount, frames);
    }

private:
    std::mutex m_mutex;
};

// "Test NaN State": its own Process, written straight against the host
// interface and so without the base's input guard, runs a one-pole smoother
// by "Smoothing" whose state nothing clears: a NaN or an infinity stays in it
// forever (0 times NaN is NaN, even with no smoothing).
class ZenTestNanState : public ZenFaultyGain {
    Q_OBJECT

public:
    static constexpr zen::PluginDescriptor kDescriptor = Faulty("Test NaN State", "ZenTestNanState", 'N', 's');
    ZenTestNanState() : ZenFaultyGain(kDescriptor.className) {}

    bool Process(float* const* channels, std::uint64_t frames) noexcept override {
        if (!IsPrepared() || channels == nullptr) return false;
        if (IsBypassed()) return true;  // no latency: the input as it is
        const float s = GetParameter(kSmoothing);
        for (std::uint32_t c = 0; c < GetProcessChannelCount(); ++c) {
            float y = m_state[c];
            for (std::uint64_t i = 0; i < frames; ++i) channels[c][i] = y = (1.0f - s) * channels[c][i] + s * y;
            m_state[c] = y;
        }
        return true;
    }

protected:
    void ResetProcessing() override { std::fill(std::begin(m_state), std::end(m_state), 0.0f); }

private:
    float m_state[kMaxChannels] = {};
};

// "Test Overflow": adds a trace of the fifth harmonic by the Chebyshev
// polynomial 16x^5 - 20x^3 + 5x in float, bounded for full-scale input, but
// x^5 overflows to infinity beyond about 1e7 (+140 dBFS).
class ZenTestOverflow : public ZenFaultyGain {
    Q_OBJECT

public:
    static constexpr zen::PluginDescriptor kDescriptor = Faulty("Test Overflow", "ZenTestOverflow", 'O', 'v');
    static constexpr float kHarmonic = 0.01f;
    ZenTestOverflow() : ZenFaultyGain(kDescriptor.className) {}

protected:
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override {
        for (std::uint32_t c = 0; c < channelCount; ++c) {
            for (std::uint32_t i = 0; i < frames; ++i) {
                const float x = channels[c][i];
                const float x2 = x * x;
                channels[c][i] = x + kHarmonic * (16.0f * x2 * x2 * x - 20.0f * x2 * x + 5.0f * x);
            }
        }
        ZenFaultyGain::ProcessBlock(channels, channelCount, frames);
    }
};

// "Test Racy": hands "Gain" to the audio thread through a plain float, a data
// race that only ThreadSanitizer sees.
class ZenTestRacy : public ZenFaultyGain {
    Q_OBJECT

public:
    static constexpr zen::PluginDescriptor kDescriptor = Faulty("Test Racy", "ZenTestRacy", 'R', 'c');
    ZenTestRacy() : ZenFaultyGain(kDescriptor.className) {}

    bool SetParameter(std::uint32_t index, float value) override {
        if (!ZenFaultyGain::SetParameter(index, value)) return false;
        if (index == kGain) m_plainGain = zen::DbToGain(GetParameter(kGain));
        return true;
    }

protected:
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override {
        for (std::uint32_t c = 0; c < channelCount; ++c)
            for (std::uint32_t i = 0; i < frames; ++i) channels[c][i] *= m_plainGain;
    }

private:
    float m_plainGain = 1.0f;
};

// "Test Wrong Latency": delays by 32 samples and reports 40.
class ZenTestWrongLatency : public ZenFaultyGain {
    Q_OBJECT

public:
    static constexpr zen::PluginDescriptor kDescriptor =
        Faulty("Test Wrong Latency", "ZenTestWrongLatency", 'W', 'l');
    ZenTestWrongLatency() : ZenFaultyGain(kDescriptor.className) {}

protected:
    void PrepareProcessing(float, std::uint32_t maxBlock) override {
        m_delay.Dimension(GetProcessChannelCount(), maxBlock, 32);
        SetLatency(40);
    }
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override {
        for (std::uint32_t c = 0; c < channelCount; ++c) m_delay.ProcessChannel(c, channels[c], frames);
        ZenFaultyGain::ProcessBlock(channels, channelCount, frames);
    }
    void ResetProcessing() override { m_delay.Reset(); }

private:
    zen::Delay m_delay;
};

template class ZenAudioPlugin<ZenTestAllocating>;
template class ZenAudioPlugin<ZenTestBlockPeak>;
template class ZenAudioPlugin<ZenTestIgnoredParameter>;
template class ZenAudioPlugin<ZenTestLocking>;
template class ZenAudioPlugin<ZenTestNanState>;
template class ZenAudioPlugin<ZenTestOverflow>;
template class ZenAudioPlugin<ZenTestRacy>;
template class ZenAudioPlugin<ZenTestWrongLatency>;

#include "FaultyPlugins.moc"
