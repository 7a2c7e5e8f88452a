// The shape of a console settings document: a root element holding sections
// of records, each record one XML element whose attributes are its fields.
//
//   single  (1..1)  <Tone signal="sine" level="-20"/>
//   array   (N..N)  <Channel number="1" gain="0"/> ... numbered 1..N
//   list    (0..M)  <Binding type="cc" .../> in order, as many as the user made
//
// Every document is checked against its schema when read: unknown elements
// and attributes, values out of range and broken XML are refused.
#pragma once

#include <cstddef>
#include <functional>
#include <string>
#include <vector>

namespace zen::host {

class SettingsDocument;

enum class FieldType {
    Number,   // a real number in [minimum, maximum]
    Integer,  // a whole number in [minimum, maximum]
    Choice,   // one of `choices`, held as its index
    Text,     // printable text of at most maximumLength characters
};

struct FieldSchema {
    std::string name;   // XML attribute and key: "gain", "eq1Frequency"
    std::string label;  // "Gain", "EQ 1 Frequency"
    FieldType type = FieldType::Number;
    double minimum = 0.0;
    double maximum = 1.0;
    double defaultValue = 0.0;  // Choice: index of the default
    double step = 0.0;          // display resolution
    std::string unit;           // "dB", "ms", "Hz", "s" or empty
    bool logarithmic = false;
    std::vector<std::string> choices;
    std::string defaultText;
    std::size_t maximumLength = 256;
};

struct SectionSchema {
    std::string element;  // "Channel"
    std::string label;    // "Channel"
    std::size_t minimumCount = 1;
    std::size_t maximumCount = 1;
    std::vector<FieldSchema> fields;
    // Defaults of an array's record that differ by number (an EQ band's
    // frequency, an identity routing), applied after the field defaults.
    std::function<void(std::size_t record, SettingsDocument& document)> recordDefaults;

    bool IsSingle() const { return minimumCount == 1 && maximumCount == 1; }
    bool IsArray() const { return minimumCount == maximumCount && maximumCount > 1; }
    bool IsList() const { return minimumCount != maximumCount; }
    // Index of a field by name, case-insensitive; -1 if none.
    int FindField(const std::string& name) const;
};

// A fault that involves more than one field; `section` and `record` place it.
struct DocumentFault {
    std::string message;
    std::size_t section = 0;
    std::size_t record = 0;
};

struct DocumentSchema {
    std::string root;  // root element, also the document's name: "BChainSettings"
    int version = 1;
    std::vector<SectionSchema> sections;
    // Checks across fields and records; answers false with the fault.
    std::function<bool(const SettingsDocument& document, DocumentFault& fault)> check;
};

// Helpers for building schemas.
FieldSchema NumberField(const char* name, const char* label, double minimum, double maximum, double defaultValue,
                        double step, const char* unit = "", bool logarithmic = false);
FieldSchema IntegerField(const char* name, const char* label, double minimum, double maximum, double defaultValue,
                         const char* unit = "");
FieldSchema ChoiceField(const char* name, const char* label, std::vector<std::string> choices,
                        std::size_t defaultIndex);
FieldSchema TextField(const char* name, const char* label, const char* defaultText = "",
                      std::size_t maximumLength = 256);

}  // namespace zen::host
