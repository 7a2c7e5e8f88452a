#include "TestToneGenerator.h"

#include <cmath>

#include "HostCore/Devices/FileDevice.h"

namespace zen::host {

namespace {

constexpr double kPi = 3.14159265358979323846;
constexpr std::uint64_t kSeed = 0x9E3779B97F4A7C15ull;

}  // namespace

// xorshift64* into a uniform value in [-1, 1); pink through a bank of
// one-pole filters whose sum falls at 3 dB per octave.
double TestToneGenerator::Noise::Next(bool pinkNoise) noexcept {
    state ^= state >> 12;
    state ^= state << 25;
    state ^= state >> 27;
    const double white = static_cast<double>((state * 0x2545F4914F6CDD1Dull) >> 11) * (2.0 / 9007199254740992.0) - 1.0;
    if (!pinkNoise) return white;
    pink[0] = 0.99886 * pink[0] + white * 0.0555179;
    pink[1] = 0.99332 * pink[1] + white * 0.0750759;
    pink[2] = 0.96900 * pink[2] + white * 0.1538520;
    pink[3] = 0.86650 * pink[3] + white * 0.3104856;
    pink[4] = 0.55000 * pink[4] + white * 0.5329522;
    pink[5] = -0.7616 * pink[5] - white * 0.0168980;
    const double out = pink[0] + pink[1] + pink[2] + pink[3] + pink[4] + pink[5] + pink[6] + white * 0.5362;
    pink[6] = white * 0.115926;
    return out;
}

TestToneGenerator::TestToneGenerator(const Tone& tone)
    : m_tone(tone),
      m_frames(static_cast<std::uint64_t>(std::llround(tone.duration * tone.sampleRate))),
      m_amplitude(std::pow(10.0, tone.levelDb / 20.0)),
      m_noise{kSeed} {
    if (tone.signal == OscillatorDocument::kPink || tone.signal == OscillatorDocument::kWhite) {
        Noise probe{kSeed};
        double sum = 0.0;
        for (std::uint64_t i = 0; i < m_frames; ++i) {
            const double v = probe.Next(tone.signal == OscillatorDocument::kPink);
            sum += v * v;
        }
        const double rms = m_frames > 0 ? std::sqrt(sum / static_cast<double>(m_frames)) : 1.0;
        m_noiseScale = rms > 0.0 ? 1.0 / (rms * std::sqrt(2.0)) : 0.0;
    }
}

double TestToneGenerator::Sample() noexcept {
    const double n = static_cast<double>(m_position);
    const double fs = m_tone.sampleRate;
    switch (m_tone.signal) {
        case OscillatorDocument::kSine: {
            // The phase in cycles, wrapped before the sine, so it stays exact.
            const double cycles = m_tone.frequency * n / fs;
            return m_amplitude * std::sin(2.0 * kPi * (cycles - std::floor(cycles)));
        }
        case OscillatorDocument::kSweep: {
            const double t = n / fs;
            const double f1 = m_tone.frequency, f2 = m_tone.sweepEnd;
            const double ratio = std::log(f2 / f1);
            if (ratio == 0.0) return m_amplitude * std::sin(2.0 * kPi * f1 * t);
            const double length = m_tone.duration;
            const double cycles = f1 * length / ratio * (std::exp(t / length * ratio) - 1.0);
            return m_amplitude * std::sin(2.0 * kPi * (cycles - std::floor(cycles)));
        }
        case OscillatorDocument::kPink: return m_amplitude * m_noiseScale * m_noise.Next(true);
        case OscillatorDocument::kWhite: return m_amplitude * m_noiseScale * m_noise.Next(false);
    }
    return 0.0;
}

void TestToneGenerator::ProcessBlock(const float* const*, float* const* outputs, std::uint32_t frames) noexcept {
    const int channels = m_tone.channels;
    for (std::uint32_t i = 0; i < frames; ++i, ++m_position) {
        const auto v = m_position < m_frames ? static_cast<float>(Sample()) : 0.0f;
        for (int c = 0; c < channels; ++c) outputs[c][i] = m_tone.channel == 0 || m_tone.channel == c + 1 ? v : 0.0f;
    }
}

void TestToneGenerator::Render(const Tone& tone, const std::string& outputPath) {
    TestToneGenerator generator(tone);
    DeviceFormat format;
    format.sampleRate = tone.sampleRate;
    format.inputs = 0;
    format.outputs = static_cast<std::uint32_t>(tone.channels);
    FileDevice device({}, outputPath, format);
    device.Run(generator, generator.Frames());
}

}  // namespace zen::host
