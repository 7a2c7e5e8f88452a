// Settings documents through XML: every schema round-trips random valid
// documents unchanged, and every kind of bad document is refused with one
// line that names the place.
#include <gtest/gtest.h>

#include "HostCore/HostError.h"
#include "HostCore/Settings/Documents/BChainDocument.h"
#include "HostCore/Settings/Documents/ConsoleDocuments.h"
#include "HostCore/Settings/Documents/OscillatorDocument.h"
#include "HostCore/Settings/Documents/RemoteControlDocument.h"
#include "HostCore/Settings/Documents/TalkbackDocument.h"
#include "RandomDocuments.h"

using zen::host::SettingsDocument;

namespace {

// The one-line error Parse gives, or "" when it accepts the text.
std::string ParseError(const zen::host::DocumentSchema& schema, const std::string& xml) {
    try {
        SettingsDocument::Parse(schema, xml, "doc.xml");
        return {};
    } catch (const zen::host::HostError& e) {
        return e.what();
    }
}

const std::string kTalkback =
    "<?xml version=\"1.0\"?>\n"
    "<TalkbackSettings version=\"1\">\n"
    "  <Talkback source=\"3\" level=\"-6\" dim=\"-25.5\" mode=\"latch\"/>\n"
    "  <Destination output=\"1\"/>\n"
    "  <Destination output=\"2\"/>\n"
    "</TalkbackSettings>\n";

}  // namespace

TEST(SettingsDocument, RandomValidDocumentsOfEverySchemaRoundTripUnchanged) {
    std::mt19937 random(11);
    for (const zen::host::DocumentSchema* schema : zen::host::ConsoleDocuments()) {
        for (int i = 0; i < 25; ++i) {
            const SettingsDocument original = zentest::RandomDocument(*schema, random);
            const std::string xml = original.ToXml();
            const SettingsDocument read = SettingsDocument::Parse(*schema, xml, "doc.xml");
            ASSERT_EQ(read, original) << schema->root << ":\n" << xml;
            ASSERT_EQ(read.ToXml(), xml);
        }
        EXPECT_EQ(SettingsDocument::Parse(*schema, SettingsDocument(*schema).ToXml(), "doc.xml"),
                  SettingsDocument(*schema));
    }
}

TEST(SettingsDocument, LeftOutAttributesTakeTheirDefaultsAndListsAreTheDocuments) {
    const auto& schema = zen::host::TalkbackDocument::Schema();
    const SettingsDocument d = SettingsDocument::Parse(
        schema, "<TalkbackSettings><Talkback dim=\"-10\"/><Destination output=\"5\"/></TalkbackSettings>", "t.xml");
    EXPECT_EQ(d.Number(0, 0, zen::host::TalkbackDocument::kDim), -10.0);
    EXPECT_EQ(d.Number(0, 0, zen::host::TalkbackDocument::kSource), 1.0);
    EXPECT_EQ(d.Format(0, 0, zen::host::TalkbackDocument::kMode), "momentary");
    ASSERT_EQ(d.RecordCount(zen::host::TalkbackDocument::kDestinationSection), 1u);
    // Array records by number, in any order; the rest keep their defaults.
    const auto& bchain = zen::host::BChainDocument::Schema();
    const SettingsDocument b = SettingsDocument::Parse(bchain,
                                                       "<BChainSettings><Channel number=\"3\" gain=\"-2.5\"/><Channel "
                                                       "number=\"1\" polarity=\"inverted\"/></BChainSettings>",
                                                       "b.xml");
    EXPECT_EQ(b.Number(0, 2, zen::host::BChainDocument::kGain), -2.5);
    EXPECT_EQ(b.Format(0, 0, zen::host::BChainDocument::kPolarity), "inverted");
    EXPECT_EQ(b.Number(0, 1, zen::host::BChainDocument::BandField(2, zen::host::BChainDocument::kBandFrequency)),
              2000.0);
}

TEST(SettingsDocument, BadDocumentsAreRefusedWithOneLineNamingThePlace) {
    const auto& schema = zen::host::TalkbackDocument::Schema();
    auto replace = [](std::string text, const std::string& from, const std::string& to) {
        return text.replace(text.find(from), from.size(), to);
    };
    struct Case {
        std::string xml;
        std::string expected;
    };
    const Case cases[] = {
        {"", "doc.xml:1:1: malformed XML (No document element found)"},
        {replace(kTalkback, "<Destination output=\"1\"/>", "<Destination output=\"1\">"), "doc.xml:6:3: malformed XML"},
        {replace(kTalkback, "<Talkback ", "<Talkbak "), "doc.xml:3:4: unknown element <Talkbak> in <TalkbackSettings>"},
        {replace(kTalkback, "mode=", "mood="), "doc.xml:3:4: unknown attribute 'mood' of <Talkback>"},
        {replace(kTalkback, "dim=\"-25.5\"", "dim=\"-61\""), "doc.xml:3:4: Talkback: dim=\"-61\" must be -60 to 0 dB"},
        {replace(kTalkback, "dim=\"-25.5\"", "dim=\"-3dB\""), "doc.xml:3:4: Talkback: dim=\"-3dB\" is not a number"},
        {replace(kTalkback, "dim=\"-25.5\"", "dim=\"nan\""), "is not a number"},
        {replace(kTalkback, "source=\"3\"", "source=\"2.5\""), "source=\"2.5\" must be a whole number 1 to 32"},
        {replace(kTalkback, "latch", "Latch"), "mode=\"Latch\" is not one of momentary, latch"},
        {replace(kTalkback, "output=\"2\"", "output=\"1\""), "doc.xml:5:4: Destination 2: output 1 is listed twice"},
        {replace(kTalkback, "version=\"1\"", "version=\"2\""), "doc.xml:2:2: version 2 is not 1"},
        {replace(kTalkback, "TalkbackSettings version=\"1\">", "TalkbackSettings version=\"1\">stray"),
         "unexpected text in <TalkbackSettings>"},
        {replace(replace(kTalkback, "<TalkbackSettings", "<Talkback2"), "</TalkbackSettings>", "</Talkback2>"),
         "doc.xml:2:2: <Talkback2> is not a TalkbackSettings document"},
        {kTalkback + "<TalkbackSettings/>", "a second document element"},
        {replace(kTalkback, "<Destination output=\"1\"/>", "<Talkback/>"), "doc.xml:4:4: a second <Talkback>"},
    };
    for (const Case& c : cases) {
        const std::string error = ParseError(schema, c.xml);
        EXPECT_NE(error.find(c.expected), std::string::npos) << "got: " << error << "\nexpected: " << c.expected;
        EXPECT_EQ(error.find('\n'), std::string::npos) << error;
    }
    EXPECT_EQ(ParseError(schema, kTalkback), "");

    // Every truncation of a valid document is refused, at a line it names.
    const std::string full = SettingsDocument(zen::host::BChainDocument::Schema()).ToXml();
    for (std::size_t length = 0; length + 1 < full.size(); length += 7) {
        const std::string error = ParseError(zen::host::BChainDocument::Schema(), full.substr(0, length));
        ASSERT_EQ(error.rfind("doc.xml:", 0), 0u) << "accepted " << length << " of " << full.size() << " bytes";
    }
}

TEST(SettingsDocument, EveryDocumentedSettingRefusesValuesOutsideItsRange) {
    for (const zen::host::DocumentSchema* schema : zen::host::ConsoleDocuments()) {
        SettingsDocument d(*schema);
        for (std::size_t s = 0; s < schema->sections.size(); ++s) {
            if (d.RecordCount(s) == 0) d.AddRecord(s);
            for (std::size_t f = 0; f < schema->sections[s].fields.size(); ++f) {
                const zen::host::FieldSchema& field = schema->sections[s].fields[f];
                const std::string key = d.Key(s, 0, f);
                if (field.type == zen::host::FieldType::Text) {
                    EXPECT_THROW(d.SetText(s, 0, f, std::string(field.maximumLength + 1, 'a')), zen::host::HostError)
                        << key;
                    EXPECT_THROW(d.SetText(s, 0, f, "line\nbreak"), zen::host::HostError) << key;
                    continue;
                }
                const double stride = field.step > 0.0 ? field.step : 1.0;
                for (double bad : {field.minimum - stride, field.maximum + stride, std::nan("")}) {
                    const SettingsDocument before = d;
                    EXPECT_THROW(d.SetNumber(s, 0, f, bad), zen::host::HostError) << key << " = " << bad;
                    EXPECT_EQ(d, before);
                }
                if (field.type != zen::host::FieldType::Number) {
                    EXPECT_THROW(d.SetNumber(s, 0, f, field.minimum + 0.5), zen::host::HostError) << key;
                }
            }
        }
    }
}

TEST(SettingsDocument, SetByKeyTakesUnitsChoicesAndGrowsOrShrinksLists) {
    SettingsDocument tone(zen::host::OscillatorDocument::Schema());
    tone.Set("frequency", "2.5kHz");
    tone.Set("Tone.level", "-3 dB");
    tone.Set("SIGNAL", "Pink");
    EXPECT_EQ(tone.Number(0, 0, zen::host::OscillatorDocument::kFrequency), 2500.0);
    EXPECT_EQ(tone.Number(0, 0, zen::host::OscillatorDocument::kLevel), -3.0);
    EXPECT_EQ(tone.Format(0, 0, zen::host::OscillatorDocument::kSignal), "pink");
    const SettingsDocument before = tone;
    for (const auto& [key, value] : std::vector<std::pair<std::string, std::string>>{
             {"level", "-3 ms"}, {"level", "loud"}, {"levle", "-3"}, {"frequency", "100kHz"}, {"channel", "33"}}) {
        EXPECT_THROW(tone.Set(key, value), zen::host::HostError) << key << "=" << value;
        EXPECT_EQ(tone, before) << key << "=" << value;
    }
    tone.Set("channel", "3");  // beyond the two channels: the check across fields says so
    EXPECT_THROW(tone.Check(), zen::host::HostError);

    SettingsDocument remote(zen::host::RemoteControlDocument::Schema());
    using R = zen::host::RemoteControlDocument;
    remote.Set("binding1.parameter", "Threshold");
    remote.Set("binding2.type", "osc");
    EXPECT_THROW(remote.Check(), zen::host::HostError);  // an OSC binding needs its address
    remote.Set("binding2.address", "/fader/1");
    remote.Set("binding2.parameter", "Ceiling");
    remote.Check();
    EXPECT_EQ(remote.RecordCount(R::kBindingSection), 2u);
    EXPECT_THROW(remote.Set("binding4.type", "cc"), zen::host::HostError);  // no gaps
    remote.Set("binding3.address", "/fader/1");
    remote.Set("binding3.type", "osc");
    remote.Set("binding3.parameter", "Gain");
    EXPECT_THROW(remote.Check(), zen::host::HostError);  // /fader/1 bound twice
    remote.Set("binding3", "remove");
    remote.Set("binding1", "remove");
    EXPECT_EQ(remote.RecordCount(R::kBindingSection), 1u);
    EXPECT_EQ(remote.Text(R::kBindingSection, 0, R::kAddress), "/fader/1");
}
