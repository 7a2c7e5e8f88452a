// A low-frequency oscillator for modulation: sine, triangle or a smooth
// random walk, between -1 and +1, at a rate in Hz. Hosts give no tempo, so a
// synced rate comes from a tempo parameter through SyncedRate. Plain value
// type: one per channel or voice, real-time safe throughout.
#pragma once

#include <cmath>
#include <cstdint>

class Lfo {
public:
    enum Shape { kSine, kTriangle, kRandom };

    // A rate of one cycle per `beats` quarter notes at `bpm`.
    static double SyncedRate(double bpm, double beats) { return bpm / (60.0 * beats); }
    // sin(2 pi phase), within 4e-8, for any phase.
    static float Sine(double phase) noexcept;

    void SetSampleRate(double sampleRate) noexcept;
    // A new shape takes over from the old one within kShapeGlideSeconds, so
    // the value never jumps; SettleShape (or Reset) ends the glide at once.
    static constexpr double kShapeGlideSeconds = 0.010;
    void SetShape(Shape shape) noexcept;
    void SettleShape() noexcept { m_glideLeft = 0; }
    void SetRate(double hertz) noexcept;
    // Where the cycle starts after Reset, in cycles (0.25 is a quarter ahead).
    // The random walk's seed follows it, so voices with different phases
    // wander differently.
    void SetPhase(double cycles) noexcept {
        m_startPhase = cycles - static_cast<double>(static_cast<long long>(cycles));
    }
    void Reset() noexcept;

    float Next() noexcept {
        float value = Value(m_shape);
        if (m_glideLeft > 0) {
            value += static_cast<float>(m_glideLeft) * m_glideStep * (Value(m_previousShape) - value);
            --m_glideLeft;
        }
        m_phase += m_increment;
        if (m_phase >= 1.0) {
            m_phase -= 1.0;
            m_from = m_to;
            m_to = Draw();
        }
        return value;
    }

private:
    float Value(Shape shape) const noexcept;
    float Draw() noexcept;

    Shape m_shape = kSine;
    Shape m_previousShape = kSine;
    std::uint32_t m_glideLeft = 0;  // samples until the new shape alone
    float m_glideStep = 0.0f;
    double m_sampleRate = 48000.0;
    double m_rate = 1.0;
    double m_increment = 1.0 / 48000.0;
    double m_phase = 0.0;
    double m_startPhase = 0.0;
    std::uint32_t m_seed = 1;
    float m_from = 0.0f;  // the random walk runs from here to m_to over a cycle
    float m_to = 0.0f;
};

inline float Lfo::Sine(double phase) noexcept {
    // Fold to a quarter cycle around zero, then an odd Taylor polynomial.
    // Nearest whole cycle by truncation (no library call), corrected below zero.
    auto nearest = static_cast<double>(static_cast<long long>(phase + 0.5));
    if (nearest > phase + 0.5) nearest -= 1.0;
    double q = phase - nearest;
    if (q > 0.25) q = 0.5 - q;
    if (q < -0.25) q = -0.5 - q;
    const double x = 6.283185307179586 * q;
    const double x2 = x * x;
    const double p =
        1.0 + x2 * (-1.0 / 6.0 + x2 * (1.0 / 120.0 + x2 * (-1.0 / 5040.0 + x2 * (1.0 / 362880.0 - x2 / 39916800.0))));
    return static_cast<float>(x * p);
}

inline float Lfo::Value(Shape shape) const noexcept {
    switch (shape) {
        case kTriangle: {
            double p = m_phase + 0.25;
            if (p >= 1.0) p -= 1.0;
            return static_cast<float>(1.0 - 4.0 * std::fabs(p - 0.5));
        }
        case kRandom: {
            // A raised-cosine step from one random value to the next: smooth, no corners.
            const float s = Sine(0.25 * m_phase);
            return m_from + (m_to - m_from) * s * s;
        }
        case kSine:
        default: return Sine(m_phase);
    }
}
