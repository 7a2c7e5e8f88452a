// Speech loudness of one gain-list entry: the K-weighted loudness (BS.1770,
// channels 0 and 1 summed in power) of the 10 ms frames the voice detector
// judges voiced. The detector hears the channels' mean, box-averaged to
// 16 kHz. An entry is speech only when enough of its frames are voiced and
// they are louder than the floor; otherwise it reads kNoSpeech.
//
// Prepare allocates (the detector, the frame buffer); Process and TakeEntry
// are real-time safe.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "Common/Algorithms/KWeightingFilter.h"

struct Fvad;

class SpeechLoudnessMeter {
public:
    static constexpr int kDetectorRate = 16000;
    static constexpr std::size_t kDetectorFrame = 160;  // 10 ms at 16 kHz
    static constexpr int kFramesPerSecond = 100;
    static constexpr double kLoudnessOffset = -0.691;  // BS.1770: LUFS of the weighted mean square

    struct Entry {
        float loudness;              // LUFS, or kNoSpeech
        std::int32_t voicedPerMille;  // share of voiced frames
    };

    SpeechLoudnessMeter();
    ~SpeechLoudnessMeter();
    SpeechLoudnessMeter(const SpeechLoudnessMeter&) = delete;
    SpeechLoudnessMeter& operator=(const SpeechLoudnessMeter&) = delete;

    // False when the detector cannot be made.
    bool Prepare(double sampleRate);
    void Reset() noexcept;

    void SetMode(int mode) noexcept;                    // detector aggressiveness 0..3
    void SetSpeechFraction(float percent) noexcept { m_fraction = percent; }
    void SetSpeechFloor(float lufs) noexcept { m_floor = lufs; }

    // `right` is null for a single channel.
    void Process(const float* left, const float* right, std::size_t n) noexcept;
    // The entry since the last call; starts the next one.
    Entry TakeEntry() noexcept;

private:
    void CloseFrame() noexcept;

    Fvad* m_vad = nullptr;
    int m_mode = 2;
    float m_fraction = 30.0f;
    float m_floor = -65.0f;
    zen::KWeightingFilter m_weighting;
    std::vector<float> m_mono;  // one frame at the host rate
    std::size_t m_frameLength = 480;
    std::size_t m_filled = 0;
    double m_framePower = 0.0;
    // The entry so far.
    std::uint32_t m_frames = 0;
    std::uint32_t m_voiced = 0;
    double m_voicedPower = 0.0;  // sum of the voiced frames' mean squares
};
