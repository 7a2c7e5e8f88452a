#include "zn_reverb.h"

#include <algorithm>
#include <cmath>
#include <cstring>

#include "Common/ZenAssert.h"

namespace zen::reverb {

namespace {

constexpr double kPi = 3.141592653589793;
constexpr std::uint32_t kFastRsqrtMagic = 0x5F3759DF;
constexpr std::uint32_t kLines = 15;
// Image sources as (nx, ny, nz); (-1, 0, 0) and (1, 1, 0) are left out on purpose.
constexpr int kImages[zn_reverb::kTaps][3] = {
    {1, 0, 0},  {0, 1, 0},  {0, -1, 0}, {0, 0, 1},  {0, 0, -1}, {1, -1, 0}, {-1, -1, 0}, {-1, 1, 0},
    {0, 1, 1},  {0, 1, -1}, {0, -1, 1}, {0, -1, -1}, {1, 0, 1}, {1, 0, -1}, {-1, 0, 1},  {-1, 0, -1},
};
// Safety net: every chain of steps settles in one pass.
constexpr int kMaxPasses = 4;

constexpr std::array<float, zn_reverb::kEntryCount> kDefaults = {
    12.430144f, 20.112396f, 4.0f, 250.0f, 1.618034f,  // room
    0.95f, 0.5f,                                      // decay
    4.0f, 0.2f, 0.1f,                                 // source
    0.0f, 2.0f,                                       // pre-delay, modulation
    0.5f, 1.0f, 1.0f, 1.0f,                           // mix
    300.0f, 1.0f, 0.3333333f, 10000.0f, 1.0f, 0.3333333f,
    300.0f, 1.0f, 0.3333333f, 10000.0f, 1.0f, 0.3333333f,
};

float ClampDimension(float v) { return std::min(std::max(v, zn_reverb::kMinDimension), zn_reverb::kMaxDimension); }

int StepIndex(zn_reverb::Step step) { return __builtin_ctz(static_cast<unsigned>(step)); }

}  // namespace

zn_reverb::zn_reverb(float sampleRate, std::uint32_t inputs, std::uint32_t outputs)
    : m_fs(sampleRate),
      m_inputs(inputs),
      m_outputs(outputs),
      m_record(kDefaults),
      m_param(inputs, outputs),
      m_routing(outputs, inputs, 0.0f),
      m_earlyMatrix(outputs, kTaps, 0.0f),
      m_lateMatrix(outputs, kLanes, 0.0f) {
    for (std::uint32_t o = 0; o < outputs; ++o) m_routing(o, o % inputs) = 1.0f;
    // The late field: every line on every channel, each channel with its own
    // rotation of the sign sequence (nearly orthogonal rows).
    for (std::uint32_t ch = 0; ch < outputs; ++ch)
        for (std::uint32_t k = 0; k < kLines; ++k) m_lateMatrix(ch, k) = kLateOutputGain * kSigns[(k + 2 * ch) % kLines];
}

bool zn_reverb::Set(std::uint32_t entry, float value) {
    if (entry >= kEntryCount || !std::isfinite(value)) return false;
    if (value == m_record[entry]) return true;  // nothing to recompute
    switch (entry) {
        case kRoomLength:
        case kRoomWidth:
        case kRoomHeight:
            if (!(value > kMinDimension)) return false;
            m_dirty |= kStepLaneLengths | kStepReflections;
            break;
        case kT60:
        case kHighDecayRatio:
            if (!(value > 0.0f)) return false;
            m_dirty |= kStepDecay;
            break;
        case kSourceDistance:
        case kSourceAzimuth:
        case kSourceElevation:
        case kPreDelay: m_dirty |= kStepReflections; break;
        case kModulation: m_dirty |= kStepModulation; break;
        case kBalance: m_dirty |= kStepDirectGain | kStepEarlyGain | kStepLateGain; break;
        case kDirectGain: m_dirty |= kStepDirectGain; break;
        case kEarlyGain: m_dirty |= kStepEarlyGain; break;
        case kLateGain: m_dirty |= kStepLateGain; break;
        case kRoomSize:
        case kRoomRatio: break;  // carried for the host; the steps read the dimensions
        default:
            if (entry >= kEq1LowFrequency) m_dirty |= kStepEq;
            break;
    }
    m_record[entry] = value;
    return true;
}

std::uint64_t zn_reverb::Runs(Step step) const { return m_runs[StepIndex(step)]; }

bool zn_reverb::Update() {
    static constexpr Step kOrder[] = {kStepLaneLengths, kStepDecay,     kStepReflections, kStepLateGain,
                                      kStepEarlyGain,   kStepDirectGain, kStepModulation, kStepEq};
    bool ran = false;
    for (int pass = 0; pass < kMaxPasses && m_dirty != 0; ++pass) {
        for (Step step : kOrder) {
            if ((m_dirty & step) == 0) continue;
            ++m_runs[StepIndex(step)];
            ran = true;
            switch (step) {
                case kStepLaneLengths: RunLaneLengths(); break;
                case kStepDecay: RunDecay(); break;
                case kStepReflections: RunReflections(); break;
                case kStepDirectGain: RunDirectGain(); break;
                case kStepEarlyGain: RunEarlyGain(); break;
                case kStepLateGain: RunLateGain(); break;
                case kStepModulation: RunModulation(); break;
                case kStepEq: RunEq(); break;
                default: break;
            }
        }
    }
    ZEN_ASSERT(m_dirty == 0, "m_dirty == 0");
    return ran;
}

float zn_reverb::FastInverseSqrt(float v) {
    std::uint32_t bits;
    std::memcpy(&bits, &v, sizeof bits);
    bits = kFastRsqrtMagic - (bits >> 1);
    float y;
    std::memcpy(&y, &bits, sizeof y);
    return y * (1.5f - 0.5f * v * y * y);
}

bool zn_reverb::RoomToLaneLengths(float length, float width, float height, float sampleRate, std::uint32_t* lengths) {
    const float L[3] = {ClampDimension(length), ClampDimension(width), ClampDimension(height)};
    if (L[0] <= kMinDimension || L[1] <= kMinDimension || L[2] <= kMinDimension) return false;
    float periods[26];
    int n = 0;
    for (int i = 0; i <= 2; ++i)
        for (int j = 0; j <= 2; ++j)
            for (int k = 0; k <= 2; ++k) {
                if (i == 0 && j == 0 && k == 0) continue;
                const float a = i / L[0], b = j / L[1], c = k / L[2];
                periods[n++] = 2.0f * FastInverseSqrt(a * a + b * b + c * c) / kSpeedOfSound;
            }
    std::partial_sort(periods, periods + kLines, periods + 26, [](float x, float y) { return x > y; });
    for (std::uint32_t lane = 0; lane < kLanes; ++lane)
        lengths[lane] = 2u * static_cast<std::uint32_t>(std::floor(periods[lane] * 0.5f * sampleRate)) + 1u;
    return true;
}

zn_reverb::Reflections zn_reverb::GeometryToReflections(const float* record, float fs) {
    const float L[3] = {ClampDimension(record[kRoomLength]), ClampDimension(record[kRoomWidth]),
                        ClampDimension(record[kRoomHeight])};
    const double d = std::max(record[kSourceDistance], kMinDistance);
    const double a = record[kSourceAzimuth] * kPi, e = record[kSourceElevation] * kPi;
    double source[3] = {std::cos(a) * d * std::cos(e), std::sin(a) * d * std::cos(e), std::sin(e) * d};
    for (int axis = 0; axis < 3; ++axis)
        source[axis] = std::clamp(source[axis], -double(kSourceBox) * L[axis], double(kSourceBox) * L[axis]);
    const double r0 = std::sqrt(source[0] * source[0] + source[1] * source[1] + source[2] * source[2]);

    double squared[kTaps];
    for (std::uint32_t t = 0; t < kTaps; ++t) {
        double sum = 0.0;
        for (int axis = 0; axis < 3; ++axis) {
            const int n = kImages[t][axis];
            const double c = n * double(L[axis]) + (n % 2 != 0 ? -source[axis] : source[axis]);
            sum += c * c;
        }
        squared[t] = sum;
    }
    std::sort(squared, squared + kTaps);

    Reflections out{};
    double delays[kTaps];
    for (std::uint32_t t = 0; t < kTaps; ++t) {
        const double r = std::sqrt(squared[t]);
        delays[t] = (fs / kSpeedOfSound) * std::max(r - r0, double(kMinPathBehindDirect));
        out.gains[t] = static_cast<float>(1.0 / (r + 1.0));
    }
    const double p = record[kPreDelay];
    if (p != 0.0) {  // a NaN counts as set
        const double add = std::fmax(p * fs, kMinPreDelayedTap - delays[0]);
        for (double& delay : delays) delay += add;
    }
    for (std::uint32_t t = 0; t < kTaps; ++t) {
        const double rounded = std::clamp(std::nearbyint(delays[t]), 1.0,
                                          double(zn_reflections_mod_param::DelayLines::MaxLength));
        out.delays[t] = static_cast<std::uint32_t>(rounded);
    }
    out.directDistance = static_cast<float>(r0);
    out.directGain = static_cast<float>(1.0 / (r0 + 1.0));
    return out;
}

void zn_reverb::ChannelGains(const float* tapGains, ublas::matrix<float>& matrix) {
    const auto channels = static_cast<std::uint32_t>(matrix.size1());
    if (channels == 1) {
        for (std::uint32_t k = 0; k < kTaps; ++k) matrix(0, k) = tapGains[k];
        return;
    }
    for (std::uint32_t ch = 0; ch < channels; ++ch) {
        std::uint32_t s = ch % kLines;
        for (std::uint32_t k = 0; k < kTaps; ++k) {
            matrix(ch, k) = tapGains[k] * kSigns[s];
            s = (s + channels) % kLines;
        }
    }
}

float zn_reverb::DirectMixGain(float b, float g) {
    if (b < 0.5f) return static_cast<float>(std::exp(2.0 * b * std::log(g + kLogFloor)));
    return (2.0f - 2.0f * b) * g;
}

float zn_reverb::EarlyMixGain(float b) {
    if (b > 0.5f) return static_cast<float>(std::exp((2.0 - 2.0 * b) * std::log(1.0)));
    return 2.0f * b;
}

float zn_reverb::LateMixGain(float b, float level) {
    if (b > 0.5f) return static_cast<float>(std::exp((2.0 - 2.0 * b) * std::log(level + kLogFloor)));
    return 2.0f * b * level;
}

void zn_reverb::RunLaneLengths() {
    std::uint32_t lengths[kLanes];
    if (!RoomToLaneLengths(m_record[kRoomLength], m_record[kRoomWidth], m_record[kRoomHeight], m_fs, lengths))
        return;  // the bit stays: the record must never hold such a room
    for (std::uint32_t i = 0; i < kLanes; ++i) {
        m_param.tail.core.lengths(i) = lengths[i];
        m_tau[i] = static_cast<float>(lengths[i] / double(m_fs));
    }
    m_dirty &= ~kStepLaneLengths;
    m_dirty |= kStepDecay | kStepReflections;
}

void zn_reverb::RunDecay() {
    const double t60 = m_record[kT60];
    const double alpha = std::min(1.0, double(m_record[kHighDecayRatio]));
    double sumTau = 0.0;
    for (std::uint32_t i = 0; i < kLanes; ++i) {
        const double g = std::pow(10.0, -3.0 * m_tau[i] / t60);
        const double b = std::pow(g, 1.0 / alpha - 1.0);
        const double c = std::clamp((b - 1.0) / (b + 1.0), double(kDampingLimit), 0.0);
        m_param.tail.core.gains(i) = static_cast<float>(g);
        m_param.tail.core.coefficients(i) = static_cast<float>(c);
        sumTau += m_tau[i];
    }
    m_lateLevel = static_cast<float>(std::sqrt(sumTau / t60));
    const float tone = static_cast<float>(std::clamp((1.0 - alpha) / (1.0 + alpha), 0.0, 1.0));
    for (std::uint32_t ch = 0; ch < m_outputs; ++ch) m_param.tail.out.tone(ch) = tone;
    m_dirty &= ~kStepDecay;
    m_dirty |= kStepLateGain;
}

void zn_reverb::RunReflections() {
    const Reflections r = GeometryToReflections(m_record.data(), m_fs);
    for (std::uint32_t t = 0; t < kTaps; ++t) m_param.reflections.delays(t) = r.delays[t];
    ChannelGains(r.gains, m_earlyMatrix);
    m_directDistanceGain = r.directGain;
    m_dirty &= ~kStepReflections;
    m_dirty |= kStepDirectGain | kStepEarlyGain;
}

void zn_reverb::RunDirectGain() {
    m_directMix = DirectMixGain(m_record[kBalance], m_directDistanceGain) * m_record[kDirectGain];
    for (std::uint32_t o = 0; o < m_outputs; ++o)
        for (std::uint32_t i = 0; i < m_inputs; ++i) m_param.direct.gains(o, i) = m_routing(o, i) * m_directMix;
    m_dirty &= ~kStepDirectGain;
}

void zn_reverb::RunEarlyGain() {
    m_earlyMix = EarlyMixGain(m_record[kBalance]) * m_record[kEarlyGain];
    for (std::uint32_t o = 0; o < m_outputs; ++o)
        for (std::uint32_t k = 0; k < kTaps; ++k) m_param.early.gains(o, k) = m_earlyMatrix(o, k) * m_earlyMix;
    m_dirty &= ~kStepEarlyGain;
}

void zn_reverb::RunLateGain() {
    m_lateMix = LateMixGain(m_record[kBalance], m_lateLevel) * m_record[kLateGain];
    for (std::uint32_t o = 0; o < m_outputs; ++o)
        for (std::uint32_t k = 0; k < kLanes; ++k) m_param.tail.out.gains(o, k) = m_lateMatrix(o, k) * m_lateMix;
    m_dirty &= ~kStepLateGain;
}

void zn_reverb::RunModulation() {
    const float amount = m_record[kModulation];
    for (std::uint32_t k = 0; k < kTaps; ++k) {
        const float depth = kDepthPerModulation * amount * static_cast<float>(k + kFirstDepthMultiplier);
        m_param.reflections.depths(k) = std::max(0.0f, std::min(depth, zn_reflections_mod_param::DelayLines::MaxDepth));
    }
    m_dirty &= ~kStepModulation;
}

void zn_reverb::RunEq() {
    auto band = [&](std::uint32_t first) {
        return zn_eq_param::Band{m_record[first], m_record[first + 1], m_record[first + 2]};
    };
    m_param.earlyEq.low = band(kEq1LowFrequency);
    m_param.earlyEq.high = band(kEq1HighFrequency);
    m_param.lateEq.low = band(kEq2LowFrequency);
    m_param.lateEq.high = band(kEq2HighFrequency);
    m_dirty &= ~kStepEq;
}

}  // namespace zen::reverb
