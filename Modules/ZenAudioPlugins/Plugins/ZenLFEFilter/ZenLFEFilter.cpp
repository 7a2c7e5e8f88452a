#include "ZenLFEFilter.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/Algorithms/SpeakerLayout.h"
#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenLFEFilter::kDescriptor = {
    "LFE Filter", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'n', 'L', 'F'),
    32, 32, "ZenLFEFilter", 0, 0, -1, nullptr};

namespace {

constexpr double kPi = 3.141592653589793;
// Immersive layouts keep the 5.1 bed first: L R C LFE ...
constexpr std::uint32_t kImmersiveLayouts[] = {10, 12, 16};
constexpr int kBedLfe = 3;

// Q of the sections of a Butterworth low-pass of even order n.
std::array<double, ZenLFEFilter::kMaxSections> ButterworthQs(int order) {
    std::array<double, ZenLFEFilter::kMaxSections> q{};
    for (int k = 1; k <= order / 2; ++k) q[k - 1] = 1.0 / (2.0 * std::cos((2 * k - 1) * kPi / (2.0 * order)));
    return q;
}

}  // namespace

ZenLFEFilter::ZenLFEFilter() {
    InitParameters(Definitions());
    InitMeters(Meters());
    for (auto& section : m_sections) section = std::make_unique<BiQuad>();
}

const zen::ParameterTableDefinition& ZenLFEFilter::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenLFEFilter",
        {
            LogarithmicParameter("CUTOFF", QT_TRANSLATE_NOOP("ZenLFEFilter", "Cutoff"), 40.0f, 200.0f, 120.0f, 1.0f,
                                 "Hz")
                .SmoothedSingle(working::Identity),
            ListParameter("TYPE", QT_TRANSLATE_NOOP("ZenLFEFilter", "Type"),
                          {QT_TRANSLATE_NOOP("ZenLFEFilter", "Linkwitz-Riley"),
                           QT_TRANSLATE_NOOP("ZenLFEFilter", "Butterworth")},
                          0.0f),
            ListParameter("SLOPE", QT_TRANSLATE_NOOP("ZenLFEFilter", "Slope"),
                          {QT_TRANSLATE_NOOP("ZenLFEFilter", "24 dB/oct"), QT_TRANSLATE_NOOP("ZenLFEFilter", "48 dB/oct")},
                          0.0f),
            ListParameter("CHANNEL", QT_TRANSLATE_NOOP("ZenLFEFilter", "Channel"),
                          {QT_TRANSLATE_NOOP("ZenLFEFilter", "Auto"), QT_TRANSLATE_NOOP("ZenLFEFilter", "All"),
                           "1",  "2",  "3",  "4",  "5",  "6",  "7",  "8",  "9",  "10", "11",
                           "12", "13", "14", "15", "16", "17", "18", "19", "20", "21", "22",
                           "23", "24", "25", "26", "27", "28", "29", "30", "31", "32"},
                          0.0f),
        });
    return table;
}

const zen::MeterTableDefinition& ZenLFEFilter::Meters() {
    static const zen::MeterTableDefinition table = zen::MakeMeterTable(
        "ZenLFEFilter", {
                            zen::LevelMeter("LFE_PEAK", QT_TRANSLATE_NOOP("ZenLFEFilter", "LFE Peak"), "dBFS", -60.0f,
                                            6.0f),
                        });
    return table;
}

std::array<double, ZenLFEFilter::kMaxSections> ZenLFEFilter::SectionQs(Type type, Slope slope) {
    const int order = slope == k48dB ? 8 : 4;
    if (type == kButterworth) return ButterworthQs(order);
    // Linkwitz-Riley: the Butterworth of half the order, twice.
    std::array<double, kMaxSections> q = ButterworthQs(order / 2);
    const std::size_t half = static_cast<std::size_t>(order / 4);
    for (std::size_t k = 0; k < half; ++k) q[half + k] = q[k];
    return q;
}

int ZenLFEFilter::AutoChannel(std::uint32_t channels) {
    if (channels == 1) return 0;
    if (std::find(std::begin(kImmersiveLayouts), std::end(kImmersiveLayouts), channels) != std::end(kImmersiveLayouts))
        return kBedLfe;
    return zen::SpeakerLayout::DefaultLfe(channels);
}

std::uint32_t ZenLFEFilter::GetTailLength() const {
    const zen::ParameterTable& p = Parameters();
    const auto q = SectionQs(static_cast<Type>(std::lround(p[kType].GetValue())),
                             static_cast<Slope>(std::lround(p[kSlope].GetValue())));
    // Each section's poles decay at 2 pi f / (2 Q) per second; the sharpest rings longest.
    const double decay = 2.0 * kPi * p[kCutoff].GetValue() / (2.0 * *std::max_element(q.begin(), q.end()));
    return static_cast<std::uint32_t>(std::ceil(kTailNepers / decay * GetSampleRate()));
}

bool ZenLFEFilter::ApplyNeutralSetting() {
    ZenAudioPluginImpl::ApplyNeutralSetting();
    // Only a channel the layout does not have leaves every channel as it is.
    const std::uint32_t channels = GetProcessChannelCount();
    if (channels >= ZenAudioPluginImpl::kMaxChannels) return false;
    return SetParameter(kChannel, static_cast<float>(kFirstNumbered + ZenAudioPluginImpl::kMaxChannels - 1));
}

void ZenLFEFilter::Design() {
    const auto q = SectionQs(m_type, m_slope);
    for (std::size_t k = 0; k < kMaxSections; ++k) {
        BiQuad& section = *m_sections[k];
        section.SetParameter(BiQuad::kShape, static_cast<float>(BiQuad::kLowPass));
        section.SetParameter(BiQuad::kQ, static_cast<float>(q[k] > 0.0 ? q[k] : 1.0));
        section.SetParameter(BiQuad::kFreq, m_cutoff);
        section.SetParameter(BiQuad::kIn, q[k] > 0.0 ? 1.0f : 0.0f);
    }
}

void ZenLFEFilter::SetCutoff(float hertz) noexcept {
    if (hertz == m_cutoff) return;
    m_cutoff = hertz;
    for (auto& section : m_sections)
        if (section->IsEnabled()) section->SetParameter(BiQuad::kFreq, hertz);
}

void ZenLFEFilter::UpdateProcessingParameter(std::uint32_t index, float value) {
    switch (index) {
        case kType: m_type = static_cast<Type>(std::lround(value)); break;
        case kSlope: m_slope = static_cast<Slope>(std::lround(value)); break;
        case kChannel: {
            const int channel = static_cast<int>(std::lround(value));
            if (channel != m_channel)
                for (auto& section : m_sections) section->Reset();  // a channel joins from silence
            m_channel = channel;
            break;
        }
        default: break;
    }
    if (index == kType || index == kSlope) Design();
}

void ZenLFEFilter::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    for (auto& section : m_sections) {
        section->SetChannelCount(GetProcessChannelCount());
        section->Prepare(sampleRate, maxBlockSize);
    }
    m_cutoff = static_cast<float>(Smoothed(kCutoff)[0].current.load(std::memory_order_relaxed));
    Design();
    SetLatency(0);
    m_position = 0;
    ResetProcessing();
}

void ZenLFEFilter::ResetProcessing() {
    for (auto& section : m_sections) section->Reset();
}

bool ZenLFEFilter::Filters(std::uint32_t channel, std::uint32_t channelCount) const noexcept {
    if (m_channel == kAll) return true;
    if (m_channel == kAuto) return static_cast<int>(channel) == AutoChannel(channelCount);
    return static_cast<int>(channel) == m_channel - kFirstNumbered;
}

void ZenLFEFilter::Filter(float* const* channels, std::uint32_t channelCount, std::uint32_t offset,
                          std::uint32_t frames) noexcept {
    for (std::uint32_t c = 0; c < channelCount; ++c)
        if (Filters(c, channelCount))
            for (auto& section : m_sections)
                if (section->IsEnabled()) section->ProcessChannel(c, channels[c] + offset, frames);
}

void ZenLFEFilter::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    const zen::SmoothedValueGroup::Element& cutoff = Smoothed(kCutoff)[0];
    const double current = cutoff.current.load(std::memory_order_relaxed);
    const bool gliding = current != double{cutoff.target.load(std::memory_order_relaxed)};
    if (!gliding && static_cast<float>(current) == m_cutoff) {
        Filter(channels, channelCount, 0, frames);
        m_position += frames;
    } else {
        // Redesigned only at fixed sample positions, so the host's block size does not matter.
        auto glide = Smoothed(kCutoff).Track(0);
        for (std::uint32_t done = 0; done < frames;) {
            const auto n = static_cast<std::uint32_t>(
                std::min<std::uint64_t>(frames - done, kGlideStep - m_position % kGlideStep));
            const double value = gliding ? glide.Next() : current;
            if (gliding)
                for (std::uint32_t i = 1; i < n; ++i) glide.Next();
            if (m_position % kGlideStep == 0) SetCutoff(static_cast<float>(value));
            Filter(channels, channelCount, done, n);
            done += n;
            m_position += n;
        }
    }
    float peak = 0.0f;
    for (std::uint32_t c = 0; c < channelCount; ++c)
        if (Filters(c, channelCount))
            for (std::uint32_t i = 0; i < frames; ++i) peak = std::max(peak, std::fabs(channels[c][i]));
    PublishMeter(kLfePeak, peak);
}

template class ZenAudioPlugin<ZenLFEFilter>;
