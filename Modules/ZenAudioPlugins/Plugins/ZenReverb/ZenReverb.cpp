#include "ZenReverb.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/Decibels.h"
#include "Common/ZenAudioPlugin.h"

using zen::reverb::zn_reverb;
using zen::reverb::zn_reverb_u15;

const zen::PluginDescriptor ZenReverb::kDescriptor = {
    "Reverb", 0.1, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'n', 'R', 'b'),
    8, 8, "ZenReverb", 0, 0, -1, nullptr};

namespace {

constexpr float kMaxRoomSize = ZenReverb::kMaxRoomLength * ZenReverb::kMaxRoomLength;
constexpr float kMinRatio = 0.01f;
constexpr float kMaxRatio = 100.0f;
// The fast reciprocal square root may lengthen a period by a little under 0.2 %.
constexpr double kLaneLengthMargin = 1.01;

}  // namespace

ZenReverb::ZenReverb() { InitParameters(Definitions()); }

ZenReverb::~ZenReverb() = default;

const zen::ParameterTableDefinition& ZenReverb::Definitions() {
#define ZR(text) QT_TRANSLATE_NOOP("ZenReverb", text)
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "ZenReverb",
        {
            zen::ContinuousParameter("ROOM_HEIGHT", ZR("Room Height"), kMinRoomDimension, kMaxRoomHeight, 4.0f, 0.01f, "m"),
            zen::ContinuousParameter("ROOM_LENGTH", ZR("Room Length"), kMinRoomDimension, kMaxRoomLength, 12.430144f, 0.01f, "m"),
            zen::ContinuousParameter("ROOM_WIDTH", ZR("Room Width"), kMinRoomDimension, kMaxRoomLength, 20.112396f, 0.01f, "m"),
            zen::LogarithmicParameter("ROOM_SIZE", ZR("Room Size"), 1.0f, kMaxRoomSize, 250.0f, 0.1f, "m²"),
            zen::LogarithmicParameter("ROOM_RATIO", ZR("Room Ratio"), kMinRatio, kMaxRatio, 1.618034f, 0.001f),
            zen::ContinuousParameter("PRE_DELAY", ZR("Pre-Delay"), 0.0f, 200.0f, 0.0f, 0.1f, "ms"),
            zen::LogarithmicParameter("T60", ZR("T@-60dB"), 0.1f, 20.0f, 0.95f, 0.01f, "s"),
            zen::ContinuousParameter("DISTANCE", ZR("Distance"), 0.1f, 50.0f, 4.0f, 0.01f, "m"),
            zen::ContinuousParameter("BRIGHTNESS", ZR("Brightness"), 10.0f, 100.0f, 50.0f, 0.1f, "%"),
            zen::ContinuousParameter("MODULATION", ZR("Modulation"), 0.0f, 10.0f, 2.0f, 0.01f),
            zen::LogarithmicParameter("EARLY_LOW_FREQ", ZR("Early Refl. Low Freq"), 20.0f, 2000.0f, 300.0f, 1.0f, "Hz"),
            zen::LogarithmicParameter("EARLY_HIGH_FREQ", ZR("Early Refl. High Freq"), 1000.0f, 20000.0f, 10000.0f, 1.0f, "Hz"),
            zen::ContinuousParameter("EARLY_LOW_GAIN", ZR("Early Refl. Low Gain"), -18.0f, 18.0f, 0.0f, 0.1f, "dB"),
            zen::ContinuousParameter("EARLY_HIGH_GAIN", ZR("Early Refl. High Gain"), -18.0f, 18.0f, 0.0f, 0.1f, "dB"),
            zen::LogarithmicParameter("LATE_LOW_FREQ", ZR("Late Rev. Low Freq"), 20.0f, 2000.0f, 300.0f, 1.0f, "Hz"),
            zen::LogarithmicParameter("LATE_HIGH_FREQ", ZR("Late Rev. High Freq"), 1000.0f, 20000.0f, 10000.0f, 1.0f, "Hz"),
            zen::ContinuousParameter("LATE_LOW_GAIN", ZR("Late Rev. Low Gain"), -18.0f, 18.0f, 0.0f, 0.1f, "dB"),
            zen::ContinuousParameter("LATE_HIGH_GAIN", ZR("Late Rev. High Gain"), -18.0f, 18.0f, 0.0f, 0.1f, "dB"),
            zen::ContinuousParameter("DRY_WET", ZR("Dry/Wet"), 0.0f, 100.0f, 50.0f, 0.1f, "%"),
            zen::ContinuousParameter("DIRECT_GAIN", ZR("Direct Gain"), -60.0f, 12.0f, 0.0f, 0.1f, "dB"),
            zen::ContinuousParameter("EARLY_GAIN", ZR("Early Refl. Gain"), -60.0f, 12.0f, 0.0f, 0.1f, "dB"),
            zen::ContinuousParameter("LATE_GAIN", ZR("Late Rev. Gain"), -60.0f, 12.0f, 0.0f, 0.1f, "dB"),
        },
        zen::HostScale::PerMille);  // template integers are places along the controls
#undef ZR
    return table;
}

std::uint32_t ZenReverb::RecordEntry(std::uint32_t parameter) {
    static const std::uint32_t kEntries[kParameterCount] = {
        zn_reverb::kRoomHeight,       zn_reverb::kRoomLength,        zn_reverb::kRoomWidth,
        zn_reverb::kRoomSize,         zn_reverb::kRoomRatio,         zn_reverb::kPreDelay,
        zn_reverb::kT60,              zn_reverb::kSourceDistance,    zn_reverb::kHighDecayRatio,
        zn_reverb::kModulation,       zn_reverb::kEq1LowFrequency,   zn_reverb::kEq1HighFrequency,
        zn_reverb::kEq1LowGain,       zn_reverb::kEq1HighGain,       zn_reverb::kEq2LowFrequency,
        zn_reverb::kEq2HighFrequency, zn_reverb::kEq2LowGain,        zn_reverb::kEq2HighGain,
        zn_reverb::kBalance,          zn_reverb::kDirectGain,        zn_reverb::kEarlyGain,
        zn_reverb::kLateGain,
    };
    return parameter < kParameterCount ? kEntries[parameter] : zn_reverb::kEntryCount;
}

float ZenReverb::ToRecord(std::uint32_t parameter, float value) {
    switch (parameter) {
        case kPreDelay: return value * 0.001f;  // ms -> s
        case kBrightness:
        case kDryWet: return value * 0.01f;     // % -> 0..1
        case kEarlyLowGain:
        case kEarlyHighGain:
        case kLateLowGain:
        case kLateHighGain:
        case kDirectGain:
        case kEarlyGain:
        case kLateGain: return zen::DbToGain(value);
        default: return value;
    }
}

void ZenReverb::UpdateProcessingParameter(std::uint32_t index, float value) {
    if (!m_engine) return;
    m_engine->Set(RecordEntry(index), ToRecord(index, value));
}

void ZenReverb::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    // A new rate rebuilds the engine and the processing object; the
    // parameters reach the new engine before the next block.
    const std::uint32_t channels = GetProcessChannelCount();
    const float engineRate = zn_reverb_u15::EngineRateFor(sampleRate);
    m_processor.reset();
    m_engine = std::make_unique<zn_reverb>(engineRate, channels, channels);
    auto processor = zn_reverb_u15::ForRate(sampleRate);
    const double longestPeriod = 2.0 * std::max(kMaxRoomLength, kMaxRoomHeight) / zn_reverb::kSpeedOfSound;
    const auto maxLane = static_cast<std::uint32_t>(longestPeriod * kLaneLengthMargin * engineRate) + 3;
    processor->Dimension(channels, channels, sampleRate, maxBlockSize, maxLane);
    m_processor = std::move(processor);
    SetLatency(0);
}

void ZenReverb::ProcessBlock(float* const* channels, std::uint32_t, std::uint32_t frames) noexcept {
    if (!m_processor) return;
    if (m_engine->Dirty() != 0) {
        m_engine->Update();
        m_processor->Configure(m_engine->Param());
    }
    m_processor->ProcessAnyLength(channels, frames);
}

std::uint32_t ZenReverb::GetTailLength() const {
    // Full-scale input can drive the tail above 0 dBFS; the late gain and
    // the late EQ's boosts lift it further before it decays 60 dB per T60.
    constexpr double kDecayDb = 100.0 + 30.0;
    constexpr double kEarlySeconds = 0.25;  // reflections of the largest room
    const zen::ParameterTable& p = Parameters();
    const double boostDb = std::max(0.0f, p[kLateGain].GetValue()) +
                           std::max({0.0f, p[kLateLowGain].GetValue(), p[kLateHighGain].GetValue()});
    const double seconds = p[kPreDelay].GetValue() / 1000.0 + kEarlySeconds +
                           p[kT60].GetValue() * (kDecayDb + boostDb) / 60.0;
    return static_cast<std::uint32_t>(std::ceil(seconds * GetSampleRate()));
}

bool ZenReverb::ApplyNeutralSetting() {
    return SetParameter(kDryWet, 0.0f) && SetParameter(kDirectGain, 0.0f);
}

void ZenReverb::ResetProcessing() {
    if (m_processor) m_processor->Reset();
}

template class ZenAudioPlugin<ZenReverb>;
