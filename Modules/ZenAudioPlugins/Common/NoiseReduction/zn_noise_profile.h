// A learned noise profile: the mean periodogram of the frames heard while
// learning, per channel and bin. It is kept per unit of window energy, so a
// profile learned with one frame length applies to another (a change of
// sample rate); across frame lengths it is interpolated in frequency.
//
// Learning restarts the mean at Begin and keeps it at End; a learn that saw
// no frame leaves the previous profile in place. The profile survives Reset
// (it is a setting, not signal state) and travels as text (ToText/FromText).
//
// Configure, ToText and FromText allocate; Begin, Learn, End and Adopt are
// real-time safe.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "System/AlignedBuffer.h"

namespace zen::noise_reduction {

class zn_noise_profile {
public:
    static constexpr std::size_t kMaxChannels = 64;
    static constexpr const char* kTextTag = "noise-profile";

    // A profile as learnt or loaded, in its own rate and bins: power per
    // unit window energy, channels x bins. No bins: no profile.
    struct Snapshot {
        double rate = 48000.0;
        std::size_t bins = 0;
        std::size_t channels = 0;
        std::vector<float> power;
    };

    // `windowEnergy` is the sum of the squared analysis window.
    bool Configure(std::size_t channels, std::size_t bins, double sampleRate, double windowEnergy);

    void Begin() noexcept;
    void Learn(std::size_t channel, const float* power) noexcept;
    // Frames learnt since Begin, then the profile replaces the previous one.
    std::uint64_t End() noexcept;
    bool IsLearning() const { return m_learning; }
    std::uint64_t FramesLearnt() const { return m_learnt; }

    bool HasProfile() const { return m_stored.bins > 0; }
    void Forget() noexcept;
    // The profile as expected periodogram power of this channel's frames
    // (channels beyond those learnt use the last learnt one).
    const float* Power(std::size_t channel) const;

    // "noise-profile <rate> <bins> <channels>" then per channel the bins'
    // power per unit window energy in dB; "" without a profile.
    std::string ToText() const;
    // False for text that is not a profile; the profile then stays as it was.
    bool FromText(const std::string& text);
    static std::string Format(const Snapshot& snapshot);
    // "" gives the empty snapshot.
    static bool Parse(const std::string& text, Snapshot& snapshot);

    // The profile held, empty without one.
    const Snapshot& Learnt() const { return m_stored; }
    // Takes `snapshot` as the profile (an empty one forgets it); `snapshot`
    // may come back holding the previous profile's storage.
    void Adopt(Snapshot& snapshot) noexcept;

private:
    void Rebuild() noexcept;  // the stored profile in this configuration's bins

    std::size_t m_channels = 0;
    std::size_t m_bins = 0;
    double m_sampleRate = 48000.0;
    double m_windowEnergy = 1.0;
    bool m_learning = false;
    std::uint64_t m_learnt = 0;
    ora::AlignedBuffer<double> m_sum;
    ora::AlignedBuffer<std::uint64_t> m_counts;
    ora::AlignedBuffer<float> m_power;  // expected periodogram power, channels x bins

    // Its capacity always holds a profile of this configuration, so that
    // End never allocates.
    Snapshot m_stored;
};

}  // namespace zen::noise_reduction
