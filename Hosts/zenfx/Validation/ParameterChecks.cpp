#include "ParameterChecks.h"

#include <cctype>
#include <cmath>
#include <limits>
#include <set>
#include <sstream>

namespace zenfx {

namespace {

std::string Number(float value) {
    std::ostringstream out;
    out << value;
    return out.str();
}

bool IsUpperName(const std::string& name) {
    if (name.empty()) return false;
    for (unsigned char c : name)
        if (!(std::isupper(c) || std::isdigit(c) || c == '_')) return false;
    return true;
}

}  // namespace

void ParameterChecks::Run() {
    m_context.Run("parameters.descriptions", [this] { return Descriptions(); });
    m_context.Run("parameters.set-get", [this] { return SetAndGet(); });
    m_context.Run("parameters.bad-index", [this] { return IndicesOutOfRange(); });
    m_context.Run("parameters.extremes", [this] { return ExtremesWhileProcessing(); });
    m_context.Run("parameters.state", [this] { return StateRoundTrip(); });
    m_context.Run("parameters.presets", [this] { return Presets(); });
}

std::string ParameterChecks::Name(std::uint32_t index) const {
    const auto& parameters = m_context.Parameters();
    const std::string label = index < parameters.size() ? parameters[index].label : "?";
    return "'" + label + "' (index " + std::to_string(index) + ")";
}

CheckOutcome ParameterChecks::Descriptions() {
    const auto& parameters = m_context.Parameters();
    auto plugin = m_context.NewInstance();
    const std::string prefix = std::string(plugin->Descriptor().className) + "::";
    std::set<std::string> identifiers, labels;
    for (std::uint32_t i = 0; i < parameters.size(); ++i) {
        const zen::ParameterInfo& p = parameters[i];
        const std::string name = Name(i);
        Require(p.identifier.compare(0, prefix.size(), prefix) == 0 && IsUpperName(p.identifier.substr(prefix.size())),
                name + " has the identifier '" + p.identifier + "', not " + prefix + "UPPER_NAME");
        Require(identifiers.insert(p.identifier).second, name + " repeats the identifier " + p.identifier);
        Require(!p.label.empty(), "parameter " + std::to_string(i) + " has no label");
        Require(labels.insert(p.label).second, name + " repeats a label");
        Require(std::isfinite(p.minimum) && std::isfinite(p.maximum) && p.minimum < p.maximum,
                name + " has the range " + Number(p.minimum) + " to " + Number(p.maximum));
        Require(p.defaultValue >= p.minimum && p.defaultValue <= p.maximum,
                name + " has the default " + Number(p.defaultValue) + " outside its range");
        Require(std::isfinite(p.step) && p.step >= 0.0f, name + " has the step " + Number(p.step));
        if (p.taper == zen::ParameterTaper::Logarithmic)
            Require(p.minimum >= 0.0f, name + " is logarithmic below 0");
        if (p.kind == zen::ParameterKind::Switch)
            Require(p.minimum == 0.0f && p.maximum == 1.0f, name + " is a switch but not 0 to 1");
        if (p.kind == zen::ParameterKind::List) {
            const float stride = p.step > 0.0f ? p.step : 1.0f;
            const long entries = std::lround((p.maximum - p.minimum) / stride) + 1;
            Require(static_cast<long>(p.choices.size()) == entries,
                    name + " is a list of " + std::to_string(entries) + " values with " +
                        std::to_string(p.choices.size()) + " captions");
        }
    }
    zen::ParameterInfo info;
    Require(!plugin->Audio().GetParameterInfo(static_cast<std::uint32_t>(parameters.size()), info),
            "GetParameterInfo answered true for the index past the last parameter");
    return Pass(std::to_string(parameters.size()) + " parameters: identifiers " + prefix +
                "NAME, unique labels, ranges holding their defaults, a caption for every list entry");
}

CheckOutcome ParameterChecks::SetAndGet() {
    const auto& parameters = m_context.Parameters();
    auto plugin = m_context.NewPrepared();
    AudioPlugin& audio = plugin->Audio();
    std::size_t checked = 0;
    for (std::uint32_t i = 0; i < parameters.size(); ++i) {
        const zen::ParameterInfo& p = parameters[i];
        std::vector<float> values = {p.minimum, p.maximum, p.defaultValue};
        for (int k = 0; k < m_context.Scaled(2); ++k) values.push_back(m_context.RandomValue(p));
        for (float value : values) {
            Require(audio.SetParameter(i, value), Name(i) + " refused the value " + Number(value));
            const float read = audio.GetParameter(i);
            Require(read == value, Name(i) + ": set to " + Number(value) + ", read back " + Number(read));
            ++checked;
        }
        // Outside the range: clamped; NaN: refused and nothing changes.
        const float span = p.maximum - p.minimum;
        const std::pair<float, float> clamps[] = {{p.maximum + span, p.maximum},
                                                  {p.minimum - span, p.minimum},
                                                  {std::numeric_limits<float>::infinity(), p.maximum},
                                                  {-std::numeric_limits<float>::infinity(), p.minimum}};
        for (const auto& [value, expected] : clamps) {
            Require(audio.SetParameter(i, value), Name(i) + " refused the out-of-range value " + Number(value));
            const float read = audio.GetParameter(i);
            Require(read == expected, Name(i) + ": set to " + Number(value) + ", read back " + Number(read) +
                                          " instead of the clamped " + Number(expected));
        }
        const float before = audio.GetParameter(i);
        Require(!audio.SetParameter(i, std::numeric_limits<float>::quiet_NaN()), Name(i) + " accepted NaN");
        Require(audio.GetParameter(i) == before, Name(i) + " changed when NaN was refused");
    }
    return Pass(std::to_string(checked) + " values read back as set (min, max, default, random); " +
                "out-of-range values clamped, NaN refused");
}

CheckOutcome ParameterChecks::IndicesOutOfRange() {
    auto plugin = m_context.NewInstance();
    AudioPlugin& audio = plugin->Audio();
    const std::uint32_t count = audio.GetParameterCount();
    Require(count == m_context.Parameters().size(), "the parameter count changed between instances");
    const std::vector<float> before = plugin->Values();
    for (std::uint32_t index : {count, count + 1, std::numeric_limits<std::uint32_t>::max()}) {
        Require(!audio.SetParameter(index, 0.5f), "SetParameter(" + std::to_string(index) + ") answered true");
        Require(audio.GetParameter(index) == 0.0f, "GetParameter(" + std::to_string(index) + ") is not 0");
    }
    Require(plugin->Values() == before, "a refused index changed a parameter's value");
    return Pass("indices " + std::to_string(count) + ", " + std::to_string(count + 1) +
                " and 2^32-1 refused with false, read as 0, nothing changed");
}

CheckOutcome ParameterChecks::ExtremesWhileProcessing() {
    const auto& parameters = m_context.Parameters();
    auto plugin = m_context.NewPrepared();
    AudioPlugin& audio = plugin->Audio();
    const std::uint32_t block = ValidationContext::kBlock;
    const std::uint32_t blocksPerValue = 2;
    std::size_t changes = 0;
    auto play = [&](const std::string& what) {
        const Planar input = signals::Noise(plugin->Width(), blocksPerValue * block, 1.0f, m_context.Random());
        RequireSane(plugin->Run(input, block), "full-scale noise with " + what);
    };
    for (std::uint32_t i = 0; i < parameters.size(); ++i) {
        const zen::ParameterInfo& p = parameters[i];
        std::vector<float> values = {p.minimum, p.maximum, p.defaultValue};
        for (int k = 0; k < m_context.Level(); ++k) values.push_back(m_context.RandomValue(p));
        for (float value : values) {
            Require(audio.SetParameter(i, value), Name(i) + " refused " + Number(value));
            ++changes;
            play(Name(i) + " changed to " + Number(value));
        }
    }
    std::vector<std::pair<std::string, std::vector<float>>> settings;
    std::vector<float> minima, maxima;
    for (const auto& p : parameters) {
        minima.push_back(p.minimum);
        maxima.push_back(p.maximum);
    }
    settings.push_back({"every parameter at its minimum", minima});
    settings.push_back({"every parameter at its maximum", maxima});
    for (int k = 0; k < m_context.Scaled(2); ++k) settings.push_back({"random setting " + std::to_string(k + 1), m_context.RandomSetting()});
    for (const auto& [name, values] : settings) {
        Require(plugin->SetAll(values), "a value of " + name + " was refused");
        changes += values.size();
        play(name);
    }
    return Pass(std::to_string(changes) + " changes between blocks (each parameter at min, max, default, random; " +
                "all at min, all at max, random settings): output finite and bounded");
}

CheckOutcome ParameterChecks::StateRoundTrip() {
    auto original = m_context.NewInstance();
    const std::vector<float> setting = m_context.RandomSetting();
    Require(original->SetAll(setting), "a parameter value was refused");
    const std::string state = original->Audio().SaveState();
    Require(!state.empty(), "SaveState returned nothing");

    auto restored = m_context.NewInstance();
    Require(restored->Audio().LoadState(state), "LoadState refused the text SaveState wrote");
    const std::vector<float> values = restored->Values();
    for (std::uint32_t i = 0; i < values.size(); ++i)
        Require(values[i] == setting[i], Name(i) + " restored as " + Number(values[i]) + ", saved as " + Number(setting[i]));

    // Both prepared after their values were set, so that settings read at
    // Prepare count too.
    Require(original->Prepare(ValidationContext::kSampleRate, ValidationContext::kMaxBlock) &&
                restored->Prepare(ValidationContext::kSampleRate, ValidationContext::kMaxBlock),
            "Prepare was refused");
    const Planar input = signals::Noise(original->Width(), 4 * ValidationContext::kBlock, ValidationContext::kTestLevel,
                                        m_context.Random());
    RequireMatch(restored->Run(input, ValidationContext::kBlock), original->Run(input, ValidationContext::kBlock),
                 "the restored instance's output differs from the original's");

    // Bypass is part of the state.
    original->Audio().SetBypass(true);
    auto bypassed = m_context.NewInstance();
    Require(bypassed->Audio().LoadState(original->Audio().SaveState()) && bypassed->Audio().IsBypassed(),
            "a saved bypass was not restored");

    // Malformed text is refused and changes nothing.
    const std::vector<float> before = restored->Values();
    for (const std::string& text : {std::string(), std::string("not a state"), state.substr(0, state.size() / 2)})
        Require(!restored->Audio().LoadState(text), "LoadState accepted malformed text");
    Require(restored->Values() == before, "malformed state text changed a value");
    return Pass("SaveState then LoadState restored all " + std::to_string(setting.size()) +
                " values, the bypass and the same output; malformed text refused");
}

CheckOutcome ParameterChecks::Presets() {
    auto plugin = m_context.NewInstance();
    AudioPlugin& audio = plugin->Audio();
    const std::vector<std::string> names = audio.GetPresetNames();
    if (names.empty()) return Skip("no factory presets");
    const auto& parameters = m_context.Parameters();
    Require(plugin->Prepare(ValidationContext::kSampleRate, ValidationContext::kBlock), "Prepare was refused");
    for (const std::string& name : names) {
        Require(audio.LoadPreset(name), "the preset '" + name + "' does not load");
        for (std::uint32_t i = 0; i < parameters.size(); ++i) {
            const float value = audio.GetParameter(i);
            Require(value >= parameters[i].minimum && value <= parameters[i].maximum,
                    "the preset '" + name + "' leaves " + Name(i) + " at " + Number(value));
        }
        RequireSane(plugin->Run(signals::Noise(plugin->Width(), 2 * ValidationContext::kBlock, 1.0f, m_context.Random()),
                                ValidationContext::kBlock),
                    "full-scale noise with the preset '" + name + "'");
    }
    Require(!audio.LoadPreset("no such preset \x01"), "an unknown preset name loaded");
    return Pass(std::to_string(names.size()) + " presets load within range and process; an unknown name is refused");
}

}  // namespace zenfx
