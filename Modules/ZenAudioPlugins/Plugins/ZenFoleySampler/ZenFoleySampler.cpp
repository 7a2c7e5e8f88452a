#include "ZenFoleySampler.h"

#include <QCoreApplication>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QtDebug>
#include <algorithm>
#include <cmath>

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenFoleySampler::kDescriptor = {
    "Foley Sampler", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'n', 'f', 's'),
    0, 2, "ZenFoleySampler", 0, 0, -1, nullptr};

namespace {

const QString kFolderKey = QStringLiteral("folder");
const QString kSkippedKey = QStringLiteral("skipped");

}  // namespace

ZenFoleySampler::ZenFoleySampler() : m_active(std::make_unique<FoleyBank>()) {
    InitParameters(Definitions());
    InitMeters(Meters());
    m_longestSeconds.store(m_active->LongestSeconds());
}

ZenFoleySampler::~ZenFoleySampler() {
    delete m_pending.exchange(nullptr);
    delete m_retired.exchange(nullptr);
}

const zen::ParameterTableDefinition& ZenFoleySampler::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenFoleySampler",
        {
            ContinuousParameter("PAD", QT_TRANSLATE_NOOP("ZenFoleySampler", "Pad"), 1.0f, kMaxPads, 1.0f, 1.0f),
            ContinuousParameter("PITCH", QT_TRANSLATE_NOOP("ZenFoleySampler", "Pitch"), kMinPitchSemitones,
                                kMaxPitchSemitones, 0.0f, 0.1f, "st"),
            ContinuousParameter("GAIN", QT_TRANSLATE_NOOP("ZenFoleySampler", "Gain"), -60.0f, 12.0f, 0.0f, 0.1f,
                                "dB"),
            ContinuousParameter("VARIATION", QT_TRANSLATE_NOOP("ZenFoleySampler", "Variation"), 0.0f, 100.0f, 25.0f,
                                1.0f, "%"),
            ContinuousParameter("VOICES", QT_TRANSLATE_NOOP("ZenFoleySampler", "Voices"), 1.0f, kMaxVoices, 32.0f,
                                1.0f),
            SwitchParameter("TRIGGER", QT_TRANSLATE_NOOP("ZenFoleySampler", "Trigger"), 0.0f),
        });
    return table;
}

const zen::MeterTableDefinition& ZenFoleySampler::Meters() {
    using namespace zen;
    static const MeterTableDefinition table = MakeMeterTable(
        "ZenFoleySampler",
        {
            ValueMeter("ACTIVE_VOICES", QT_TRANSLATE_NOOP("ZenFoleySampler", "Active Voices"), "", 0.0f, kMaxVoices + kFadeSlots),
            ValueMeter("PADS", QT_TRANSLATE_NOOP("ZenFoleySampler", "Pads"), "", 0.0f, kMaxPads),
            LevelMeter("OUTPUT_PEAK", QT_TRANSLATE_NOOP("ZenFoleySampler", "Output Peak"), "dBFS", -60.0f, 6.0f)
                .PerChannel(),
        });
    return table;
}

std::string ZenFoleySampler::SaveState() const {
    const std::string base = ZenAudioPluginImpl::SaveState();
    QJsonObject root = QJsonDocument::fromJson(QByteArray::fromStdString(base)).object();
    std::lock_guard<std::mutex> lock(m_folderMutex);
    root.insert(kFolderKey, QString::fromStdString(m_folder));
    if (!m_skipped.empty()) {
        QJsonArray skipped;
        for (const std::string& entry : m_skipped) skipped.append(QString::fromStdString(entry));
        root.insert(kSkippedKey, skipped);
    }
    return QJsonDocument(root).toJson(QJsonDocument::Indented).toStdString();
}

bool ZenFoleySampler::LoadState(const std::string& state) {
    if (!ZenAudioPluginImpl::LoadState(state)) return false;
    // A state without a folder (a factory preset) keeps the current one.
    const QJsonValue folder = QJsonDocument::fromJson(QByteArray::fromStdString(state)).object().value(kFolderKey);
    if (!folder.isString()) return true;
    const std::string path = folder.toString().toStdString();
    {
        std::lock_guard<std::mutex> lock(m_folderMutex);
        if (path == m_folder) return true;
    }
    LoadFolder(path);
    return true;
}

void ZenFoleySampler::LoadFolder(const std::string& folder) {
    std::vector<std::string> skipped;
    std::unique_ptr<FoleyBank> bank =
        folder.empty() ? std::make_unique<FoleyBank>() : FoleyBank::WithFolder(folder, skipped);
    for (const std::string& entry : skipped) qWarning("Foley Sampler: skipped %s", entry.c_str());
    {
        std::lock_guard<std::mutex> lock(m_folderMutex);
        m_folder = folder;
        m_skipped = std::move(skipped);
    }
    Publish(std::move(bank));
}

void ZenFoleySampler::Publish(std::unique_ptr<FoleyBank> bank) {
    m_longestSeconds.store(std::max(m_longestSeconds.load(), bank->LongestSeconds()));
    delete m_retired.exchange(nullptr, std::memory_order_acq_rel);
    delete m_pending.exchange(bank.release(), std::memory_order_acq_rel);
}

void ZenFoleySampler::AdoptPendingBank() noexcept {
    // The replaced bank waits in m_retired; until a load frees it, keep the current one.
    if (m_retired.load(std::memory_order_acquire) != nullptr) return;
    FoleyBank* next = m_pending.exchange(nullptr, std::memory_order_acq_rel);
    if (next == nullptr) return;
    for (FoleyVoice& voice : m_voices) voice.Stop();
    m_retired.store(m_active.release(), std::memory_order_release);
    m_active.reset(next);
}

std::uint32_t ZenFoleySampler::GetTailLength() const {
    const double lowest = GetParameter(kPitch) - kVariationSemitones * GetParameter(kVariation) / 100.0;
    const double seconds = m_longestSeconds.load() * std::pow(2.0, -lowest / 12.0);
    return static_cast<std::uint32_t>(std::ceil(seconds * GetSampleRate())) + 1;
}

void ZenFoleySampler::UpdateProcessingParameter(std::uint32_t index, float value) {
    switch (index) {
        case kPad: m_pad = static_cast<std::uint32_t>(std::lround(value)); break;
        case kPitch: m_pitch = value; break;
        case kGain: m_gainDb = value; break;
        case kVariation: m_variation = value / 100.0; break;
        case kVoices: m_voiceLimit = static_cast<std::uint32_t>(std::clamp<long>(std::lround(value), 1, kMaxVoices)); break;
        case kTrigger: {
            const bool high = value >= 0.5f;
            if (high && !m_triggerHigh) m_triggerPending = true;
            m_triggerHigh = high;
            break;
        }
        default: break;
    }
}

void ZenFoleySampler::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    m_sampleRate = sampleRate;
    m_mono.assign(maxBlockSize, 0.0f);
    m_left.assign(maxBlockSize, 0.0f);
    m_right.assign(maxBlockSize, 0.0f);
    delete m_retired.exchange(nullptr);
    AdoptPendingBank();
    delete m_retired.exchange(nullptr);
    ResetProcessing();
    SetLatency(0);
}

void ZenFoleySampler::ResetProcessing() {
    for (FoleyVoice& voice : m_voices) voice.Stop();
    m_triggerPending = false;
    m_triggerCount = 0;
    m_random = 1;
}

double ZenFoleySampler::NextRandom() noexcept {
    m_random ^= m_random << 13;
    m_random ^= m_random >> 17;
    m_random ^= m_random << 5;
    return m_random * (2.0 / 4294967296.0) - 1.0;
}

FoleyVoice* ZenFoleySampler::FreeVoice() noexcept {
    // Hold the sounding voices under the limit, oldest first out.
    std::uint32_t sounding = 0;
    for (const FoleyVoice& voice : m_voices) sounding += voice.IsActive() && !voice.IsReleasing();
    const auto fadeFrames = static_cast<std::uint32_t>(std::lround(kStealFadeSeconds * m_sampleRate));
    while (sounding >= m_voiceLimit) {
        FoleyVoice* oldest = nullptr;
        for (FoleyVoice& voice : m_voices)
            if (voice.IsActive() && !voice.IsReleasing() && (oldest == nullptr || voice.Order() < oldest->Order()))
                oldest = &voice;
        oldest->Release(fadeFrames);
        --sounding;
    }
    FoleyVoice* oldestFading = nullptr;
    for (FoleyVoice& voice : m_voices) {
        if (!voice.IsActive()) return &voice;
        if (oldestFading == nullptr || voice.Order() < oldestFading->Order()) oldestFading = &voice;
    }
    // Every slot busy: at least kFadeSlots voices are fading; cut the oldest.
    oldestFading->Stop();
    return oldestFading;
}

void ZenFoleySampler::StartVoice(std::uint32_t padNumber) noexcept {
    const FoleyBank::Pad* pad = m_active->GetPad(padNumber);
    if (pad == nullptr) return;
    const double a = NextRandom(), b = NextRandom(), c = NextRandom();
    std::size_t take = 0;
    if (m_variation > 0.0) take = std::min(pad->takes.size() - 1, static_cast<std::size_t>((a + 1.0) * 0.5 * pad->takes.size()));
    const FoleySound& sound = pad->takes[take];
    const double semitones = m_pitch + m_variation * kVariationSemitones * b;
    const double db = m_gainDb + m_variation * kVariationDb * c;
    const double increment = sound.SampleRate() / m_sampleRate * std::pow(2.0, semitones / 12.0);
    FreeVoice()->Start(&sound, increment, static_cast<float>(std::pow(10.0, db / 20.0)), m_triggerCount++);
}

void ZenFoleySampler::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    AdoptPendingBank();
    if (m_triggerPending) {
        m_triggerPending = false;
        StartVoice(m_pad);
    }
    float* mono = m_mono.data();
    float* left = m_left.data();
    float* right = m_right.data();
    std::fill(mono, mono + frames, 0.0f);
    std::fill(left, left + frames, 0.0f);
    std::fill(right, right + frames, 0.0f);
    float sounding = 0.0f;
    for (FoleyVoice& voice : m_voices) {
        if (!voice.IsActive()) continue;
        voice.Render(mono, left, right, frames);
        sounding += voice.IsActive() ? 1.0f : 0.0f;
    }
    // A mono take goes to both outputs; stereo takes into one output are summed at half level.
    if (channelCount == 1) {
        for (std::uint32_t i = 0; i < frames; ++i) channels[0][i] = mono[i] + 0.5f * (left[i] + right[i]);
    } else if (channelCount >= 2) {
        for (std::uint32_t i = 0; i < frames; ++i) {
            channels[0][i] = left[i] + mono[i];
            channels[1][i] = right[i] + mono[i];
        }
        for (std::uint32_t c = 2; c < channelCount; ++c) std::fill(channels[c], channels[c] + frames, 0.0f);
    }
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        float peak = 0.0f;
        for (std::uint32_t i = 0; i < frames; ++i) peak = std::max(peak, std::fabs(channels[c][i]));
        PublishMeter(kOutputPeak, c, peak);
    }
    PublishMeter(kVoicesMeter, sounding);
    PublishMeter(kPadsMeter, static_cast<float>(m_active->PadCount()));
}

template class ZenAudioPlugin<ZenFoleySampler>;
