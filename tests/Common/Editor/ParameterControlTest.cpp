// The controls as a user meets them: typed values with units and prefixes,
// clamping, the readouts, and a knob's drag, fine drag, default and entry.
#include <gtest/gtest.h>

#include <QKeyEvent>
#include <QLineEdit>
#include <QMouseEvent>
#include <QApplication>
#include <memory>

#include "Common/Editor/ParameterControl.h"
#include "Common/Editor/ParameterKnob.h"
#include "Support/FakeEditorLink.h"
#include "Support/TestApplication.h"

namespace {

zen::ParameterInfo Continuous(const char* name, float minimum, float maximum, float defaultValue, const char* unit,
                              zen::ParameterTaper taper = zen::ParameterTaper::Linear, float step = 0.0f) {
    zen::ParameterInfo info;
    info.identifier = std::string("Test::") + name;
    info.label = name;
    info.minimum = minimum;
    info.maximum = maximum;
    info.defaultValue = defaultValue;
    info.unit = unit;
    info.taper = taper;
    info.step = step;
    return info;
}

class ParameterControlTest : public testing::Test {
protected:
    void SetUp() override {
        zentest::EnsureApplication();
        m_gain = m_link.Add(Continuous("GAIN", -24.0f, 24.0f, 0.0f, "dB", zen::ParameterTaper::Linear, 0.1f));
        m_frequency = m_link.Add(Continuous("FREQUENCY", 20.0f, 20000.0f, 1000.0f, "Hz", zen::ParameterTaper::Logarithmic));
        m_time = m_link.Add(Continuous("RELEASE", 1.0f, 2000.0f, 100.0f, "ms", zen::ParameterTaper::Logarithmic));
        m_mix = m_link.Add(Continuous("MIX", 0.0f, 100.0f, 100.0f, "%"));
        zen::ParameterInfo speed = Continuous("SPEED", 0.0f, 2.0f, 1.0f, "", zen::ParameterTaper::List, 1.0f);
        speed.kind = zen::ParameterKind::List;
        speed.choices = {"Slow", "Medium", "Fast"};
        m_speed = m_link.Add(speed);
        zen::ParameterInfo on = Continuous("ON", 0.0f, 1.0f, 1.0f, "", zen::ParameterTaper::List, 1.0f);
        on.kind = zen::ParameterKind::Switch;
        m_switch = m_link.Add(on);
    }

    ParameterControl* Make(std::uint32_t index) {
        m_controls.emplace_back(ParameterControl::Create(m_link, index));
        m_controls.back()->SyncFromLink();
        return m_controls.back().get();
    }

    zentest::FakeEditorLink m_link;
    std::vector<std::unique_ptr<ParameterControl>> m_controls;
    std::uint32_t m_gain = 0, m_frequency = 0, m_time = 0, m_mix = 0, m_speed = 0, m_switch = 0;
};

}  // namespace

TEST_F(ParameterControlTest, TypedEntryTakesUnitsAndPrefixesClampsAndRefusesNonsense) {
    ParameterControl* gain = Make(m_gain);
    EXPECT_TRUE(gain->EnterText("-6 dB"));
    EXPECT_FLOAT_EQ(m_link.values[m_gain], -6.0f);
    EXPECT_TRUE(gain->EnterText("\u22123.5"));
    EXPECT_FLOAT_EQ(m_link.values[m_gain], -3.5f);
    EXPECT_TRUE(gain->EnterText("99 dB"));
    EXPECT_FLOAT_EQ(m_link.values[m_gain], 24.0f);
    for (const char* nonsense : {"", "abc", "-6 Hz", "6 dB dB", "nan", "1e999"}) {
        EXPECT_FALSE(gain->EnterText(nonsense)) << nonsense;
        EXPECT_FLOAT_EQ(m_link.values[m_gain], 24.0f) << nonsense;
    }

    ParameterControl* frequency = Make(m_frequency);
    EXPECT_TRUE(frequency->EnterText("2.5k"));
    EXPECT_FLOAT_EQ(m_link.values[m_frequency], 2500.0f);
    EXPECT_TRUE(frequency->EnterText("12.5 kHz"));
    EXPECT_FLOAT_EQ(m_link.values[m_frequency], 12500.0f);
    EXPECT_TRUE(frequency->EnterText("5"));
    EXPECT_FLOAT_EQ(m_link.values[m_frequency], 20.0f);

    EXPECT_TRUE(Make(m_time)->EnterText("1.5 s"));
    EXPECT_FLOAT_EQ(m_link.values[m_time], 1500.0f);
    EXPECT_TRUE(Make(m_speed)->EnterText("fast"));
    EXPECT_FLOAT_EQ(m_link.values[m_speed], 2.0f);
    EXPECT_TRUE(Make(m_switch)->EnterText("Off"));
    EXPECT_FLOAT_EQ(m_link.values[m_switch], 0.0f);

    // Each accepted entry is one closed gesture.
    EXPECT_EQ(m_link.gestures, 9);
    EXPECT_EQ(m_link.openGestures, 0);
}

TEST_F(ParameterControlTest, ReadoutsCarryUnitAndSensiblePrecision) {
    EXPECT_EQ(Make(m_gain)->ValueText(-6.0f), QString::fromUtf8("\u22126.0 dB"));
    EXPECT_EQ(Make(m_gain)->ValueText(-0.01f), QStringLiteral("0.0 dB"));
    ParameterControl* frequency = Make(m_frequency);
    EXPECT_EQ(frequency->ValueText(2500.0f), QStringLiteral("2.50 kHz"));
    EXPECT_EQ(frequency->ValueText(12500.0f), QStringLiteral("12.5 kHz"));
    EXPECT_EQ(frequency->ValueText(250.0f), QStringLiteral("250 Hz"));
    EXPECT_EQ(frequency->ValueText(45.5f), QStringLiteral("45.5 Hz"));
    EXPECT_EQ(Make(m_mix)->ValueText(45.4f), QStringLiteral("45 %"));
    EXPECT_EQ(Make(m_time)->ValueText(12.54f), QStringLiteral("12.5 ms"));
    EXPECT_EQ(Make(m_speed)->ValueText(1.0f), QStringLiteral("Medium"));
    EXPECT_EQ(Make(m_switch)->ValueText(1.0f), QStringLiteral("On"));
}

TEST_F(ParameterControlTest, KnobDragsAlongTheTaperShiftIsTenTimesFinerDoubleClickResets) {
    auto* knob = dynamic_cast<ParameterKnob*>(Make(m_gain));
    ASSERT_NE(knob, nullptr);
    knob->resize(knob->sizeHint());
    const QPointF centre(knob->width() / 2.0, knob->height() / 2.0);
    const auto drag = [&](Qt::KeyboardModifiers modifiers) {
        m_link.values[m_gain] = 0.0f;
        knob->SyncFromLink();
        QMouseEvent press(QEvent::MouseButtonPress, centre, Qt::LeftButton, Qt::LeftButton, modifiers);
        QApplication::sendEvent(knob, &press);
        for (int i = 1; i <= 10; ++i) {
            QMouseEvent move(QEvent::MouseMove, centre - QPointF(0, i), Qt::NoButton, Qt::LeftButton, modifiers);
            QApplication::sendEvent(knob, &move);
        }
        QMouseEvent release(QEvent::MouseButtonRelease, centre - QPointF(0, 10), Qt::LeftButton, Qt::NoButton, modifiers);
        QApplication::sendEvent(knob, &release);
        return m_link.values[m_gain];
    };
    const float coarse = drag(Qt::NoModifier);
    const float fine = drag(Qt::ShiftModifier);
    EXPECT_GT(coarse, 0.0f);  // up is more
    EXPECT_NEAR(fine, coarse * 0.1f, coarse * 1e-3f);
    EXPECT_EQ(m_link.gestures, 2);
    EXPECT_EQ(m_link.openGestures, 0);
    EXPECT_EQ(knob->ShownValue(), fine);

    QMouseEvent twice(QEvent::MouseButtonDblClick, centre, Qt::LeftButton, Qt::LeftButton, Qt::NoModifier);
    QApplication::sendEvent(knob, &twice);
    EXPECT_FLOAT_EQ(m_link.values[m_gain], 0.0f);
}

TEST_F(ParameterControlTest, KnobEntryAppliesOnEnterAndEscapeCancels) {
    auto* knob = dynamic_cast<ParameterKnob*>(Make(m_frequency));
    ASSERT_NE(knob, nullptr);
    auto* field = knob->findChild<QLineEdit*>();
    ASSERT_NE(field, nullptr);
    const auto type = [&](const QString& text, int key) {
        knob->OpenTextEntry();
        EXPECT_TRUE(knob->IsTextEntryOpen());
        field->setText(text);
        QKeyEvent press(QEvent::KeyPress, key, Qt::NoModifier);
        QApplication::sendEvent(field, &press);
        EXPECT_FALSE(knob->IsTextEntryOpen());
    };
    type(QStringLiteral("3k"), Qt::Key_Escape);
    EXPECT_FLOAT_EQ(m_link.values[m_frequency], 1000.0f);
    type(QStringLiteral("3k"), Qt::Key_Return);
    EXPECT_FLOAT_EQ(m_link.values[m_frequency], 3000.0f);
    EXPECT_EQ(knob->ShownValue(), 3000.0f);
}
