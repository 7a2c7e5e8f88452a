#include "SpectrumAnalyzer.h"

#include <QCoreApplication>
#include <algorithm>
#include <cfloat>
#include <cmath>

#include "FFT/Window.h"

SpectrumAnalyzer::SpectrumAnalyzer() : ZenAudioAlgorithm(Definitions()) {
    for (std::uint64_t i = 0; i < GetParameterCount(); ++i) SetParameter(i, GetParameter(i));
}

const zen::ParameterTableDefinition& SpectrumAnalyzer::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "SpectrumAnalyzer",
        {
            zen::ListParameter("SIZE", QT_TRANSLATE_NOOP("SpectrumAnalyzer", "Size"),
                               {"1024", "2048", "4096", "8192", "16384", "32768"}, 2.0f),
            zen::ListParameter("WINDOW", QT_TRANSLATE_NOOP("SpectrumAnalyzer", "Window"),
                               {QT_TRANSLATE_NOOP("SpectrumAnalyzer", "Rectangular"),
                                QT_TRANSLATE_NOOP("SpectrumAnalyzer", "Hann"),
                                QT_TRANSLATE_NOOP("SpectrumAnalyzer", "Blackman-Harris"),
                                QT_TRANSLATE_NOOP("SpectrumAnalyzer", "Flat Top")},
                               2.0f),
            zen::ContinuousParameter("AVERAGE", QT_TRANSLATE_NOOP("SpectrumAnalyzer", "Average"), 0.0f, 10000.0f,
                                     300.0f, 1.0f, "ms"),
            zen::ContinuousParameter("DECAY", QT_TRANSLATE_NOOP("SpectrumAnalyzer", "Decay"), 0.0f, 120.0f, 10.0f,
                                     0.1f, "dB/s"),
            zen::ListParameter("MODE", QT_TRANSLATE_NOOP("SpectrumAnalyzer", "Mode"),
                               {QT_TRANSLATE_NOOP("SpectrumAnalyzer", "Per Channel"),
                                QT_TRANSLATE_NOOP("SpectrumAnalyzer", "Summed")},
                               0.0f),
        });
    return table;
}

bool SpectrumAnalyzer::Prepare(float sampleRate, std::uint32_t maxBlock) {
    const std::size_t channels = GetChannelCount();
    const std::size_t bins = MaxBins();
    m_prepared = false;
    m_preparedChannels = channels;
    if (m_ffts.empty())
        for (std::size_t i = 0; i < kSizes; ++i) m_ffts.push_back(std::make_unique<ora::fft::FFT>(kSmallestSize << i));
    m_history.Resize(std::max<std::size_t>(1, channels) * kLargestSize);
    m_shape.Resize(kLargestSize);
    m_frame.Resize(kLargestSize);
    m_bins.assign(bins, {});
    m_power.Resize(std::max<std::size_t>(1, channels) * bins);
    m_average.Resize(std::max<std::size_t>(1, channels) * bins);
    m_peak.Resize(std::max<std::size_t>(1, channels) * bins);
    m_bands.Resize(std::max<std::size_t>(1, channels) * zen::OctaveBands::kBands);
    m_prepared = true;
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);  // the defaults, configured
    Reset();
    return true;
}

bool SpectrumAnalyzer::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    switch (index) {
        case kSize:
            m_sizeIndex = std::min<std::size_t>(kSizes - 1, static_cast<std::size_t>(std::max(0.0f, value)));
            m_size = kSmallestSize << m_sizeIndex;
            break;
        case kWindow: m_window = static_cast<int>(value); break;
        case kAverage: m_averageMs = value; break;
        case kDecay: m_decayDbPerSecond = value; break;
        case kMode: m_mode = static_cast<int>(value); break;
        default: break;
    }
    Configure(index == kSize || index == kWindow || index == kMode);
    return true;
}

std::size_t SpectrumAnalyzer::Rows() const {
    return m_mode == kSummed ? 1 : static_cast<std::size_t>(GetChannelCount());
}

void SpectrumAnalyzer::Configure(bool reshaped) noexcept {
    const double frameSeconds = static_cast<double>(m_size / kFramesPerSize) / GetSampleRate();
    m_smoothing = m_averageMs > 0.0 ? static_cast<float>(std::exp(-frameSeconds * 1000.0 / m_averageMs)) : 0.0f;
    m_fall = static_cast<float>(std::pow(10.0, -m_decayDbPerSecond * frameSeconds / 10.0));
    if (!m_prepared || !reshaped) return;
    float* w = m_shape.data();
    switch (m_window) {
        case kRectangular: ora::fft::Window::Rectangular(w, m_size); break;
        case kHann: ora::fft::Window::Hann(w, m_size); break;
        case kFlatTop: ora::fft::Window::FlatTop(w, m_size); break;
        default: ora::fft::Window::BlackmanHarris(w, m_size); break;
    }
    double sum = 0.0, squares = 0.0;
    for (std::size_t n = 0; n < m_size; ++n) {
        sum += w[n];
        squares += static_cast<double>(w[n]) * w[n];
    }
    // A sine of amplitude A on a bin gives |X| = A * sum / 2.
    m_binScale = static_cast<float>(4.0 / (sum * sum));
    const double noiseBandwidth = static_cast<double>(m_size) * squares / (sum * sum);
    m_bandScale = static_cast<float>(1.0 / noiseBandwidth);
    m_octaves.Configure(GetSampleRate(), m_size);
    m_untilFrame = std::min(m_untilFrame, m_size / kFramesPerSize);
    // Other bins, another window or other rows: what was averaged no longer fits.
    m_average.Clear();
    m_peak.Clear();
    m_bands.Clear();
}

void SpectrumAnalyzer::Reset() {
    m_history.Clear();
    m_average.Clear();
    m_peak.Clear();
    m_bands.Clear();
    m_written = 0;
    m_untilFrame = m_size / kFramesPerSize;
    m_frames = 0;
}

bool SpectrumAnalyzer::Process(float* const* channels, std::uint64_t count) {
    const std::size_t channelCount = GetChannelCount();
    if (channelCount == 0) return true;
    if (!m_prepared || channelCount != m_preparedChannels) return false;
    const auto frames = static_cast<std::size_t>(count);
    for (std::size_t done = 0; done < frames;) {
        const std::size_t n = std::min(frames - done, m_untilFrame);
        for (std::size_t c = 0; c < channelCount; ++c) {
            float* history = m_history.data() + c * kLargestSize;
            const float* x = channels[c] + done;
            std::size_t at = m_written % kLargestSize;
            for (std::size_t i = 0; i < n; ++i) {
                history[at] = std::fabs(x[i]) <= FLT_MAX ? x[i] : 0.0f;
                if (++at == kLargestSize) at = 0;
            }
        }
        m_written += n;
        m_untilFrame -= n;
        done += n;
        if (m_untilFrame == 0) {
            Analyse();
            m_untilFrame = m_size / kFramesPerSize;
        }
    }
    return true;
}

void SpectrumAnalyzer::Analyse() noexcept {
    const std::size_t channelCount = GetChannelCount();
    const std::size_t bins = Bins();
    const std::size_t stride = MaxBins();
    const std::size_t rows = Rows();
    ora::fft::FFT& fft = *m_ffts[m_sizeIndex];
    const float* w = m_shape.data();
    float* frame = m_frame.data();
    std::fill(m_power.data(), m_power.data() + rows * stride, 0.0f);
    const float rowShare = m_mode == kSummed ? 1.0f / static_cast<float>(channelCount) : 1.0f;
    for (std::size_t c = 0; c < channelCount; ++c) {
        const float* history = m_history.data() + c * kLargestSize;
        std::size_t at = (m_written + kLargestSize - m_size) % kLargestSize;
        for (std::size_t n = 0; n < m_size; ++n) {
            frame[n] = history[at] * w[n];
            if (++at == kLargestSize) at = 0;
        }
        fft.ForwardReal(frame, m_bins.data());
        float* power = m_power.data() + (m_mode == kSummed ? 0 : c) * stride;
        for (std::size_t k = 0; k < bins; ++k) {
            // One-sided: the ends of the spectrum have no mirror image.
            const float scale = (k == 0 || k == bins - 1) ? m_binScale * 0.25f : m_binScale;
            power[k] += rowShare * scale * std::norm(m_bins[k]);
        }
    }
    const float keep = m_smoothing;
    for (std::size_t r = 0; r < rows; ++r) {
        const float* power = m_power.data() + r * stride;
        float* average = m_average.data() + r * stride;
        float* peak = m_peak.data() + r * stride;
        for (std::size_t k = 0; k < bins; ++k) {
            average[k] = keep * average[k] + (1.0f - keep) * power[k];
            peak[k] = std::max(average[k], peak[k] * m_fall);
        }
        m_octaves.Compute(average, m_bands.data() + r * zen::OctaveBands::kBands, m_bandScale);
    }
    ++m_frames;
}
