#include "ZenAudioIntelligence.h"

#include <QCoreApplication>
#include <algorithm>
#include <cctype>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <limits>

#include "AILevellerControlTemplate.h"
#include "AITemplateFactory.h"
#include "CacheEffect.h"
#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenAudioIntelligence::kDescriptor = {
    "AI", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'e', 'n', 'a'),
    2, 2, "ZenAudioIntelligence", 0, 1, -1, nullptr};

namespace {

using namespace zen::levelling;

// A chooser's default is a position 0..1 over its options; the option is
// the nearest: round(position x (options - 1)).
constexpr float ChooserDefault(float position, int options) {
    const float index = position * static_cast<float>(options - 1);
    return static_cast<float>(static_cast<int>(index + 0.5f));
}
constexpr float kLevelChooserPosition = 0.6f;  // "Studio Dialogue", "Normal"
constexpr float kWidthChooserPosition = 0.75f;  // "Wide"
constexpr int kChooserOptions = 4;

// "Max Gain Rate" -> "MAX_GAIN_RATE".
std::string IdentifierOf(const char* label) {
    std::string id;
    for (const char* p = label; *p != '\0'; ++p)
        id += std::isalnum(static_cast<unsigned char>(*p)) ? static_cast<char>(std::toupper(*p)) : '_';
    return id;
}

std::string Decimal(float value) {
    char text[32];
    std::snprintf(text, sizeof text, "%g", static_cast<double>(value));
    return text;
}

constexpr float kUnset = std::numeric_limits<float>::quiet_NaN();

// Applies nothing: lends a template its tables (the editor's list of controls).
class NoOwner final : public AITemplateOwner {
public:
    bool CallTemplateAction(const char*, const std::vector<std::string>&, std::string*) override { return false; }
    void SetEngineParameter(std::uint32_t, float) override {}
    void ForwardEngineParameter(std::uint32_t, float) override {}
};

}  // namespace

ZenAudioIntelligence::ZenAudioIntelligence() : m_sentEngine(kParameterCount, kUnset) {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenAudioIntelligence::Definitions() {
    using namespace zen;
#define ZA(text) QT_TRANSLATE_NOOP("ZenAudioIntelligence", text)
    static const ParameterTableDefinition table = [] {
        std::vector<ParameterDefinition> rows = {
            ListParameter("TEMPLATE", ZA("Template"),
                          {"AI_Dialog", "AI_Music", "AI_SFX", "AI_Ambience", "AI_VoiceOverRecording",
                           "AI_DialogAdvanced", "AI_LevelRider", "AI_Leveller", "AI_Master", "AI_DialogRider"},
                          0.0f),
            ListParameter("LEVELLING_MODE", ZA("Levelling Mode"),
                          {kLevellingModes[0], kLevellingModes[1], kLevellingModes[2], kLevellingModes[3]},
                          ChooserDefault(kLevelChooserPosition, kChooserOptions)),
            SwitchParameter("CLEANUP", ZA("Cleanup"), 0.0f),
            ContinuousParameter("CLEANUP_AMOUNT", ZA("CleanUpAmount"), 0.0f, 1.0f, 0.0f, 0.01f),
            SwitchParameter("ENHANCE", ZA("Enhance"), 0.0f),
            ContinuousParameter("ENHANCE_AMOUNT", ZA("EnhanceAmount"), 0.0f, 1.0f, 0.0f, 0.01f),
            ContinuousParameter("BAL_LEVEL", ZA("Balance Level"), -100.0f, 0.0f, -100.0f, 0.1f, "dB"),
            ListParameter("MUSIC_LEVEL", ZA("Music Level"), {"Quiet", "Background", "Normal", "Loud"},
                          ChooserDefault(kLevelChooserPosition, kChooserOptions)),
            SwitchParameter("NORMALIZED", ZA("Normalized"), 0.0f),
            SwitchParameter("DUCK_ON", ZA("Auto Duck"), 0.0f),
            ContinuousParameter("DUCK_AMOUNT", ZA("Duck Amount"), 0.0f, 20.0f, 6.0f, 0.1f, "dB"),
            SwitchParameter("BOOST_ON", ZA("Boost"), 0.0f),
            ContinuousParameter("BOOST_AMOUNT", ZA("Boost Amount"), 0.0f, 1000.0f, 0.0f, 1.0f),
            SwitchParameter("CRUNCH_ON", ZA("Crunch"), 0.0f),
            ContinuousParameter("CRUNCH_AMOUNT", ZA("Crunch Amount"), 0.0f, 1000.0f, 250.0f, 1.0f),
            SwitchParameter("REVERB_ON", ZA("Reverb"), 0.0f),
            ContinuousParameter("REVERB_SIZE", ZA("Reverb Size"), 0.0f, 1000.0f, 400.0f, 1.0f),
            ContinuousParameter("REVERB_AMOUNT", ZA("Reverb Amount"), 0.0f, 1000.0f, 245.0f, 1.0f),
            SwitchParameter("WIDTH_ON", ZA("Width Control"), 0.0f),
            ListParameter("WIDTH_SIZE", ZA("Width"), {"Narrow", "Natural", "Wide", "Extra Wide"},
                          ChooserDefault(kWidthChooserPosition, kChooserOptions)),
            ContinuousParameter("UI_RIDER_CURVE", ZA("Rider Curve"), 0.0f, 100.0f, 100.0f, 1.0f, "%"),
            ContinuousParameter("UI_LIFTER_CURVE", ZA("Lifter Curve"), 0.0f, 100.0f, 100.0f, 1.0f, "%"),
            ContinuousParameter("UI_GATE_CURVE", ZA("Gate Curve"), 0.0f, 100.0f, 0.0f, 1.0f, "%"),
        };
        for (const LevellerParameter& p : kLevellerParameters) {
            const std::string id = IdentifierOf(p.label);
            const float step = p.maximum - p.minimum >= 20.0f ? 1.0f : 0.1f;
            rows.push_back(p.isSwitch ? SwitchParameter(id.c_str(), p.label, p.defaultValue, p.unit)
                                      : ContinuousParameter(id.c_str(), p.label, p.minimum, p.maximum,
                                                            p.defaultValue, step, p.unit));
        }
        return MakeParameterTable("ZenAudioIntelligence", std::move(rows));
    }();
    return table;
}

const zen::MeterTableDefinition& ZenAudioIntelligence::Meters() {
    using namespace zen;
    static const MeterTableDefinition table = MakeMeterTable(
        "ZenAudioIntelligence",
        {
            ValueMeter("GAIN", ZA("Gain"), "dB", -30.0f, 30.0f),
            LevelMeter("OUTPUT_PEAK", ZA("Output Peak"), "dBFS", -60.0f, 6.0f).PerChannel(),
            ValueMeter("SPEECH_IN", ZA("Speech In"), "LUFS", kSpeechMeterFloor, 0.0f).AtRest(kSpeechMeterFloor),
            ValueMeter("SPEECH_OUT", ZA("Speech Out"), "LUFS", kSpeechMeterFloor, 0.0f).AtRest(kSpeechMeterFloor),
            RingMeter("GAIN_HISTORY", ZA("Gain History"), "", -1000.0f, 1000.0f, CacheEffect::kRecordWidth,
                      kHistoryCapacity),
        });
#undef ZA
    return table;
}

float ZenAudioIntelligence::TargetGain(std::int32_t tenths) noexcept {
    if (tenths < kMuteGain + 1) return 0.0f;
    return static_cast<float>(std::exp(static_cast<double>(tenths) * std::log(10.0) / 200.0));
}

std::vector<const char*> ZenAudioIntelligence::ControlsOf(int number) {
    NoOwner none;
    const auto t = ai_templates::Make(number, none);
    return t ? t->Controls() : std::vector<const char*>{};
}

int ZenAudioIntelligence::TemplateNumber() const {
    const zen::PluginDescriptor* d = GetDescriptor();
    if (d != nullptr && d->templateNumber >= 0) return d->templateNumber;
    return static_cast<int>(std::lround(GetParameter(kTemplate)));
}

void* ZenAudioIntelligence::QueryInterface(const char* interfaceName) {
    if (interfaceName != nullptr && std::strcmp(interfaceName, zen::BackgroundTask::kInterfaceName) == 0)
        return static_cast<zen::BackgroundTask*>(this);
    return ZenAudioPluginImpl::QueryInterface(interfaceName);
}

bool ZenAudioIntelligence::InitializePlugin() {
    const zen::PluginDescriptor* d = GetDescriptor();
    if (d == nullptr || d->templateNumber < 0) return true;
    // A template row starts as its template: the choice shown, and the
    // leveller's preset (levelling on) in the engine parameters.
    SetParameter(kTemplate, static_cast<float>(d->templateNumber));
    auto t = ai_templates::Make(d->templateNumber, *this);
    if (auto* leveller = dynamic_cast<AILevellerControlTemplate*>(t.get())) leveller->ApplyPreset();
    return true;
}

void ZenAudioIntelligence::UpdateProcessingParameter(std::uint32_t index, float value) {
    if (index < kEngineFirst) return;
    switch (index - kEngineFirst) {
        case kLevellingOnIndex: {
            const bool on = value > 0.5f;
            if (on && !m_levelling) m_meter.Reset();
            m_levelling = on;
            break;
        }
        case kApplyGainIndex: m_apply = value > 0.5f; break;
        case 7: m_meter.SetMode(static_cast<int>(std::lround(value))); break;  // "VAD Mode"
        case 8: m_meter.SetSpeechFraction(value); break;                         // "Speech Fraction"
        case 9: m_meter.SetSpeechFloor(value); break;                            // "Speech Floor"
        default: break;
    }
}

void ZenAudioIntelligence::PrepareProcessing(float sampleRate, std::uint32_t) {
    m_meter.Prepare(sampleRate);
    SetLatency(0);
}

void ZenAudioIntelligence::ResetProcessing() {
    m_meter.Reset();
    m_position = 0;
    m_gain[0] = m_gain[1] = 1.0f;
    m_lastReadEntry = -1;
    m_touched.store(0, std::memory_order_release);
}

void ZenAudioIntelligence::Measure(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    const float* left = channels[0];
    const float* right = channelCount > 1 ? channels[1] : nullptr;
    std::uint64_t position = m_position;
    for (std::uint32_t done = 0; done < frames;) {
        const std::uint64_t entry = position / kEntryFrames;
        const auto n = static_cast<std::uint32_t>(
            std::min<std::uint64_t>(frames - done, (entry + 1) * kEntryFrames - position));
        if (m_levelling) m_meter.Process(left + done, right != nullptr ? right + done : nullptr, n);
        done += n;
        position += n;
        if (position % kEntryFrames == 0) {
            const SpeechLoudnessMeter::Entry e =
                m_levelling ? m_meter.TakeEntry() : SpeechLoudnessMeter::Entry{kNoSpeech, 0};
            m_list.WriteMeasurement(entry, e.loudness, e.voicedPerMille);
            if (e.loudness != kNoSpeech) m_lastSpeech = e.loudness;
        }
    }
}

void ZenAudioIntelligence::ProcessBlock(float* const* channels, std::uint32_t channelCount,
                                        std::uint32_t frames) noexcept {
    const std::uint64_t entry = m_position / kEntryFrames;
    Measure(channels, channelCount, frames);

    EntryRecord record;
    const bool answered = m_list.ReadAnswer(entry, record);
    const bool applying = answered && m_levelling && m_apply && !IsBypassed();
    const float target = TargetGain(applying ? record.gain : 0);

    float largest = 0.0f, smallest = 0.0f;
    const std::uint32_t levelled = std::min<std::uint32_t>(channelCount, 2);
    for (std::uint32_t c = 0; c < levelled; ++c) {
        float g = m_gain[c];
        float* x = channels[c];
        for (std::uint32_t i = 0; i < frames; ++i) {
            x[i] *= g;
            largest = std::max(largest, x[i]);
            smallest = std::min(smallest, x[i]);
            if (i % kSmoothingInterval == 0) g = kSmoothingKeep * g + kSmoothingTake * target;
        }
        m_gain[c] = g;
    }
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        float peak = 0.0f;
        for (std::uint32_t i = 0; i < frames; ++i) peak = std::max(peak, std::fabs(channels[c][i]));
        PublishMeter(kOutputPeak, c, peak);
    }

    PublishMeter(kGainMeter, static_cast<float>(CacheEffect::GainTenths(m_gain[0])) / 10.0f);
    const float speechIn = answered ? static_cast<float>(record.input) / 10.0f : m_lastSpeech;
    const float speechOut = answered ? static_cast<float>(record.output) / 10.0f : kSpeechMeterFloor;
    PublishMeter(kSpeechIn, std::max(speechIn, kSpeechMeterFloor));
    PublishMeter(kSpeechOut, std::max(speechOut, kSpeechMeterFloor));
    const CacheEffect::Record r = CacheEffect::MakeRecord(m_gain[0], largest, smallest, answered ? record.speech : 0,
                                                          answered ? record.input : static_cast<std::int32_t>(kNoSpeech * 10));
    PushRing(kGainHistory, 0, r.data());

    if (static_cast<std::int64_t>(entry) != m_lastReadEntry) {
        m_lastReadEntry = static_cast<std::int64_t>(entry);
        m_readPosition.store(m_position / 4, std::memory_order_relaxed);
        m_readEntry.store(m_lastReadEntry, std::memory_order_release);
    }
    m_position += frames;
    m_touched.store((m_position + kEntryFrames - 1) / kEntryFrames, std::memory_order_release);
}

void ZenAudioIntelligence::RunBackgroundTask(bool inputEnded) {
    const int number = TemplateNumber();
    if (!m_template || number != m_templateNumber) {
        const bool first = !m_template;
        m_template = ai_templates::Make(number, *this);
        m_templateNumber = number;
        m_applied.assign(m_template ? m_template->Controls().size() : 0, kUnset);
        // A template chosen later brings its preset; the first one meets the
        // settings the session already has.
        if (!first)
            if (auto* leveller = dynamic_cast<AILevellerControlTemplate*>(m_template.get())) leveller->ApplyPreset();
    }
    if (m_template) {
        const auto& controls = m_template->Controls();
        for (std::size_t i = 0; i < controls.size(); ++i) {
            const std::int32_t index = FindParameter((std::string("ZenAudioIntelligence::") + controls[i]).c_str());
            if (index < 0) continue;
            const float value = GetParameter(static_cast<std::uint32_t>(index));
            if (value == m_applied[i]) continue;
            m_applied[i] = value;
            m_template->SetValue(i, value);
        }
    }

    const float mode = GetParameter(kLevellingMode);
    if (mode != m_sentMode) {
        m_sentMode = mode;
        CallEngine({"Mode", std::to_string(std::lround(mode))}, nullptr);
    }
    for (std::uint32_t i = 0; i < kParameterCount; ++i) {
        const float value = GetParameter(kEngineFirst + i);
        if (value == m_sentEngine[i]) continue;
        m_sentEngine[i] = value;
        if (m_template)
            m_template->SetLevellerParameter(i, value);
        else
            ForwardEngineParameter(i, value);
    }

    if (m_engineLevelling) {
        const auto engine = [this](const std::vector<std::string>& arguments, std::string& answer) {
            return CallEngine(arguments, &answer);
        };
        m_feed.Run(m_list, engine, inputEnded, m_touched.load(std::memory_order_acquire));
    }

    const std::int64_t read = m_readEntry.load(std::memory_order_acquire);
    if (read != m_tracedEntry && m_readTraces < kReadTraceLimit) {
        m_tracedEntry = read;
        ++m_readTraces;
        qCDebug(zen::aiTrace, "Reading from: %d (%d)", static_cast<int>(read),
                static_cast<int>(m_readPosition.load(std::memory_order_relaxed)));
    }
}

bool ZenAudioIntelligence::CallTemplateAction(const char* action, const std::vector<std::string>& arguments,
                                              std::string* result) {
    return CallHostAction(action, arguments, result);
}

void ZenAudioIntelligence::SetEngineParameter(std::uint32_t index, float value) {
    if (index < kParameterCount) SetParameter(kEngineFirst + index, value);
}

void ZenAudioIntelligence::ForwardEngineParameter(std::uint32_t index, float value) {
    if (index == kLevellingOnIndex) {
        const bool on = value > 0.5f;
        if (on && !m_engineLevelling) {
            // A new analysis: the answers of the last one no longer apply.
            m_list.ForgetAnswers();
            m_feed.Restart();
            CallEngine({"Reset"}, nullptr);
        }
        m_engineLevelling = on;
        return;
    }
    if (index == kApplyGainIndex || index >= kParameterCount) return;  // the audio thread's own switch
    CallEngine({std::to_string(index), Decimal(value)}, nullptr);
    m_feed.Refeed();
}

bool ZenAudioIntelligence::CallEngine(const std::vector<std::string>& arguments, std::string* answer) {
    std::string ignored;
    if (CallHostAction(kEngineAction, arguments, answer != nullptr ? answer : &ignored)) return true;
    qCDebug(zen::aiTrace, "%s %s refused", kEngineAction, arguments.empty() ? "" : arguments[0].c_str());
    return false;
}

template class ZenAudioPlugin<ZenAudioIntelligence>;

namespace {

// The levelling templates: registered by name and code with the factory of
// "AI", taking its state, version, channel limits, class name and flags.
bool RegisterLevellingTemplates() {
    static const zen::PluginDescriptor kRows[] = {
        {"Dialogue Leveller", 0.0, zen::kPluginStateTemplate, zen::MakePluginCode('Z', 'e', 'n', 'l'), 0, 0, nullptr,
         0, 1, 7, nullptr},
        {"Mix Assistant", 0.0, zen::kPluginStateTemplate, zen::MakePluginCode('Z', 'e', 'n', 'm'), 0, 0, nullptr, 0,
         1, 8, nullptr},
        {"Dialogue Leveler", 0.0, zen::kPluginStateTemplate, zen::MakePluginCode('Z', 'e', 'n', 'r'), 0, 0, nullptr,
         0, 12, 9, nullptr},
    };
    const zen::PluginDescriptor& ai = ZenAudioIntelligence::kDescriptor;
    for (zen::PluginDescriptor row : kRows) {
        row.state = ai.state;
        row.version = ai.version;
        row.inputChannelLimit = ai.inputChannelLimit;
        row.outputChannelLimit = ai.outputChannelLimit;
        row.className = ai.className;
        row.flags = ai.flags;
        zen::AudioPluginRegistry::Instance().Register(row, &ZenAudioPlugin<ZenAudioIntelligence>::Create);
    }
    return true;
}

const bool kTemplatesRegistered = RegisterLevellingTemplates();

}  // namespace
