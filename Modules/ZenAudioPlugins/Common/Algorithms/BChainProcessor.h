// The B-chain of a monitor path: per output channel a sample-exact delay, a
// gain with polarity and a four-band EQ of BiQuad sections, set whole from
// the "B-Chain Control" document. Channels beyond the document's pass
// unchanged.
//
// Configure sizes the delay lines and so allocates: call it outside
// processing (after Prepare, or between blocks on the processing thread).
// Process, ProcessChannel and Reset keep the real-time rules.
#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <vector>

#include "../ZenAudioAlgorithm.h"
#include "BiQuad.h"
#include "Delay.h"
#include "HostCore/Settings/Documents/BChainDocument.h"

class BChainProcessor : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    using Channel = zen::host::BChainDocument::Channel;
    static constexpr std::size_t kBands = zen::host::BChainDocument::kBands;

    BChainProcessor();
    ~BChainProcessor() override;

    // Keeps the settings and applies them again for the new rate.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    void SetChannelCount(std::uint64_t channels) override;
    void Configure(const std::vector<Channel>& settings);

    // Delay of a channel in samples at the prepared rate: round(ms * fs / 1000).
    std::uint32_t GetDelaySamples(std::uint64_t channel) const;

    bool Process(float* const* channels, std::uint64_t count) override;
    bool ProcessChannel(std::uint64_t channel, float* samples, std::uint64_t count) override;
    void Reset() override;

private:
    struct Strip {
        std::array<std::unique_ptr<BiQuad>, kBands> bands;
        std::unique_ptr<zen::Delay> delay;
        float gain = 1.0f;    // with the polarity's sign
        bool active = false;  // a channel the settings reach
    };
    void Apply(std::size_t channel);

    std::vector<Strip> m_strips;
    std::vector<Channel> m_settings;
};
