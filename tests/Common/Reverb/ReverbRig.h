// An engine and its processing object for one host rate, as the plug-in
// pairs them, for tests of the reverb below the plug-in.
#pragma once

#include <functional>
#include <memory>
#include <vector>

#include "Common/Reverb/zn_reverb.h"
#include "Common/Reverb/zn_reverb_u15.h"

namespace reverbtest {

using Channels = std::vector<std::vector<float>>;

constexpr std::uint32_t kBlock = 512;
constexpr std::uint32_t kMaxLane = 30000;

struct Rig {
    Rig(float hostRate, std::uint32_t channels, const std::function<void(zen::reverb::zn_reverb&)>& setup = {})
        : rate(hostRate),
          engine(zen::reverb::zn_reverb_u15::EngineRateFor(hostRate), channels, channels),
          processor(zen::reverb::zn_reverb_u15::ForRate(hostRate)) {
        if (setup) setup(engine);
        engine.Update();
        processor->Dimension(channels, channels, hostRate, kBlock, kMaxLane);
        processor->Configure(engine.Param());
    }

    // Applies engine changes as the plug-in does before a block.
    void Apply() {
        if (engine.Update()) processor->Configure(engine.Param());
    }

    // In blocks of `block` frames (any length) through ProcessAnyLength.
    void Process(Channels& io, std::size_t block = kBlock) {
        std::vector<float*> pointers(io.size());
        for (std::size_t done = 0; done < io[0].size(); done += block) {
            const std::size_t n = std::min(block, io[0].size() - done);
            for (std::size_t c = 0; c < io.size(); ++c) pointers[c] = io[c].data() + done;
            processor->ProcessAnyLength(pointers.data(), n);
        }
    }

    // The response of channel 0 to a unit impulse on every input.
    std::vector<float> ImpulseResponse(std::size_t frames, std::uint32_t channels = 1) {
        Channels io(channels, std::vector<float>(frames, 0.0f));
        for (auto& c : io) c[0] = 1.0f;
        Process(io);
        return io[0];
    }

    float rate;
    zen::reverb::zn_reverb engine;
    std::unique_ptr<zen::reverb::zn_reverb_u15> processor;
};

}  // namespace reverbtest
