#include "ZenStereoWidth.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenStereoWidth::kDescriptor = {
    "Stereo Width", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'e', 'n', 's'),
    2, 2, "ZenStereoWidth", 0, 0, -1, nullptr};

namespace {

constexpr double kPi = 3.141592653589793;

float PercentToFraction(float percent) { return percent * 0.01f; }

}  // namespace

ZenStereoWidth::ZenStereoWidth() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenStereoWidth::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenStereoWidth",
        {
            ContinuousParameter("WIDTH", QT_TRANSLATE_NOOP("ZenStereoWidth", "Width"), 0.0f, 200.0f, 100.0f, 1.0f,
                                "%")
                .SmoothedSingle(PercentToFraction),
            SwitchParameter("MONO_BASS", QT_TRANSLATE_NOOP("ZenStereoWidth", "Mono Bass"), 0.0f),
            LogarithmicParameter("MONO_BASS_FREQUENCY", QT_TRANSLATE_NOOP("ZenStereoWidth", "Mono Bass Below"), 40.0f,
                                 500.0f, 120.0f, 1.0f, "Hz"),
        },
        zen::HostScale::PerMille);  // template integers are places along the controls
    return table;
}

const zen::MeterTableDefinition& ZenStereoWidth::Meters() {
    using namespace zen;
    static const MeterTableDefinition table = MakeMeterTable(
        "ZenStereoWidth",
        {
            ValueMeter("CORRELATION", QT_TRANSLATE_NOOP("ZenStereoWidth", "Correlation"), "", -1.0f, 1.0f),
        });
    return table;
}

bool ZenStereoWidth::AcceptsChannelConfiguration(std::uint32_t inputs, std::uint32_t outputs) const {
    return inputs == 2 && outputs == 2;
}

std::uint32_t ZenStereoWidth::GetTailLength() const {
    const zen::ParameterTable& p = Parameters();
    if (p[kMonoBass].GetValue() < 0.5f) return 0;
    const double decay = 2.0 * kPi * p[kMonoBassFrequency].GetValue() * LinkwitzRileyCrossover::kButterworthQ;
    return static_cast<std::uint32_t>(std::ceil(kTailNepers / decay * GetSampleRate()));
}

bool ZenStereoWidth::ApplyNeutralSetting() {
    ZenAudioPluginImpl::ApplyNeutralSetting();
    SetParameter(kMonoBass, 0.0f);
    return SetParameter(kWidth, 100.0f);
}

void ZenStereoWidth::UpdateProcessingParameter(std::uint32_t index, float value) {
    if (index == kMonoBass) {
        const bool on = value >= 0.5f;
        if (on == m_monoBass) return;
        if (on && !m_fade.IsActive()) m_crossover.Reset();
        m_monoBass = on;
        // A switch back during a fade turns it around from where it is.
        if (m_fresh) m_fade.Finish();
        else m_fade.Restart();
    } else if (index == kMonoBassFrequency) {
        m_crossover.SetParameter(LinkwitzRileyCrossover::kFrequency1, value);
    }
}

void ZenStereoWidth::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    m_crossover.SetChannelCount(2);
    m_crossover.Prepare(sampleRate, maxBlockSize);
    m_crossover.SetParameter(LinkwitzRileyCrossover::kBands, 2.0f);
    m_correlation.SetChannelCount(2);
    m_correlation.Prepare(sampleRate, maxBlockSize);
    m_mid.assign(maxBlockSize, 0.0f);
    m_side.assign(maxBlockSize, 0.0f);
    m_width.assign(maxBlockSize, 0.0f);
    m_fadingLeft.assign(maxBlockSize, 0.0f);
    m_fadingRight.assign(maxBlockSize, 0.0f);
    m_fade.Prepare(sampleRate);
    m_fresh = true;
    SetLatency(0);
}

void ZenStereoWidth::ProcessBlock(float* const* channels, std::uint32_t, std::uint32_t frames) noexcept {
    m_fresh = false;
    float* left = channels[0];
    float* right = channels[1];
    auto smoothed = Smoothed(kWidth).Track(0);
    const bool settled = smoothed.IsSettled();
    float* width = m_width.data();
    if (settled) width[0] = static_cast<float>(smoothed.Value());
    else
        for (std::uint32_t i = 0; i < frames; ++i) width[i] = static_cast<float>(smoothed.Next());
    if (m_fade.IsActive()) {
        float* oldLeft = m_fadingLeft.data();
        float* oldRight = m_fadingRight.data();
        std::copy(left, left + frames, oldLeft);
        std::copy(right, right + frames, oldRight);
        if (m_monoBass) ProcessPlain(oldLeft, oldRight, width, settled, frames);
        else ProcessMonoBass(oldLeft, oldRight, width, settled, frames);
    }
    if (m_monoBass) ProcessMonoBass(left, right, width, settled, frames);
    else ProcessPlain(left, right, width, settled, frames);
    if (m_fade.IsActive()) {
        m_fade.Blend(m_fadingLeft.data(), left, frames);
        m_fade.Blend(m_fadingRight.data(), right, frames);
        m_fade.Advance(frames);
    }
    m_correlation.Process(channels, frames);
    PublishMeter(kCorrelation, static_cast<float>(m_correlation.Current().correlation));
}

void ZenStereoWidth::ProcessPlain(float* left, float* right, const float* width, bool settled,
                                  std::uint32_t frames) noexcept {
    if (settled) {
        const float w = width[0];
        if (w != 1.0f)
            for (std::uint32_t i = 0; i < frames; ++i) Widen(left[i], right[i], w);
    } else {
        for (std::uint32_t i = 0; i < frames; ++i) Widen(left[i], right[i], width[i]);
    }
}

void ZenStereoWidth::ProcessMonoBass(float* left, float* right, const float* width, bool settled,
                                     std::uint32_t frames) noexcept {
    float* mid = m_mid.data();
    float* side = m_side.data();
    m_toMidSide.Process(left, right, mid, side, frames);
    const float* const input[2] = {mid, side};
    m_crossover.Split(input, frames);
    const float* midLow = m_crossover.Band(0)[0];
    const float* midHigh = m_crossover.Band(1)[0];
    const float* sideHigh = m_crossover.Band(1)[1];
    for (std::uint32_t i = 0; i < frames; ++i) {
        mid[i] = midLow[i] + midHigh[i];
        side[i] = sideHigh[i] * width[settled ? 0 : i];
    }
    m_toLeftRight.Process(mid, side, left, right, frames);
}

void ZenStereoWidth::ResetProcessing() {
    m_crossover.Reset();
    m_fade.Finish();
    m_fresh = true;
    m_correlation.Reset();
}

template class ZenAudioPlugin<ZenStereoWidth>;
