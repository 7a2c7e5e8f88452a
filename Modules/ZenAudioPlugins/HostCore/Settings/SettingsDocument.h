// The values of one console settings document, read from and written to XML
// through pugixml and checked against the document's schema.
//
// A document stands alone: attributes it leaves out take their defaults.
// Writing always gives every field, and reading what was written gives the
// same document back, value for value.
#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "DocumentSchema.h"

namespace zen::host {

struct SettingValue {
    double number = 0.0;  // Number, Integer, Choice (the index)
    std::string text;     // Text
    bool operator==(const SettingValue& other) const { return number == other.number && text == other.text; }
};

class SettingsDocument {
public:
    // The defaults: arrays full, lists empty.
    explicit SettingsDocument(const DocumentSchema& schema);

    // Throws HostError with one line "source:line:column: what" for broken
    // or truncated XML, another root, unknown elements or attributes, values
    // out of range and faults of the schema's check.
    static SettingsDocument Parse(const DocumentSchema& schema, const std::string& xml, const std::string& source);
    std::string ToXml() const;

    const DocumentSchema& Schema() const { return *m_schema; }
    std::size_t RecordCount(std::size_t section) const { return m_sections.at(section).size(); }
    double Number(std::size_t section, std::size_t record, std::size_t field) const;
    const std::string& Text(std::size_t section, std::size_t record, std::size_t field) const;
    std::size_t ChoiceIndex(std::size_t section, std::size_t record, std::size_t field) const {
        return static_cast<std::size_t>(Number(section, record, field));
    }

    // Throw HostError naming the setting's key for a value the field cannot
    // hold; the document is unchanged then.
    void SetNumber(std::size_t section, std::size_t record, std::size_t field, double value);
    void SetText(std::size_t section, std::size_t record, std::size_t field, const std::string& text);
    // Lists only: a record of defaults at the end; removal of one record.
    void AddRecord(std::size_t section);
    void RemoveRecord(std::size_t section, std::size_t record);

    // The user's name of a field: "level" in a single section, "channel3.gain"
    // in an array or list (records count from 1).
    std::string Key(std::size_t section, std::size_t record, std::size_t field) const;
    // A field by key from text as a user types it: "-3", "-3 dB", "2.5kHz",
    // "bell". In a list, the key of the record after the last adds a record
    // ("binding4.type=osc" with three bindings) and "binding2=remove"
    // removes one. Throws HostError for a key or value the fields cannot
    // take; the document is unchanged then. Faults across fields are left to
    // Check, after the last change (a new binding needs several).
    void Set(const std::string& key, const std::string& value);
    // "-3 dB", "bell", the text itself.
    std::string Format(std::size_t section, std::size_t record, std::size_t field) const;

    // Throws HostError when the schema's check finds a fault.
    void Check() const;

    bool operator==(const SettingsDocument& other) const {
        return m_schema == other.m_schema && m_sections == other.m_sections;
    }
    bool operator!=(const SettingsDocument& other) const { return !(*this == other); }

private:
    using Record = std::vector<SettingValue>;

    Record DefaultRecord(std::size_t section) const;
    SettingValue& Value(std::size_t section, std::size_t record, std::size_t field);
    const SettingValue& Value(std::size_t section, std::size_t record, std::size_t field) const;
    std::string RecordName(std::size_t section, std::size_t record) const;

    const DocumentSchema* m_schema;
    std::vector<std::vector<Record>> m_sections;
};

// Text of a value that reads back to the same double, without locale.
std::string FormatNumber(double value);
// A whole-string number without locale; false for anything else (also NaN
// and infinities).
bool ParseNumber(const std::string& text, double& value);

}  // namespace zen::host
