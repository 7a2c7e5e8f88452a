#include "ZenFrequency.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>
#include <iterator>

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenFrequency::kDescriptor = {
    "Frequency Analyzer", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'n', 'F', 'r'),
    8, 8, "ZenFrequency", 0, 0, -1, nullptr};

namespace {

// The SpectrumAnalyzer parameter each of ours drives, in our index order.
constexpr std::uint64_t kForwardedTo[] = {SpectrumAnalyzer::kSize, SpectrumAnalyzer::kWindow,
                                          SpectrumAnalyzer::kAverage, SpectrumAnalyzer::kDecay,
                                          SpectrumAnalyzer::kMode};

constexpr float kFloorPower = 1e-12f;  // -120 dB

}  // namespace

ZenFrequency::ZenFrequency() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenFrequency::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenFrequency",
        {
            ListParameter("SIZE", QT_TRANSLATE_NOOP("ZenFrequency", "Size"),
                          {"1024", "2048", "4096", "8192", "16384", "32768"}, 2.0f),
            ListParameter("WINDOW", QT_TRANSLATE_NOOP("ZenFrequency", "Window"),
                          {QT_TRANSLATE_NOOP("ZenFrequency", "Rectangular"), QT_TRANSLATE_NOOP("ZenFrequency", "Hann"),
                           QT_TRANSLATE_NOOP("ZenFrequency", "Blackman-Harris"),
                           QT_TRANSLATE_NOOP("ZenFrequency", "Flat Top")},
                          2.0f),
            ContinuousParameter("AVERAGE", QT_TRANSLATE_NOOP("ZenFrequency", "Average"), 0.0f, 10000.0f, 300.0f,
                                1.0f, "ms"),
            ContinuousParameter("DECAY", QT_TRANSLATE_NOOP("ZenFrequency", "Peak Decay"), 0.0f, 120.0f, 10.0f, 0.1f,
                                "dB/s"),
            ListParameter("MODE", QT_TRANSLATE_NOOP("ZenFrequency", "Channels"),
                          {QT_TRANSLATE_NOOP("ZenFrequency", "Each"), QT_TRANSLATE_NOOP("ZenFrequency", "Summed")},
                          0.0f),
        });
    return table;
}

const zen::MeterTableDefinition& ZenFrequency::Meters() {
    using namespace zen;
    static const MeterTableDefinition table = MakeMeterTable(
        "ZenFrequency",
        {
            ArrayMeter("BANDS", QT_TRANSLATE_NOOP("ZenFrequency", "Third-Octave Bands"), "dBFS", -90.0f, 6.0f,
                       OctaveBands::kBands)
                .PerChannel()
                .AtRest(kFloorDb),
            RingMeter("SPECTRUM", QT_TRANSLATE_NOOP("ZenFrequency", "Spectrum"), "", 0.0f, 1.0f, kRecordWidth,
                      kSpectrumRecords)
                .PerChannel(),
        });
    return table;
}

void ZenFrequency::UpdateProcessingParameter(std::uint32_t index, float value) {
    if (index >= std::size(kForwardedTo)) return;
    m_analyzer.SetParameter(kForwardedTo[index], value);
    // Other bins or other rows: what the editor holds no longer fits.
    if (index != kAverage && index != kDecay) ResetMeters();
    if (index == kSize) {
        std::fill(m_record.begin(), m_record.end(), 0.0f);
        ChooseRecordStep();
    }
}

void ZenFrequency::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    m_analyzer.SetChannelCount(GetProcessChannelCount());
    m_analyzer.Prepare(sampleRate, maxBlockSize);
    m_record.assign(kRecordWidth, 0.0f);
    ChooseRecordStep();
    SetLatency(0);
}

void ZenFrequency::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    // Cut at every frame so that each one reaches the editor, whatever the block size.
    for (std::uint32_t done = 0; done < frames;) {
        const auto n = static_cast<std::uint32_t>(std::min<std::size_t>(frames - done, m_analyzer.UntilFrame()));
        for (std::uint32_t c = 0; c < channelCount; ++c) m_chunk[c] = channels[c] + done;
        const std::uint64_t before = m_analyzer.Frames();
        m_analyzer.Process(m_chunk, n);
        done += n;
        if (m_analyzer.Frames() != before) PublishFrame();
    }
}

void ZenFrequency::ChooseRecordStep() noexcept {
    const double framesPerSecond =
        GetSampleRate() * static_cast<double>(SpectrumAnalyzer::kFramesPerSize) / static_cast<double>(m_analyzer.Size());
    m_recordStep = static_cast<std::uint64_t>(std::max(1.0, std::ceil(framesPerSecond / kMaxRecordsPerSecond)));
}

void ZenFrequency::PublishFrame() noexcept {
    const std::size_t bins = m_analyzer.Bins();
    const bool record = m_analyzer.Frames() % m_recordStep == 0;
    for (std::size_t row = 0; row < m_analyzer.Rows(); ++row) {
        const auto channel = static_cast<std::uint32_t>(row);
        if (record) {
            m_record[0] = static_cast<float>(bins);
            std::copy_n(m_analyzer.Spectrum(row), bins, m_record.data() + 1);
            std::copy_n(m_analyzer.PeakHold(row), bins, m_record.data() + 1 + bins);
            PushRing(kSpectrum, channel, m_record.data());
        }
        const float* bands = m_analyzer.Bands(row);
        for (std::size_t b = 0; b < zen::OctaveBands::kBands; ++b)
            m_bands[b] = 10.0f * std::log10(std::max(bands[b], kFloorPower));
        PublishArray(kBands, channel, m_bands);
    }
}

void ZenFrequency::ResetProcessing() { m_analyzer.Reset(); }

template class ZenAudioPlugin<ZenFrequency>;
