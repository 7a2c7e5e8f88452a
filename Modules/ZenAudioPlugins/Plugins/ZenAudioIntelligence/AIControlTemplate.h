// A control template of the "AI" plug-in: a handful of high-level controls
// (parameters of the plug-in, by identifier) and, per control, the list of
// target parameters it drives, each as control x scale + offset. Targets are
// other plug-ins of the channel, named "zen:" and their key, or the plug-in's
// own levelling engine (kEngine). A target plug-in the channel lacks is
// loaded through the host and given the template's defaults for it first.
//
// Templates run on the plug-in's background thread only (host actions
// allocate and may block).
#pragma once

#include <QLoggingCategory>
#include <cstdint>
#include <map>
#include <string>
#include <vector>

namespace zen {
// "Setting", "Action", "Reading from", "RD/WR" traces: QT_LOGGING_RULES="zen.ai.debug=true".
Q_DECLARE_LOGGING_CATEGORY(aiTrace)
}  // namespace zen

// What a template needs of the plug-in that runs it.
class AITemplateOwner {
public:
    // A host action; false when the host refused it or offers none.
    virtual bool CallTemplateAction(const char* action, const std::vector<std::string>& arguments,
                                    std::string* result) = 0;
    // Sets the plug-in's own levelling-engine parameter `index` (0..37).
    virtual void SetEngineParameter(std::uint32_t index, float value) = 0;
    // The plug-in's engine handler: "Levelling", "Apply Gain List", or the engine.
    virtual void ForwardEngineParameter(std::uint32_t index, float value) = 0;

protected:
    ~AITemplateOwner() = default;
};

class AIControlTemplate {
public:
    static constexpr const char* kDialogueProcessor = "zen:Dialogue Processor:1516596836";
    static constexpr const char* kLimiter = "zen:Limiter:1517177970";
    static constexpr const char* kReverb = "zen:Reverb:1517179490";
    static constexpr const char* kDistortion = "zen:Distortion:1516596851";
    static constexpr const char* kStereoWidth = "zen:Stereo Width:1516596851";
    // Target of mappings to the plug-in's own levelling engine; the parameter
    // is the engine parameter's label.
    static constexpr const char* kEngine = "engine";
    // The host's bypass of any plug-in: nonzero bypasses.
    static constexpr const char* kInternalBypass = "Internal Bypass";

    struct Mapping {
        const char* target;
        const char* parameter;
        float scale;
        float offset;
        float Apply(float control) const { return control * scale + offset; }
    };
    struct TargetDefault {
        const char* target;
        const char* parameter;
        float value;
    };

    AIControlTemplate(AITemplateOwner& owner, const char* name, std::vector<const char*> controls);
    virtual ~AIControlTemplate() = default;
    AIControlTemplate(const AIControlTemplate&) = delete;
    AIControlTemplate& operator=(const AIControlTemplate&) = delete;

    const char* Name() const { return m_name; }
    // The controls, as the plug-in's parameter names ("CLEANUP"), in order:
    // what the editor shows for this template.
    const std::vector<const char*>& Controls() const { return m_controls; }
    const std::vector<TargetDefault>& Defaults() const { return m_defaults; }
    const std::vector<Mapping>& MappingsOf(std::size_t control) const;
    float Value(std::size_t control) const { return m_values.at(control); }

    // Stores the control's value and applies its mappings in order.
    virtual void SetValue(std::size_t control, float value);
    // "Apply": every control's mappings again. Unknown actions are traced only.
    virtual void RunAction(const std::string& action);
    // A levelling-engine parameter changed on the plug-in.
    virtual void SetLevellerParameter(std::uint32_t index, float value);

    // Index of the levelling-engine parameter with this label; -1 if none.
    static int EngineIndex(const char* label);
    // What "SetIntParameter" carries: value x 10 toward zero.
    static long long ToInteger(float value);

    // Building the tables (constructors of the templates).
    void AddDefault(const char* target, const char* parameter, float value);
    void AddMapping(std::size_t control, const char* target, const char* parameter, float scale, float offset);

protected:
    AITemplateOwner& Owner() { return m_owner; }

private:
    // The target's slot in the channel, loading it with its defaults when
    // missing; empty when the host cannot tell or load.
    std::string FindOrLoad(const char* target);
    void Send(const std::string& slot, const char* parameter, float value);

    AITemplateOwner& m_owner;
    const char* m_name;
    std::vector<const char*> m_controls;
    std::vector<float> m_values;
    std::vector<TargetDefault> m_defaults;
    std::map<std::size_t, std::vector<Mapping>> m_mappings;
};
