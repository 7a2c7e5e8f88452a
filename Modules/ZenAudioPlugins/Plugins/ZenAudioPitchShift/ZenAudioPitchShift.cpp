#include "ZenAudioPitchShift.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/ZenAssert.h"
#include "Common/ZenAudioPlugin.h"
#include "System/Trace.h"

const zen::PluginDescriptor ZenAudioPitchShift::kDescriptor = {
    "Pitch", 0.4, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'n', 'F', 'a'),
    8, 8, "ZenAudioPitchShift", 0, 0, -1, nullptr};

ZenAudioPitchShift::ZenAudioPitchShift()
    : m_param(std::make_unique<ora::pitchshift::EngineParam>(kFrameLength, kOverlap, kFftLength, kHistory)) {
    InitParameters(Definitions());
}

ZenAudioPitchShift::~ZenAudioPitchShift() { ZEN_ASSERT(m_pEngine == nullptr, "m_pEngine == nullptr"); }

const zen::ParameterTableDefinition& ZenAudioPitchShift::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "ZenAudioPitchShift",
        {
            zen::ContinuousParameter("COARSE", QT_TRANSLATE_NOOP("ZenAudioPitchShift", "Semitones"), -12.0f, 12.0f,
                                     0.0f, 1.0f),
            zen::ContinuousParameter("FINE", QT_TRANSLATE_NOOP("ZenAudioPitchShift", "Cents"), -100.0f, 100.0f, 0.0f,
                                     0.1f),
            zen::ContinuousParameter("DRY_WET", QT_TRANSLATE_NOOP("ZenAudioPitchShift", "Dry/Wet"), 0.0f, 100.0f,
                                     100.0f, 0.1f, "%"),
            zen::SwitchParameter("JOINT_ON", QT_TRANSLATE_NOOP("ZenAudioPitchShift", "Split/Joint"), 1.0f),
            zen::ListParameter("ALGO_TYPE", QT_TRANSLATE_NOOP("ZenAudioPitchShift", "Algorithm"), {"PLPV", "PGHI"},
                               1.0f),
            zen::ListParameter("ALGO_MODE", QT_TRANSLATE_NOOP("ZenAudioPitchShift", "Mode"), {"PG", "PV", "Auto"},
                               2.0f),
            zen::ContinuousParameter("LOG10_EPS_PEAK", QT_TRANSLATE_NOOP("ZenAudioPitchShift", "Log10Eps"), -7.0f,
                                     -1.0f, -4.0f, 0.1f),
            zen::ContinuousParameter("MAX_PEAK", QT_TRANSLATE_NOOP("ZenAudioPitchShift", "MaxPeak"), 10.0f, 100.0f,
                                     50.0f, 1.0f),
            zen::ContinuousParameter("LOG10_TOL", QT_TRANSLATE_NOOP("ZenAudioPitchShift", "Log10Tol"), -7.0f, -1.0f,
                                     -6.0f, 0.1f),
        });
    return table;
}

bool ZenAudioPitchShift::InitializePlugin() {
    ora::system::Trace("ZenAudioPitchShift::InitializePlugin()(0x%p)", static_cast<void*>(this));
    boost::unique_lock<boost::upgrade_mutex> lock(m_engineLock);
    try {
        m_inWork.assign(static_cast<std::size_t>(kDescriptor.inputChannelLimit) * kWorkFrames, 0.0f);
        m_outWork.assign(static_cast<std::size_t>(kDescriptor.outputChannelLimit) * kWorkFrames, 0.0f);
    } catch (const std::bad_alloc&) {
        return false;
    }
    return BuildEngine();
}

void ZenAudioPitchShift::ShutdownPlugin() {
    ora::system::Trace("ZenAudioPitchShift::ShutdownPlugin()(0x%p)", static_cast<void*>(this));
    boost::unique_lock<boost::upgrade_mutex> lock(m_engineLock);
    m_pEngine.reset();
    m_inWork.clear();
    m_outWork.clear();
}

bool ZenAudioPitchShift::HasEngine() const {
    boost::shared_lock<boost::upgrade_mutex> lock(m_engineLock);
    return m_pEngine != nullptr;
}

bool ZenAudioPitchShift::BuildEngine() {
    m_pEngine.reset();
    try {
        auto engine = std::make_unique<ora::pitchshift::Engine>(*m_param);
        if (!engine->Configure(GetProcessChannelCount())) return false;
        m_pEngine = std::move(engine);
    } catch (const std::exception&) {
        return false;
    }
    ApplyTuning();
    m_settle = true;
    return true;
}

void ZenAudioPitchShift::ApplyTuning() noexcept {
    m_pEngine->SetJoint(m_tuning.joint);
    m_pEngine->SetLog10Eps(m_tuning.log10Eps);
    m_pEngine->SetMaxPeak(m_tuning.maxPeak);
    m_pEngine->SetLog10Tol(m_tuning.log10Tol);
}

// Hosts probe layouts, so a mismatch is a plain refusal, not a programming error.
bool ZenAudioPitchShift::AcceptsChannelConfiguration(std::uint32_t inputs, std::uint32_t outputs) const {
    return inputs == outputs && inputs >= 1;
}

void ZenAudioPitchShift::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    boost::unique_lock<boost::upgrade_mutex> lock(m_engineLock);
    if (!m_pEngine || m_pEngine->Channels() != GetProcessChannelCount()) BuildEngine();
    if (m_pEngine) m_pEngine->Reset();
    m_settle = true;
    m_restart.store(true, std::memory_order_release);
    // The same latency with or without an engine: the bypass path keeps it.
    const std::size_t latency = ora::pitchshift::Engine::LatencyFor(*m_param);
    SetLatency(static_cast<std::uint32_t>(latency));
    // A restarted engine is warm after the latency and a frame more.
    m_warmUp = latency + kFrameLength;
    m_backlog.Allocate(GetProcessChannelCount(), m_warmUp + maxBlockSize);
    m_fadeStep = static_cast<float>(1.0 / std::max(1.0, kBypassFadeSeconds * sampleRate));
}

std::uint32_t ZenAudioPitchShift::GetTailLength() const {
    const zen::ParameterTable& p = Parameters();
    const double ratio = ora::pitchshift::Engine::Ratio(static_cast<std::int32_t>(std::lround(p[kCoarse].GetValue())),
                                                        p[kFine].GetValue());
    const double half = static_cast<double>(kFrameLength) / 2.0;
    return static_cast<std::uint32_t>(half + std::ceil(half / ratio));
}

bool ZenAudioPitchShift::ApplyNeutralSetting() {
    ZenAudioPluginImpl::ApplyNeutralSetting();
    return SetParameter(kDryWet, 0.0f);
}

void ZenAudioPitchShift::UpdateProcessingParameter(std::uint32_t index, float value) {
    switch (index) {
        case kCoarse: m_wanted.coarse = static_cast<std::int32_t>(std::lround(value)); break;
        case kFine: m_wanted.fine = value; break;
        case kDryWet: m_wanted.dryWet = value; break;
        case kJointOn: m_wantedTuning.joint = value >= 0.5f; break;
        case kAlgoType: m_wanted.algorithmType = static_cast<std::int32_t>(std::lround(value)); break;
        case kAlgoMode: m_wanted.algorithmMode = static_cast<std::int32_t>(std::lround(value)); break;
        case kLog10EpsPeak: m_wantedTuning.log10Eps = value; break;
        case kMaxPeak: m_wantedTuning.maxPeak = static_cast<int>(std::lround(value)); break;
        case kLog10Tol: m_wantedTuning.log10Tol = value; break;
        default: break;
    }
}

bool ZenAudioPitchShift::EngineReady(std::uint32_t channelCount) const noexcept {
    return m_pEngine && !m_inWork.empty() && !m_outWork.empty() && m_pEngine->Channels() == channelCount &&
           m_backlog.Capacity() > 0;
}

bool ZenAudioPitchShift::ApplyChanges(boost::upgrade_lock<boost::upgrade_mutex>& lock) noexcept {
    const bool tuning = m_wantedTuning != m_tuning;
    if (!m_settle && !m_forget && !tuning && m_pEngine->Pending() == 0 && m_pEngine->Changes(m_wanted) == 0)
        return true;

    boost::unique_lock<boost::upgrade_mutex> exclusive(std::move(lock), boost::try_to_lock);
    if (!exclusive.owns_lock()) return !m_settle && !m_forget;  // `lock` keeps the upgrade
    if (m_forget) {
        // Back to the construction values; what the host set differs and is applied below.
        m_pEngine->ForgetSettings();
        m_tuning.maxPeak = Tuning{}.maxPeak;
        m_tuning.log10Tol = Tuning{}.log10Tol;
        m_pEngine->SetMaxPeak(m_tuning.maxPeak);
        m_pEngine->SetLog10Tol(m_tuning.log10Tol);
        m_forget = false;
        m_settle = true;
    }
    m_pEngine->Apply(m_wanted, m_pEngine->Changes(m_wanted));
    if (m_tuning != m_wantedTuning) {
        m_tuning = m_wantedTuning;
        ApplyTuning();
    }
    if (m_settle) {
        m_pEngine->Reset();  // nothing was processed since the restart
        m_settle = false;
    }
    lock = boost::upgrade_lock<boost::upgrade_mutex>(std::move(exclusive));
    return true;
}

void ZenAudioPitchShift::RunEngine(float* const* io, std::uint32_t channelCount, std::size_t count,
                                   std::size_t keepFrom, bool fromBacklog) noexcept {
    float* in[kMaxChannels];
    float* out[kMaxChannels];
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        in[c] = m_inWork.data() + static_cast<std::size_t>(c) * kWorkFrames;
        out[c] = m_outWork.data() + static_cast<std::size_t>(c) * kWorkFrames;
    }
    for (std::size_t done = 0; done < count;) {
        const std::size_t n = std::min<std::size_t>(count - done, kWorkFrames);
        if (fromBacklog) {
            m_backlog.Pop(in, channelCount, n);
        } else {
            // Non-finite input becomes silence: one NaN would otherwise stay
            // in the spectra and the phases for good.
            for (std::uint32_t c = 0; c < channelCount; ++c)
                for (std::size_t i = 0; i < n; ++i) {
                    const float x = io[c][done + i];
                    in[c][i] = std::isfinite(x) ? x : 0.0f;
                }
        }
        m_pEngine->Process(in, out, n);
        const std::size_t from = std::max(done, keepFrom);
        if (from < done + n)
            for (std::uint32_t c = 0; c < channelCount; ++c)
                std::copy(out[c] + (from - done), out[c] + n, io[c] + (from - keepFrom));
        done += n;
    }
}

void ZenAudioPitchShift::PlayBypassPath(float* const* io, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    m_backlog.Push(io, channelCount, frames);
    for (std::uint32_t c = 0; c < channelCount; ++c)
        if (const float* delayed = BypassPath(c)) std::copy_n(delayed, frames, io[c]);
    m_pathMix = 1.0f;
}

void ZenAudioPitchShift::FadeIn(float* const* io, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    float mix = m_pathMix;
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        const float* delayed = BypassPath(c);
        if (delayed == nullptr) break;
        mix = m_pathMix;
        for (std::uint32_t i = 0; i < frames && mix > 0.0f; ++i) {
            mix = std::max(mix - m_fadeStep, 0.0f);
            io[c][i] += (delayed[i] - io[c][i]) * mix;
        }
    }
    m_pathMix = BypassPath(0) != nullptr ? mix : 0.0f;
}

void ZenAudioPitchShift::ProcessBlock(float* const* channels, std::uint32_t channelCount,
                                      std::uint32_t frames) noexcept {
    if (m_restart.exchange(false, std::memory_order_acq_rel)) {
        m_backlog.Clear();
        m_pathMix = 0.0f;
        m_forget = true;
    }
    boost::upgrade_lock<boost::upgrade_mutex> lock(m_engineLock, boost::try_to_lock);
    if (!lock.owns_lock() || !EngineReady(channelCount) || !ApplyChanges(lock)) {
        PlayBypassPath(channels, channelCount, frames);
        return;
    }

    if (m_backlog.Empty()) {
        RunEngine(channels, channelCount, frames, 0, false);
    } else {
        // The engine's stream goes on where it stopped; after a gap too long
        // to keep, it starts again from enough input to be warm by now.
        m_backlog.Push(channels, channelCount, frames);
        if (m_backlog.Overflowed()) {
            m_backlog.Keep(m_warmUp + frames);
            m_pEngine->Reset();
        }
        const std::size_t owed = m_backlog.Size();
        const std::size_t count = std::min<std::size_t>(owed, std::size_t{kCatchUpSpeed} * frames);
        if (count < owed) {
            RunEngine(channels, channelCount, count, count, true);
            for (std::uint32_t c = 0; c < channelCount; ++c)
                if (const float* delayed = BypassPath(c)) std::copy_n(delayed, frames, channels[c]);
            return;
        }
        RunEngine(channels, channelCount, count, count - frames, true);
    }
    if (m_pathMix > 0.0f) FadeIn(channels, channelCount, frames);
}

void ZenAudioPitchShift::ResetProcessing() {
    // Also called on the audio thread (bypass settling): the audio thread
    // restarts the engine at its next block, with the lock it has there.
    m_restart.store(true, std::memory_order_release);
}

template class ZenAudioPlugin<ZenAudioPitchShift>;
