#include "SettingsDocument.h"

#include <strings.h>

#include <algorithm>
#include <cctype>
#include <charconv>
#include <cmath>
#include <pugixml.hpp>
#include <set>

#include "HostCore/HostError.h"

namespace zen::host {

namespace {

constexpr const char* kNumberAttribute = "number";
constexpr const char* kVersionAttribute = "version";
constexpr const char* kRemove = "remove";

bool EqualsIgnoreCase(const std::string& a, const std::string& b) { return strcasecmp(a.c_str(), b.c_str()) == 0; }

std::string Lower(std::string text) {
    for (char& c : text) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return text;
}

// "-40 to 12 dB", "one of sine, pink", "whole number 1 to 16".
std::string DescribeRange(const FieldSchema& f) {
    switch (f.type) {
        case FieldType::Choice: {
            std::string list;
            for (const std::string& c : f.choices) list += (list.empty() ? "" : ", ") + c;
            return "one of " + list;
        }
        case FieldType::Text: return "printable text of at most " + std::to_string(f.maximumLength) + " characters";
        case FieldType::Integer:
            return "a whole number " + FormatNumber(f.minimum) + " to " + FormatNumber(f.maximum) +
                   (f.unit.empty() ? "" : " " + f.unit);
        case FieldType::Number: break;
    }
    return FormatNumber(f.minimum) + " to " + FormatNumber(f.maximum) + (f.unit.empty() ? "" : " " + f.unit);
}

bool IsPrintable(const std::string& text) {
    for (unsigned char c : text)
        if (c < 0x20 || c == 0x7F) return false;
    return true;
}

// Empty when the field can hold the value, else the reason.
std::string Fault(const FieldSchema& f, const SettingValue& v) {
    switch (f.type) {
        case FieldType::Text:
            return IsPrintable(v.text) && v.text.size() <= f.maximumLength ? "" : "must be " + DescribeRange(f);
        case FieldType::Choice:
        case FieldType::Integer:
            if (std::floor(v.number) != v.number) return "must be " + DescribeRange(f);
            break;
        case FieldType::Number: break;
    }
    if (!std::isfinite(v.number) || v.number < f.minimum || v.number > f.maximum) return "must be " + DescribeRange(f);
    return {};
}

// A value as stored in XML: numbers without units, choices by their token.
bool ReadXmlValue(const FieldSchema& f, const std::string& text, SettingValue& value) {
    if (f.type == FieldType::Text) {
        value.text = text;
        return true;
    }
    if (f.type == FieldType::Choice) {
        for (std::size_t i = 0; i < f.choices.size(); ++i)
            if (f.choices[i] == text) {
                value.number = static_cast<double>(i);
                return true;
            }
        return false;
    }
    return ParseNumber(text, value.number);
}

// A value as a user types it: a unit after the number is allowed when it is
// the field's own, or "k" before it for a thousand ("2.5kHz").
bool ReadUserValue(const FieldSchema& f, const std::string& text, SettingValue& value) {
    if (f.type == FieldType::Text) {
        value.text = text;
        return true;
    }
    if (f.type == FieldType::Choice) {
        for (std::size_t i = 0; i < f.choices.size(); ++i)
            if (EqualsIgnoreCase(f.choices[i], text)) {
                value.number = static_cast<double>(i);
                return true;
            }
        return false;
    }
    std::size_t end = text.size();
    while (end > 0 && std::isalpha(static_cast<unsigned char>(text[end - 1]))) --end;
    std::string unit = text.substr(end);
    std::string number = text.substr(0, end);
    while (!number.empty() && number.back() == ' ') number.pop_back();
    double scale = 1.0;
    if (!unit.empty()) {
        if (!f.unit.empty() && EqualsIgnoreCase(unit, "k" + f.unit))
            scale = 1000.0;
        else if (f.unit.empty() || !EqualsIgnoreCase(unit, f.unit))
            return false;
    }
    if (!ParseNumber(number, value.number)) return false;
    value.number *= scale;
    return true;
}

// "line:column" of a byte offset.
std::string Place(const std::string& source, const std::string& xml, std::ptrdiff_t offset) {
    std::size_t line = 1, column = 1;
    const auto end = static_cast<std::size_t>(
        std::max<std::ptrdiff_t>(0, std::min<std::ptrdiff_t>(offset, static_cast<std::ptrdiff_t>(xml.size()))));
    for (std::size_t i = 0; i < end; ++i) {
        if (xml[i] == '\n') {
            ++line;
            column = 1;
        } else {
            ++column;
        }
    }
    return source + ":" + std::to_string(line) + ":" + std::to_string(column);
}

struct StringWriter : pugi::xml_writer {
    std::string text;
    void write(const void* data, size_t size) override { text.append(static_cast<const char*>(data), size); }
};

}  // namespace

std::string FormatNumber(double value) {
    char buffer[64];
    const auto result = std::to_chars(buffer, buffer + sizeof(buffer), value);
    return std::string(buffer, result.ptr);
}

bool ParseNumber(const std::string& text, double& value) {
    const char* begin = text.data();
    const char* end = begin + text.size();
    if (begin != end && *begin == '+') ++begin;
    double parsed = 0.0;
    const auto result = std::from_chars(begin, end, parsed);
    if (result.ec != std::errc() || result.ptr != end || !std::isfinite(parsed)) return false;
    value = parsed;
    return true;
}

SettingsDocument::SettingsDocument(const DocumentSchema& schema) : m_schema(&schema) {
    m_sections.resize(schema.sections.size());
    for (std::size_t s = 0; s < schema.sections.size(); ++s) {
        const SectionSchema& section = schema.sections[s];
        for (std::size_t r = 0; r < section.minimumCount; ++r) {
            m_sections[s].push_back(DefaultRecord(s));
            if (section.recordDefaults) section.recordDefaults(r, *this);
        }
    }
}

SettingsDocument::Record SettingsDocument::DefaultRecord(std::size_t section) const {
    Record record;
    for (const FieldSchema& f : m_schema->sections[section].fields) record.push_back({f.defaultValue, f.defaultText});
    return record;
}

SettingValue& SettingsDocument::Value(std::size_t section, std::size_t record, std::size_t field) {
    return m_sections.at(section).at(record).at(field);
}

const SettingValue& SettingsDocument::Value(std::size_t section, std::size_t record, std::size_t field) const {
    return m_sections.at(section).at(record).at(field);
}

double SettingsDocument::Number(std::size_t section, std::size_t record, std::size_t field) const {
    return Value(section, record, field).number;
}

const std::string& SettingsDocument::Text(std::size_t section, std::size_t record, std::size_t field) const {
    return Value(section, record, field).text;
}

void SettingsDocument::SetNumber(std::size_t section, std::size_t record, std::size_t field, double value) {
    const FieldSchema& f = m_schema->sections.at(section).fields.at(field);
    SettingValue v{value, {}};
    const std::string fault = Fault(f, v);
    if (!fault.empty()) throw HostError(Key(section, record, field) + ": " + FormatNumber(value) + " " + fault);
    Value(section, record, field).number = value;
}

void SettingsDocument::SetText(std::size_t section, std::size_t record, std::size_t field, const std::string& text) {
    const FieldSchema& f = m_schema->sections.at(section).fields.at(field);
    const std::string fault = Fault(f, {0.0, text});
    if (!fault.empty()) throw HostError(Key(section, record, field) + ": '" + text + "' " + fault);
    Value(section, record, field).text = text;
}

void SettingsDocument::AddRecord(std::size_t section) {
    const SectionSchema& schema = m_schema->sections.at(section);
    if (!schema.IsList()) throw HostError("<" + schema.element + "> has a fixed count");
    if (m_sections[section].size() >= schema.maximumCount)
        throw HostError("at most " + std::to_string(schema.maximumCount) + " <" + schema.element + "> entries");
    m_sections[section].push_back(DefaultRecord(section));
}

void SettingsDocument::RemoveRecord(std::size_t section, std::size_t record) {
    const SectionSchema& schema = m_schema->sections.at(section);
    if (!schema.IsList()) throw HostError("<" + schema.element + "> has a fixed count");
    auto& records = m_sections[section];
    if (record >= records.size()) throw HostError(RecordName(section, record) + " does not exist");
    records.erase(records.begin() + static_cast<std::ptrdiff_t>(record));
}

std::string SettingsDocument::RecordName(std::size_t section, std::size_t record) const {
    const SectionSchema& schema = m_schema->sections.at(section);
    return schema.IsSingle() ? schema.label : schema.label + " " + std::to_string(record + 1);
}

std::string SettingsDocument::Key(std::size_t section, std::size_t record, std::size_t field) const {
    const SectionSchema& schema = m_schema->sections.at(section);
    const std::string& name = schema.fields.at(field).name;
    return schema.IsSingle() ? name : Lower(schema.element) + std::to_string(record + 1) + "." + name;
}

std::string SettingsDocument::Format(std::size_t section, std::size_t record, std::size_t field) const {
    const FieldSchema& f = m_schema->sections.at(section).fields.at(field);
    const SettingValue& v = Value(section, record, field);
    switch (f.type) {
        case FieldType::Text: return v.text;
        case FieldType::Choice: return f.choices.at(static_cast<std::size_t>(v.number));
        default: return FormatNumber(v.number) + (f.unit.empty() ? "" : " " + f.unit);
    }
}

void SettingsDocument::Set(const std::string& key, const std::string& value) {
    // "field", "section.field", "section3.field" or "section3".
    const std::size_t dot = key.find('.');
    const std::string head = dot == std::string::npos ? key : key.substr(0, dot);
    const std::string fieldName = dot == std::string::npos ? std::string() : key.substr(dot + 1);
    std::size_t digits = head.size();
    while (digits > 0 && std::isdigit(static_cast<unsigned char>(head[digits - 1]))) --digits;
    const std::string element = head.substr(0, digits);
    const std::string number = head.substr(digits);

    SettingsDocument changed = *this;
    for (std::size_t s = 0; s < m_schema->sections.size(); ++s) {
        const SectionSchema& section = m_schema->sections[s];
        std::size_t record = 0;
        int field = -1;
        if (section.IsSingle()) {
            const std::string name =
                dot == std::string::npos ? key : (EqualsIgnoreCase(head, section.element) ? fieldName : std::string());
            field = section.FindField(name);
            if (field < 0) continue;
        } else {
            if (!EqualsIgnoreCase(element, section.element) || number.empty()) continue;
            const unsigned long n = std::stoul(number.substr(0, 9));
            const std::size_t count = changed.m_sections[s].size();
            if (n < 1 || n > std::max(count + (section.IsList() ? 1 : 0), std::size_t{1}) ||
                (!section.IsList() && n > count))
                throw HostError(key + ": " + section.label + " " + number + " does not exist (there are " +
                                std::to_string(count) + (section.IsList() ? "; the next adds one" : "") + ")");
            record = n - 1;
            if (fieldName.empty()) {
                if (!section.IsList() || !EqualsIgnoreCase(value, kRemove) || record >= count)
                    throw HostError(key + ": give a setting (" + key + ".NAME=VALUE)" +
                                    (section.IsList() ? " or '" + std::string(kRemove) + "'" : ""));
                changed.RemoveRecord(s, record);
                *this = std::move(changed);
                return;
            }
            field = section.FindField(fieldName);
            if (field < 0) {
                std::string names;
                for (const FieldSchema& f : section.fields) names += (names.empty() ? "" : ", ") + f.name;
                throw HostError(key + ": <" + section.element + "> has no setting '" + fieldName + "' (" + names + ")");
            }
            if (record == count) changed.AddRecord(s);
        }
        const FieldSchema& f = section.fields[static_cast<std::size_t>(field)];
        SettingValue parsed;
        if (!ReadUserValue(f, value, parsed))
            throw HostError(changed.Key(s, record, static_cast<std::size_t>(field)) + ": '" + value + "' is not " +
                            (f.type == FieldType::Choice ? DescribeRange(f) : "a value in " + DescribeRange(f)));
        if (f.type == FieldType::Text)
            changed.SetText(s, record, static_cast<std::size_t>(field), parsed.text);
        else
            changed.SetNumber(s, record, static_cast<std::size_t>(field), parsed.number);
        *this = std::move(changed);
        return;
    }
    throw HostError("'" + key + "' is no setting of " + m_schema->root + " (zenfx control show lists them)");
}

void SettingsDocument::Check() const {
    DocumentFault fault;
    if (m_schema->check && !m_schema->check(*this, fault))
        throw HostError(RecordName(fault.section, fault.record) + ": " + fault.message);
}

SettingsDocument SettingsDocument::Parse(const DocumentSchema& schema, const std::string& xml,
                                         const std::string& source) {
    pugi::xml_document doc;
    const pugi::xml_parse_result parsed =
        doc.load_buffer(xml.data(), xml.size(), pugi::parse_default | pugi::parse_declaration, pugi::encoding_utf8);
    auto fail = [&](std::ptrdiff_t offset, const std::string& what) -> HostError {
        return HostError(Place(source, xml, offset) + ": " + what);
    };
    if (!parsed) throw fail(parsed.offset, std::string("malformed XML (") + parsed.description() + ")");

    pugi::xml_node root;
    for (pugi::xml_node node : doc.children()) {
        if (node.type() == pugi::node_pcdata) throw fail(node.offset_debug(), "text outside the document element");
        if (node.type() != pugi::node_element) continue;
        if (root) throw fail(node.offset_debug(), std::string("a second document element <") + node.name() + ">");
        root = node;
    }
    if (!root) throw fail(0, "no document element");
    if (schema.root != root.name())
        throw fail(root.offset_debug(), std::string("<") + root.name() + "> is not a " + schema.root + " document");
    for (pugi::xml_attribute a : root.attributes()) {
        if (std::string(a.name()) != kVersionAttribute)
            throw fail(root.offset_debug(),
                       std::string("unknown attribute '") + a.name() + "' of <" + schema.root + ">");
        if (std::string(a.value()) != std::to_string(schema.version))
            throw fail(root.offset_debug(),
                       std::string("version ") + a.value() + " is not " + std::to_string(schema.version));
    }

    SettingsDocument document(schema);
    for (std::size_t s = 0; s < schema.sections.size(); ++s)
        if (schema.sections[s].IsList()) document.m_sections[s].clear();  // the document lists its own
    // Where each record stands, to place faults the check finds later.
    std::vector<std::vector<std::ptrdiff_t>> offsets(schema.sections.size());
    for (std::size_t s = 0; s < schema.sections.size(); ++s)
        offsets[s].assign(document.m_sections[s].size(), root.offset_debug());
    std::vector<std::set<std::size_t>> seen(schema.sections.size());

    for (pugi::xml_node node : root.children()) {
        if (node.type() == pugi::node_pcdata || node.type() == pugi::node_cdata)
            throw fail(node.offset_debug(), std::string("unexpected text in <") + schema.root + ">");
        if (node.type() != pugi::node_element) continue;
        const std::string name = node.name();
        std::size_t s = 0;
        while (s < schema.sections.size() && schema.sections[s].element != name) ++s;
        if (s == schema.sections.size())
            throw fail(node.offset_debug(), "unknown element <" + name + "> in <" + schema.root + ">");
        const SectionSchema& section = schema.sections[s];
        if (node.first_child()) throw fail(node.first_child().offset_debug(), "<" + name + "> takes no content");

        std::size_t record = 0;
        if (section.IsList()) {
            if (document.m_sections[s].size() == section.maximumCount)
                throw fail(node.offset_debug(),
                           "more than " + std::to_string(section.maximumCount) + " <" + name + "> elements");
            record = document.m_sections[s].size();
            document.m_sections[s].push_back(document.DefaultRecord(s));
            offsets[s].push_back(node.offset_debug());
        } else if (section.IsArray()) {
            const pugi::xml_attribute numberAttribute = node.attribute(kNumberAttribute);
            double n = 0.0;
            if (!numberAttribute || !ParseNumber(numberAttribute.value(), n) || n < 1 || std::floor(n) != n ||
                n > static_cast<double>(section.maximumCount))
                throw fail(node.offset_debug(),
                           "<" + name + "> needs number=\"1\" to \"" + std::to_string(section.maximumCount) + "\"");
            record = static_cast<std::size_t>(n) - 1;
        }
        if (!seen[s].insert(record).second)
            throw fail(node.offset_debug(),
                       "a second <" + name + ">" +
                           (section.IsArray() ? " number=\"" + std::to_string(record + 1) + "\"" : ""));
        offsets[s][record] = node.offset_debug();

        std::set<std::string> attributes;
        for (pugi::xml_attribute a : node.attributes()) {
            const std::string attribute = a.name();
            if (!attributes.insert(attribute).second)
                throw fail(node.offset_debug(), "attribute '" + attribute + "' twice in <" + name + ">");
            if (section.IsArray() && attribute == kNumberAttribute) continue;
            int field = -1;
            for (std::size_t i = 0; i < section.fields.size(); ++i)
                if (section.fields[i].name == attribute) field = static_cast<int>(i);
            if (field < 0) throw fail(node.offset_debug(), "unknown attribute '" + attribute + "' of <" + name + ">");
            const FieldSchema& f = section.fields[static_cast<std::size_t>(field)];
            SettingValue value;
            if (!ReadXmlValue(f, a.value(), value))
                throw fail(node.offset_debug(), document.RecordName(s, record) + ": " + attribute + "=\"" + a.value() +
                                                    "\" is not " +
                                                    (f.type == FieldType::Choice ? DescribeRange(f) : "a number"));
            const std::string fault = Fault(f, value);
            if (!fault.empty())
                throw fail(node.offset_debug(),
                           document.RecordName(s, record) + ": " + attribute + "=\"" + a.value() + "\" " + fault);
            document.Value(s, record, static_cast<std::size_t>(field)) = value;
        }
    }

    for (std::size_t s = 0; s < schema.sections.size(); ++s)
        if (document.m_sections[s].size() < schema.sections[s].minimumCount)
            throw fail(root.offset_debug(), "fewer than " + std::to_string(schema.sections[s].minimumCount) + " <" +
                                                schema.sections[s].element + "> elements");
    DocumentFault fault;
    if (schema.check && !schema.check(document, fault))
        throw fail(offsets.at(fault.section).at(fault.record),
                   document.RecordName(fault.section, fault.record) + ": " + fault.message);
    return document;
}

std::string SettingsDocument::ToXml() const {
    pugi::xml_document doc;
    pugi::xml_node declaration = doc.append_child(pugi::node_declaration);
    declaration.append_attribute("version") = "1.0";
    declaration.append_attribute("encoding") = "UTF-8";
    pugi::xml_node root = doc.append_child(m_schema->root.c_str());
    root.append_attribute(kVersionAttribute) = m_schema->version;
    for (std::size_t s = 0; s < m_sections.size(); ++s) {
        const SectionSchema& section = m_schema->sections[s];
        for (std::size_t r = 0; r < m_sections[s].size(); ++r) {
            pugi::xml_node node = root.append_child(section.element.c_str());
            if (section.IsArray()) node.append_attribute(kNumberAttribute) = static_cast<unsigned>(r + 1);
            for (std::size_t f = 0; f < section.fields.size(); ++f) {
                const FieldSchema& field = section.fields[f];
                const SettingValue& v = m_sections[s][r][f];
                const std::string text = field.type == FieldType::Text ? v.text
                                         : field.type == FieldType::Choice
                                             ? field.choices.at(static_cast<std::size_t>(v.number))
                                             : FormatNumber(v.number);
                node.append_attribute(field.name.c_str()) = text.c_str();
            }
        }
    }
    StringWriter writer;
    doc.save(writer, "  ", pugi::format_default, pugi::encoding_utf8);
    return writer.text;
}

}  // namespace zen::host
