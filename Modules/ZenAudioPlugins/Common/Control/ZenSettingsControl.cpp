#include "ZenSettingsControl.h"

#include <algorithm>
#include <cctype>
#include <cmath>
#include <map>
#include <memory>

#include "HostCore/HostError.h"

namespace {

using zen::host::FieldType;

// "channel3.eq1Frequency" -> "CHANNEL3_EQ1_FREQUENCY"
std::string UpperName(const std::string& key) {
    std::string name;
    for (std::size_t i = 0; i < key.size(); ++i) {
        const char c = key[i];
        if (c == '.')
            name += '_';
        else if (std::isupper(static_cast<unsigned char>(c)) && i > 0 && key[i - 1] != '.')
            name += std::string("_") + c;
        else
            name += static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    }
    return name;
}

zen::ParameterDefinition Definition(const zen::host::FieldSchema& f, const std::string& name,
                                    const std::string& label) {
    if (f.type == FieldType::Choice) {
        zen::ParameterDefinition d =
            zen::ListParameter(name.c_str(), label.c_str(), {}, static_cast<float>(f.defaultValue));
        d.maximum = static_cast<float>(f.choices.size() - 1);
        for (const std::string& c : f.choices) d.choices << QString::fromStdString(c);
        return d;
    }
    const auto make = f.logarithmic ? &zen::LogarithmicParameter : &zen::ContinuousParameter;
    return make(name.c_str(), label.c_str(), static_cast<float>(f.minimum), static_cast<float>(f.maximum),
                static_cast<float>(f.defaultValue), static_cast<float>(f.step), f.unit.c_str());
}

}  // namespace

const ZenSettingsControl::Table& ZenSettingsControl::TableOf(const char* className,
                                                             const zen::host::DocumentSchema& schema) {
    static std::mutex mutex;
    static std::map<std::string, std::unique_ptr<Table>> tables;
    std::lock_guard<std::mutex> lock(mutex);
    std::unique_ptr<Table>& table = tables[className];
    if (table) return *table;
    table = std::make_unique<Table>();
    const zen::host::SettingsDocument defaults(schema);
    std::vector<zen::ParameterDefinition> rows;
    for (std::size_t s = 0; s < schema.sections.size(); ++s) {
        const zen::host::SectionSchema& section = schema.sections[s];
        if (section.IsList()) continue;
        for (std::size_t r = 0; r < section.maximumCount; ++r)
            for (std::size_t f = 0; f < section.fields.size(); ++f) {
                zen::host::FieldSchema field = section.fields[f];
                if (field.type == FieldType::Text) continue;
                field.defaultValue = defaults.Number(s, r, f);  // arrays may differ per record
                const std::string label =
                    section.IsSingle() ? field.label : section.label + " " + std::to_string(r + 1) + " " + field.label;
                rows.push_back(Definition(field, UpperName(defaults.Key(s, r, f)), label));
                table->bindings.push_back({s, r, f});
            }
    }
    table->definitions = zen::MakeParameterTable(className, std::move(rows));
    return *table;
}

ZenSettingsControl::ZenSettingsControl(const char* className, const zen::host::DocumentSchema& schema)
    : m_schema(schema), m_table(TableOf(className, schema)), m_document(schema) {
    InitParameters(m_table.definitions);
}

bool ZenSettingsControl::OnParameterChanged(std::uint32_t index, float value) {
    if (index >= m_table.bindings.size()) return false;
    const Binding& b = m_table.bindings[index];
    if (m_schema.sections[b.section].fields[b.field].type == FieldType::Integer) value = std::round(value);
    return ZenControlPluginImpl::OnParameterChanged(index, value);
}

zen::host::SettingsDocument ZenSettingsControl::Document() const {
    std::lock_guard<std::mutex> lock(m_mutex);
    zen::host::SettingsDocument document = m_document;
    for (std::size_t i = 0; i < m_table.bindings.size(); ++i) {
        const Binding& b = m_table.bindings[i];
        const double stored = document.Number(b.section, b.record, b.field);
        const float value = GetParameter(static_cast<std::uint32_t>(i));
        // The document keeps its double while the parameter still holds it.
        if (static_cast<float>(stored) == value) continue;
        const zen::host::FieldSchema& f = m_schema.sections[b.section].fields[b.field];
        document.SetNumber(b.section, b.record, b.field, std::clamp(static_cast<double>(value), f.minimum, f.maximum));
    }
    return document;
}

std::string ZenSettingsControl::SaveState() const { return Document().ToXml(); }

bool ZenSettingsControl::LoadState(const std::string& state) {
    try {
        zen::host::SettingsDocument document = zen::host::SettingsDocument::Parse(m_schema, state, GetName());
        std::lock_guard<std::mutex> lock(m_mutex);
        for (std::size_t i = 0; i < m_table.bindings.size(); ++i) {
            const Binding& b = m_table.bindings[i];
            SetParameter(static_cast<std::uint32_t>(i),
                         static_cast<float>(document.Number(b.section, b.record, b.field)));
        }
        m_document = std::move(document);
        return true;
    } catch (const std::exception&) {  // refused whole: nothing changed
        return false;
    }
}
