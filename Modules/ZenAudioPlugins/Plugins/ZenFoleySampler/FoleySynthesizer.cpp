#include "FoleySynthesizer.h"

#include <algorithm>
#include <cmath>
#include <string>

#include "Common/Algorithms/BiQuad.h"

namespace {

constexpr double kPi = 3.14159265358979323846;
constexpr double kRate = FoleySynthesizer::kSampleRate;
// Takes end where they fall below this level (-90 dB re their peak).
constexpr float kTrimLevel = 3.16e-5f;
constexpr double kEndFadeSeconds = 0.005;

using Buffer = std::vector<float>;

std::size_t Samples(double seconds) { return static_cast<std::size_t>(std::lround(seconds * kRate)); }

class Random {
public:
    explicit Random(std::uint32_t seed) : m_state(seed * 2654435761u + 1u) {}
    // Uniform in [-1, 1).
    double Bipolar() { return Next() * (2.0 / 4294967296.0) - 1.0; }
    // Uniform in [low, high).
    double Between(double low, double high) { return low + (high - low) * (Next() / 4294967296.0); }

private:
    double Next() {
        m_state ^= m_state << 13;
        m_state ^= m_state >> 17;
        m_state ^= m_state << 5;
        return m_state;
    }
    std::uint32_t m_state;
};

// Static filters go through the library's biquad.
void Filter(Buffer& x, int shape, double frequency, double q = 0.707) {
    BiQuad biquad;
    biquad.SetChannelCount(1);
    biquad.Prepare(static_cast<float>(kRate), static_cast<std::uint32_t>(std::max<std::size_t>(x.size(), 1)));
    biquad.SetParameter(BiQuad::kIn, 1.0f);
    biquad.SetParameter(BiQuad::kShape, static_cast<float>(shape));
    biquad.SetParameter(BiQuad::kFreq, static_cast<float>(frequency));
    biquad.SetParameter(BiQuad::kQ, static_cast<float>(q));
    biquad.ProcessChannel(0, x.data(), x.size());
}

void BandPass(Buffer& x, double frequency, double q) {
    BiQuad biquad;
    biquad.SetChannelCount(1);
    biquad.Prepare(static_cast<float>(kRate), static_cast<std::uint32_t>(std::max<std::size_t>(x.size(), 1)));
    biquad.SetParameter(BiQuad::kIn, 1.0f);
    biquad.SetBandPass(frequency, q);
    biquad.ProcessChannel(0, x.data(), x.size());
}

void Mix(Buffer& into, const Buffer& from, std::size_t at, double gain = 1.0) {
    if (into.size() < at + from.size()) into.resize(at + from.size(), 0.0f);
    for (std::size_t i = 0; i < from.size(); ++i) into[at + i] += static_cast<float>(gain * from[i]);
}

// Noise shaped by an attack and an exponential decay (seconds).
Buffer Burst(Random& random, double attack, double decay, double length) {
    Buffer x(Samples(length));
    const double rise = std::exp(-1.0 / (attack * kRate)), fall = std::exp(-1.0 / (decay * kRate));
    double rising = 1.0, falling = 1.0;
    for (float& s : x) {
        s = static_cast<float>(random.Bipolar() * (1.0 - rising) * falling);
        rising *= rise;
        falling *= fall;
    }
    return x;
}

// A decaying mode whose frequency glides from `start` toward `end`: a
// rotating phasor, its step renewed every few samples as the glide settles.
void AddMode(Buffer& x, std::size_t at, double start, double end, double glide, double decay, double amplitude,
             double phase = 0.0) {
    constexpr std::size_t kStride = 16;
    const std::size_t length = std::min(Samples(decay * 7.0), x.size() > at ? x.size() - at : 0);
    const double fall = std::exp(-1.0 / (decay * kRate));
    const double settle = std::exp(-static_cast<double>(kStride) / (glide * kRate));
    double excess = start - end;
    double re = std::cos(phase) * amplitude, im = std::sin(phase) * amplitude;
    double stepRe = 1.0, stepIm = 0.0;
    for (std::size_t i = 0; i < length; ++i) {
        if (i % kStride == 0) {
            const double w = 2.0 * kPi * (end + excess) / kRate;
            stepRe = std::cos(w) * fall;
            stepIm = std::sin(w) * fall;
            excess *= settle;
        }
        x[at + i] += static_cast<float>(im);
        const double r = re * stepRe - im * stepIm;
        im = re * stepIm + im * stepRe;
        re = r;
    }
}

// Sparse grains (gravel, twigs, fibres): impulses of random size, denser
// early, through a band-pass.
Buffer Grains(Random& random, double length, double perSecond, double decay, double centre, double q) {
    Buffer x(Samples(length), 0.0f);
    const double fall = std::exp(-1.0 / (decay * kRate));
    double envelope = 1.0;
    for (float& s : x) {
        if (random.Between(0.0, 1.0) < perSecond / kRate * envelope) s = static_cast<float>(random.Bipolar() * envelope);
        envelope *= fall;
    }
    BandPass(x, centre, q);
    return x;
}

// Trims the silent end, fades the last few milliseconds and sets the peak.
FoleySound Finish(const std::string& name, Buffer x, double peakDb = 0.0) {
    float peak = 0.0f;
    for (float s : x) peak = std::max(peak, std::fabs(s));
    if (peak <= 0.0f) return FoleySound(name, kRate, {x});
    std::size_t end = x.size();
    while (end > 0 && std::fabs(x[end - 1]) < kTrimLevel * peak) --end;
    x.resize(end);
    const std::size_t fade = std::min(x.size(), Samples(kEndFadeSeconds));
    for (std::size_t i = 0; i < fade; ++i) x[x.size() - 1 - i] *= static_cast<float>(i) / fade;
    const double gain = FoleySynthesizer::kTakePeak / peak * std::pow(10.0, peakDb / 20.0);
    for (float& s : x) s = static_cast<float>(s * gain);
    return FoleySound(name, kRate, {x});
}

// A pad of takes, each made from its own random sequence; `make` may set the
// take's peak in dB relative to the common one.
template <class Make>
FoleyBank::Pad Takes(const std::string& name, std::uint32_t seed, Make make) {
    FoleyBank::Pad pad{name, {}};
    for (int take = 0; take < FoleySynthesizer::kTakesPerPad; ++take) {
        Random random(seed * 100 + static_cast<std::uint32_t>(take));
        double peakDb = 0.0;
        Buffer x = make(random, peakDb);
        pad.takes.push_back(Finish(name + " " + std::to_string(take + 1), std::move(x), peakDb));
    }
    return pad;
}

// --- footsteps: a heel strike, then the ball of the foot a moment later.

void ConcreteStrike(Buffer& x, std::size_t at, Random& random, double weight) {
    Buffer click = Burst(random, 0.0003, random.Between(0.006, 0.010), 0.06);
    Filter(click, BiQuad::kHighPass, 350.0);
    Filter(click, BiQuad::kLowPass, random.Between(4500.0, 6500.0));
    Mix(x, click, at, weight);
    Buffer scuff = Burst(random, 0.004, 0.018, 0.09);
    BandPass(scuff, random.Between(2500.0, 3500.0), 0.9);
    Mix(x, scuff, at + Samples(0.004), 0.25 * weight);
    AddMode(x, at, 110.0, 75.0, 0.01, 0.014, 0.5 * weight, random.Between(0.0, 1.0));
}

void WoodStrike(Buffer& x, std::size_t at, Random& random, double weight) {
    Buffer click = Burst(random, 0.0003, 0.005, 0.04);
    BandPass(click, random.Between(1800.0, 2400.0), 0.8);
    Mix(x, click, at, 0.8 * weight);
    const double board = random.Between(150.0, 190.0);
    const double ratios[] = {1.0, 2.31, 5.4, 8.7};
    const double decays[] = {0.045, 0.035, 0.02, 0.012};
    const double levels[] = {0.35, 0.3, 0.12, 0.06};
    for (int m = 0; m < 4; ++m)
        AddMode(x, at, board * ratios[m], board * ratios[m], 1.0, decays[m], levels[m] * weight,
                random.Between(0.0, kPi));
    AddMode(x, at, 95.0, 70.0, 0.01, 0.02, 0.4 * weight);
}

void GravelStrike(Buffer& x, std::size_t at, Random& random, double weight) {
    Buffer crunch = Grains(random, 0.16, random.Between(2500.0, 3500.0), 0.045, random.Between(3000.0, 4200.0), 0.7);
    Filter(crunch, BiQuad::kHighPass, 800.0);
    Mix(x, crunch, at, 6.0 * weight);
    Buffer coarse = Grains(random, 0.1, 700.0, 0.03, 1200.0, 1.2);
    Mix(x, coarse, at, 4.0 * weight);
    AddMode(x, at, 90.0, 65.0, 0.01, 0.018, 0.25 * weight);
}

void GrassStrike(Buffer& x, std::size_t at, Random& random, double weight) {
    Buffer swish = Burst(random, 0.012, random.Between(0.05, 0.07), 0.3);
    Filter(swish, BiQuad::kHighPass, 1500.0);
    Filter(swish, BiQuad::kLowPass, 7000.0);
    Mix(x, swish, at, 0.6 * weight);
    Buffer blades = Grains(random, 0.15, 900.0, 0.05, random.Between(4500.0, 6000.0), 1.0);
    Mix(x, blades, at + Samples(0.005), 2.0 * weight);
    AddMode(x, at, 70.0, 55.0, 0.015, 0.02, 0.3 * weight);
}

FoleyBank::Pad Footsteps(const char* name, void (*strike)(Buffer&, std::size_t, Random&, double), std::uint32_t seed) {
    return Takes(name, seed, [&](Random& random, double& peakDb) {
        Buffer x(Samples(0.5), 0.0f);
        const std::size_t heel = Samples(0.002);
        const std::size_t toe = heel + Samples(random.Between(0.07, 0.12));
        strike(x, heel, random, 1.0);
        strike(x, toe, random, random.Between(0.45, 0.65));
        peakDb = random.Between(-1.5, 0.0);
        return x;
    });
}

// --- cloth: friction of fabric against itself over one movement.

FoleyBank::Pad Cloth(std::uint32_t seed) {
    return Takes("Cloth Rustle", seed, [&](Random& random, double&) {
        const double length = random.Between(0.45, 0.7);
        Buffer hiss(Samples(length));
        // Slow irregular pressure of the movement: low-passed noise, rectified.
        Buffer pressure(hiss.size());
        for (float& p : pressure) p = static_cast<float>(random.Bipolar());
        Filter(pressure, BiQuad::kLowPass, 25.0);
        Filter(pressure, BiQuad::kLowPass, 25.0);
        for (std::size_t i = 0; i < hiss.size(); ++i) {
            const double t = i / static_cast<double>(hiss.size());
            const double gesture = std::pow(std::sin(kPi * t), 1.5);
            const double wobble = 0.4 + 12.0 * std::fabs(pressure[i]);
            hiss[i] = static_cast<float>(random.Bipolar() * gesture * wobble);
        }
        Filter(hiss, BiQuad::kHighPass, 900.0);
        Filter(hiss, BiQuad::kLowPass, random.Between(6000.0, 8000.0));
        BandPass(hiss, random.Between(2500.0, 3500.0), 0.6);
        Buffer fibres = Grains(random, length, 600.0, length, 5000.0, 1.5);
        for (std::size_t i = 0; i < fibres.size(); ++i)
            fibres[i] *= static_cast<float>(std::sin(kPi * i / static_cast<double>(fibres.size())));
        Mix(hiss, fibres, 0, 1.5);
        return hiss;
    });
}

// --- door.

// Stick-slip of a hinge: an irregular train of pulses, its rate swept by
// the door's speed, ringing the panel's resonances.
FoleyBank::Pad DoorCreak(std::uint32_t seed) {
    return Takes("Door Creak", seed, [&](Random& random, double& peakDb) {
        const double length = random.Between(0.8, 1.2);
        const double low = random.Between(35.0, 50.0);
        const double high = random.Between(110.0, 160.0);
        Buffer pulses(Samples(length), 0.0f);
        double next = 0.0;
        while (next < length) {
            const double t = next / length;
            const double rate = low + (high - low) * std::sin(kPi * std::pow(t, 0.7));
            const double level = std::pow(std::sin(kPi * t), 0.6) * random.Between(0.6, 1.0);
            const std::size_t i = Samples(next);
            if (i < pulses.size()) pulses[i] += static_cast<float>(level);
            if (i + 1 < pulses.size()) pulses[i + 1] -= static_cast<float>(0.5 * level);
            next += (1.0 + 0.06 * random.Bipolar()) / rate;
        }
        // The panel's ring, struck again by every slip.
        const double panel = random.Between(0.9, 1.1);
        const double centres[] = {620.0, 1450.0, 2650.0, 4100.0};
        const double decays[] = {0.02, 0.012, 0.008, 0.005};
        const double gains[] = {1.0, 0.8, 0.5, 0.25};
        Buffer ring(Samples(0.12), 0.0f);
        for (int r = 0; r < 4; ++r) AddMode(ring, 0, centres[r] * panel, centres[r] * panel, 1.0, decays[r], gains[r]);
        Buffer body(pulses.size() + ring.size(), 0.0f);
        for (std::size_t i = 0; i < pulses.size(); ++i)
            if (pulses[i] != 0.0f)
                for (std::size_t k = 0; k < ring.size(); ++k) body[i + k] += pulses[i] * ring[k];
        Filter(body, BiQuad::kHighPass, 250.0);
        peakDb = -1.0;
        return body;
    });
}

void MetalClick(Buffer& x, std::size_t at, Random& random, double weight, double size) {
    Buffer tick = Burst(random, 0.0001, 0.0008, 0.01);
    Filter(tick, BiQuad::kHighPass, 1500.0);
    Mix(x, tick, at, weight);
    const double modes[] = {2100.0, 3650.0, 5300.0, 7900.0, 10400.0};
    for (int m = 0; m < 5; ++m)
        AddMode(x, at, modes[m] * size * random.Between(0.97, 1.03), modes[m] * size, 1.0,
                random.Between(0.012, 0.03) / (1.0 + 0.3 * m), 0.25 * weight / (1.0 + 0.5 * m), random.Between(0.0, kPi));
}

FoleyBank::Pad DoorLatch(std::uint32_t seed) {
    return Takes("Door Latch", seed, [&](Random& random, double&) {
        Buffer x(Samples(0.3), 0.0f);
        const double size = random.Between(0.9, 1.1);
        MetalClick(x, Samples(0.002), random, 0.5, size);
        MetalClick(x, Samples(random.Between(0.045, 0.075)), random, 1.0, size);
        AddMode(x, Samples(random.Between(0.045, 0.075)), 240.0, 200.0, 0.01, 0.02, 0.15);
        return x;
    });
}

FoleyBank::Pad DoorSlam(std::uint32_t seed) {
    return Takes("Door Slam", seed, [&](Random& random, double&) {
        Buffer x(Samples(1.2), 0.0f);
        const std::size_t hit = Samples(0.002);
        Buffer crack = Burst(random, 0.0005, 0.02, 0.15);
        Filter(crack, BiQuad::kLowPass, 3000.0);
        Mix(x, crack, hit, 0.9);
        // The frame and the air in the room take the blow.
        AddMode(x, hit, 75.0, 52.0, 0.03, random.Between(0.09, 0.13), 1.0);
        AddMode(x, hit, 120.0, 95.0, 0.02, 0.08, 0.5, 1.0);
        AddMode(x, hit, 230.0 * random.Between(0.95, 1.05), 225.0, 1.0, 0.15, 0.2, 0.3);
        AddMode(x, hit, 330.0 * random.Between(0.95, 1.05), 325.0, 1.0, 0.11, 0.12, 2.0);
        MetalClick(x, hit + Samples(random.Between(0.004, 0.008)), random, 0.5, random.Between(0.8, 0.95));
        Buffer room = Burst(random, 0.01, 0.18, 1.1);
        Filter(room, BiQuad::kLowPass, 700.0);
        Mix(x, room, hit, 0.25);
        return x;
    });
}

// --- impacts: a short excitation ringing the struck body's modes.

FoleyBank::Pad Impact(const char* name, const double* ratios, const double* decays, const double* levels, int count,
                      double lowest, double highest, double clickDecay, double clickHighPass, double beating,
                      double length, std::uint32_t seed) {
    return Takes(name, seed, [&](Random& random, double&) {
        Buffer x(Samples(length), 0.0f);
        Buffer click = Burst(random, 0.0001, clickDecay, 0.05);
        Filter(click, BiQuad::kHighPass, clickHighPass);
        Mix(x, click, 0, 0.6);
        const double f0 = random.Between(lowest, highest);
        for (int m = 0; m < count; ++m) {
            const double f = f0 * ratios[m] * (1.0 + 0.01 * random.Bipolar());
            if (f >= 0.45 * kRate) continue;
            const double level = levels[m] * random.Between(0.7, 1.0);
            AddMode(x, 0, f, f, 1.0, decays[m], level, random.Between(0.0, kPi));
            // A slightly detuned twin makes metal beat as real plates do.
            AddMode(x, 0, f * 1.0035, f * 1.0035, 1.0, decays[m], beating * level, 0.0);
        }
        return x;
    });
}

FoleyBank::Pad Thud(std::uint32_t seed) {
    return Takes("Impact Thud", seed, [&](Random& random, double&) {
        Buffer x(Samples(0.5), 0.0f);
        const double f = random.Between(55.0, 70.0);
        AddMode(x, 0, f * 1.5, f, 0.02, random.Between(0.05, 0.07), 1.0);
        Buffer body = Burst(random, 0.001, 0.03, 0.2);
        Filter(body, BiQuad::kLowPass, 400.0);
        Mix(x, body, 0, 1.5);
        Buffer slap = Burst(random, 0.0003, 0.005, 0.05);
        BandPass(slap, random.Between(900.0, 1300.0), 0.8);
        Mix(x, slap, 0, 0.3);
        return x;
    });
}

}  // namespace

std::vector<FoleyBank::Pad> FoleySynthesizer::MakePads() {
    // A wooden block's modes and a free metal bar's (inharmonic ratios).
    static const double kWoodRatios[] = {1.0, 2.57, 4.21, 6.53};
    static const double kWoodDecays[] = {0.05, 0.03, 0.018, 0.01};
    static const double kWoodLevels[] = {1.0, 0.5, 0.3, 0.15};
    static const double kMetalRatios[] = {1.0, 2.756, 5.404, 8.933, 13.34};
    static const double kMetalDecays[] = {1.4, 0.9, 0.6, 0.35, 0.2};
    static const double kMetalLevels[] = {1.0, 0.7, 0.45, 0.3, 0.15};
    std::vector<FoleyBank::Pad> pads;
    pads.push_back(Footsteps("Footstep Concrete", ConcreteStrike, 1));
    pads.push_back(Footsteps("Footstep Wood", WoodStrike, 2));
    pads.push_back(Footsteps("Footstep Gravel", GravelStrike, 3));
    pads.push_back(Footsteps("Footstep Grass", GrassStrike, 4));
    pads.push_back(Cloth(5));
    pads.push_back(DoorCreak(6));
    pads.push_back(DoorLatch(7));
    pads.push_back(DoorSlam(8));
    pads.push_back(Impact("Impact Wood", kWoodRatios, kWoodDecays, kWoodLevels, 4, 380.0, 520.0, 0.002, 1500.0, 0.0, 0.35,
                          9));
    pads.push_back(Impact("Impact Metal", kMetalRatios, kMetalDecays, kMetalLevels, 5, 420.0, 560.0, 0.0008, 3000.0,
                          0.3, 2.5, 10));
    pads.push_back(Thud(11));
    return pads;
}
