#include "RandomDocuments.h"

#include <cmath>
#include <stdexcept>

#include "HostCore/HostError.h"

namespace zentest {

namespace {

using zen::host::FieldType;

std::string RandomText(const zen::host::FieldSchema& f, std::mt19937& random) {
    static const char* const kPieces[] = {"a", "Z", "7", " ", "&", "<", ">", "\"", "'", "/", "é", "ß", "€", "-", "_"};
    const std::size_t length =
        std::uniform_int_distribution<std::size_t>(0, std::min<std::size_t>(f.maximumLength / 2, 24))(random);
    std::string text;
    while (text.size() < length) text += kPieces[random() % (sizeof(kPieces) / sizeof(kPieces[0]))];
    return text;
}

double RandomNumber(const zen::host::FieldSchema& f, std::mt19937& random) {
    switch (random() % 8) {
        case 0: return f.minimum;
        case 1: return f.maximum;
        default: break;
    }
    if (f.logarithmic && f.minimum > 0.0)
        return std::exp(std::uniform_real_distribution<double>(std::log(f.minimum), std::log(f.maximum))(random));
    return std::uniform_real_distribution<double>(f.minimum, f.maximum)(random);
}

}  // namespace

zen::host::SettingsDocument RandomDocument(const zen::host::DocumentSchema& schema, std::mt19937& random) {
    for (int attempt = 0; attempt < 1000; ++attempt) {
        zen::host::SettingsDocument d(schema);
        for (std::size_t s = 0; s < schema.sections.size(); ++s) {
            const zen::host::SectionSchema& section = schema.sections[s];
            if (section.IsList()) {
                const std::size_t count = std::uniform_int_distribution<std::size_t>(
                    section.minimumCount, std::min<std::size_t>(section.maximumCount, 12))(random);
                for (std::size_t r = 0; r < count; ++r) d.AddRecord(s);
            }
            for (std::size_t r = 0; r < d.RecordCount(s); ++r)
                for (std::size_t f = 0; f < section.fields.size(); ++f) {
                    const zen::host::FieldSchema& field = section.fields[f];
                    if (field.type == FieldType::Text) {
                        // OSC addresses need their own shape to pass the check.
                        std::string text = RandomText(field, random);
                        if (field.name == "address") text = "/" + std::to_string(random() % 100000) + "/fader";
                        d.SetText(s, r, f, text);
                    } else if (field.type == FieldType::Number) {
                        d.SetNumber(s, r, f, RandomNumber(field, random));
                    } else {
                        d.SetNumber(s, r, f,
                                    std::floor(std::uniform_real_distribution<double>(field.minimum,
                                                                                      field.maximum + 1.0)(random)));
                    }
                }
        }
        try {
            d.Check();
            return d;
        } catch (const zen::host::HostError&) {
        }
    }
    throw std::runtime_error("no valid random " + schema.root);
}

}  // namespace zentest
