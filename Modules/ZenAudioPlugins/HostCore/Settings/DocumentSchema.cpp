#include "DocumentSchema.h"

#include <strings.h>

namespace zen::host {

int SectionSchema::FindField(const std::string& name) const {
    for (std::size_t i = 0; i < fields.size(); ++i)
        if (strcasecmp(fields[i].name.c_str(), name.c_str()) == 0) return static_cast<int>(i);
    return -1;
}

FieldSchema NumberField(const char* name, const char* label, double minimum, double maximum, double defaultValue,
                        double step, const char* unit, bool logarithmic) {
    FieldSchema f;
    f.name = name;
    f.label = label;
    f.type = FieldType::Number;
    f.minimum = minimum;
    f.maximum = maximum;
    f.defaultValue = defaultValue;
    f.step = step;
    f.unit = unit;
    f.logarithmic = logarithmic;
    return f;
}

FieldSchema IntegerField(const char* name, const char* label, double minimum, double maximum, double defaultValue,
                         const char* unit) {
    FieldSchema f = NumberField(name, label, minimum, maximum, defaultValue, 1.0, unit);
    f.type = FieldType::Integer;
    return f;
}

FieldSchema ChoiceField(const char* name, const char* label, std::vector<std::string> choices,
                        std::size_t defaultIndex) {
    FieldSchema f;
    f.name = name;
    f.label = label;
    f.type = FieldType::Choice;
    f.maximum = static_cast<double>(choices.size() - 1);
    f.defaultValue = static_cast<double>(defaultIndex);
    f.step = 1.0;
    f.choices = std::move(choices);
    return f;
}

FieldSchema TextField(const char* name, const char* label, const char* defaultText, std::size_t maximumLength) {
    FieldSchema f;
    f.name = name;
    f.label = label;
    f.type = FieldType::Text;
    f.defaultText = defaultText;
    f.maximumLength = maximumLength;
    return f;
}

}  // namespace zen::host
