// The editor of every registered plug-in: a control per parameter that moves
// its parameter along the library's taper and follows changes made elsewhere,
// and a lifetime that leaves no timer or thread behind.
#include <gtest/gtest.h>

#include <QAbstractEventDispatcher>
#include <QApplication>
#include <QComboBox>
#include <QDir>
#include <QLayout>
#include <QPointer>
#include <QScrollArea>
#include <QScrollBar>
#include <QTimer>
#include <cmath>
#include <memory>
#include <string>
#include <vector>

#include "Common/Editor/LevelBars.h"
#include "Common/Editor/ParameterControl.h"
#include "Common/Editor/ZenEditor.h"
#include "Support/TestApplication.h"
#include "zen/Zen.h"

namespace {

struct PluginCase {
    int kind;
    std::string key;
};

std::vector<PluginCase> EveryPlugin() {
    std::vector<PluginCase> cases;
    for (const int kind : {zen::kAudioPluginKind, zen::kControlPluginKind})
        for (const auto& entry : GetZenPluginInterface()->GetPluginList(kind)) cases.push_back({kind, entry.first});
    return cases;
}

std::string CaseName(const testing::TestParamInfo<PluginCase>& info) {
    std::string name = info.param.key.substr(0, info.param.key.find(':'));
    for (char& c : name)
        if (!std::isalnum(static_cast<unsigned char>(c))) c = '_';
    return name;
}

int ThreadCount() { return static_cast<int>(QDir(QStringLiteral("/proc/self/task")).count()) - 2; }

// A value away from the present one, so that a move is seen.
float OtherPosition(float position) { return position < 0.5f ? 0.8f : 0.2f; }

class EveryEditor : public testing::TestWithParam<PluginCase> {
protected:
    void SetUp() override {
        zentest::EnsureApplication();
        m_instance.reset(GetZenPluginInterface()->CreatePlugin(GetParam().kind, GetParam().key.c_str()));
        ASSERT_NE(m_instance, nullptr);
        m_host = zen::InterfaceCast<ZenControlValueHost>(m_instance.get());
        ASSERT_NE(m_host, nullptr);
        m_parameters = GetParam().kind == zen::kAudioPluginKind
                           ? static_cast<zen::PluginParameters*>(zen::InterfaceCast<AudioPlugin>(m_instance.get()))
                           : static_cast<zen::PluginParameters*>(zen::InterfaceCast<ControlPlugin>(m_instance.get()));
        ASSERT_NE(m_parameters, nullptr);
    }

    std::unique_ptr<zen::PluginInstance> m_instance;
    ZenControlValueHost* m_host = nullptr;
    zen::PluginParameters* m_parameters = nullptr;
};

}  // namespace

TEST_P(EveryEditor, HasOneControlPerParameterThatMovesItBothWays) {
    std::unique_ptr<QWidget> widget(static_cast<QWidget*>(m_parameters->CreateEditor(nullptr)));
    auto* editor = qobject_cast<ZenEditor*>(widget.get());
    ASSERT_NE(editor, nullptr);

    const std::uint32_t count = m_parameters->GetParameterCount();
    std::vector<int> controlsOf(count, 0);
    for (const ParameterControl* control : editor->findChildren<ParameterControl*>()) {
        ASSERT_LT(control->Index(), count);
        ++controlsOf[control->Index()];
    }
    for (std::uint32_t i = 0; i < count; ++i) {
        zen::ParameterInfo info;
        ASSERT_TRUE(m_parameters->GetParameterInfo(i, info));
        SCOPED_TRACE(info.identifier);
        EXPECT_EQ(controlsOf[i], 1);
        ParameterControl* control = editor->Control(i);
        ASSERT_NE(control, nullptr);
        EXPECT_FALSE(editor->GroupOf(i).isEmpty());
        EXPECT_EQ(control->ShownValue(), m_parameters->GetParameter(i));

        // The control's gesture lands on the instance where the library's
        // own taper puts the same position.
        const float target = OtherPosition(m_host->GetParameterPosition(i));
        control->SetPositionFromUser(target);
        const float moved = m_parameters->GetParameter(i);
        EXPECT_EQ(control->ShownValue(), moved);
        EXPECT_NEAR(ParameterControl::ValueToPosition(info, moved), m_host->GetParameterPosition(i), 1e-5f);
        m_host->SetParameterPosition(i, target);
        EXPECT_FLOAT_EQ(m_parameters->GetParameter(i), moved);

        // A change made elsewhere moves the control at the next refresh.
        m_host->SetParameterPosition(i, OtherPosition(target));
        editor->RefreshNow();
        EXPECT_EQ(control->ShownValue(), m_parameters->GetParameter(i));
        EXPECT_NE(control->ShownValue(), moved);
    }
}

TEST_P(EveryEditor, RefreshesOnlyWhileShownAndLeavesNoTimerOrThread) {
    const int threadsBefore = ThreadCount();
    auto* editor = static_cast<ZenEditor*>(static_cast<QWidget*>(m_parameters->CreateEditor(nullptr)));
    ASSERT_NE(editor, nullptr);
    QPointer<QTimer> timer = editor->findChild<QTimer*>();
    ASSERT_FALSE(timer.isNull());
    EXPECT_FALSE(editor->IsRefreshing());
    editor->show();
    EXPECT_TRUE(editor->IsRefreshing());
    QApplication::processEvents();
    editor->hide();
    EXPECT_FALSE(editor->IsRefreshing());
    EXPECT_TRUE(QAbstractEventDispatcher::instance()->registeredTimers(timer).isEmpty());
    editor->show();
    delete editor;
    QApplication::processEvents();
    EXPECT_TRUE(timer.isNull());
    EXPECT_EQ(ThreadCount(), threadsBefore);
}

TEST_P(EveryEditor, KeepsItsLookInALightHostAndOpensShowingEverything) {
    // A host window with its own light palette, as jalv.qt5 has.
    QWidget host;
    QPalette light;
    for (const auto role : {QPalette::Window, QPalette::Base, QPalette::Highlight, QPalette::Button})
        light.setColor(role, Qt::white);
    light.setColor(QPalette::WindowText, Qt::white);
    host.setPalette(light);
    auto* editor = static_cast<ZenEditor*>(static_cast<QWidget*>(m_parameters->CreateEditor(nullptr)));
    ASSERT_NE(editor, nullptr);
    editor->setParent(&host);
    for (const QWidget* widget : editor->findChildren<QWidget*>()) {
        SCOPED_TRACE(widget->metaObject()->className());
        for (const auto role : {QPalette::Window, QPalette::Base, QPalette::Highlight})
            EXPECT_EQ(widget->palette().color(role), editor->palette().color(role));
        EXPECT_NE(widget->palette().color(QPalette::WindowText), QColor(Qt::white));
    }

    // Opened at its size hint, nothing scrolls unless the hint met its cap.
    const QSize hint = editor->sizeHint();
    EXPECT_LE(hint.width(), 1600);
    EXPECT_LE(hint.height(), 1000);
    editor->resize(hint);
    editor->show();
    editor->layout()->activate();
    QApplication::processEvents();
    if (hint.height() < 1000) {
        for (const QScrollArea* scroll : editor->findChildren<QScrollArea*>())
            EXPECT_FALSE(scroll->verticalScrollBar()->isVisible());
    }

    // Captions drop their group's title; the tooltip keeps the label.
    for (std::uint32_t i = 0; i < m_parameters->GetParameterCount(); ++i) {
        const ParameterControl* control = editor->Control(i);
        ASSERT_NE(control, nullptr);
        SCOPED_TRACE(control->Info().identifier);
        EXPECT_FALSE(control->Caption().isEmpty());
        EXPECT_FALSE(control->Caption().startsWith(editor->GroupOf(i) + ' '));
        EXPECT_EQ(control->toolTip().toStdString(), control->Info().label);
    }

    // Every bar's name fits its column in two lines.
    for (const LevelBars* bars : editor->findChildren<LevelBars*>()) {
        if (bars->Bars().empty()) continue;
        const QFontMetrics metrics(bars->font());
        const int column = bars->sizeHint().width() / static_cast<int>(bars->Bars().size());
        for (const LevelBars::Bar& bar : bars->Bars()) {
            SCOPED_TRACE(bar.info.name);
            const QRect text = metrics.boundingRect(QRect(0, 0, column, 10 * metrics.height()),
                                                    Qt::AlignHCenter | Qt::TextWordWrap, QString::fromStdString(bar.info.name));
            EXPECT_LE(text.height(), metrics.height() + metrics.lineSpacing());
            EXPECT_LE(text.width(), column);
        }
    }

    // The preset box names the loaded preset until a parameter moves.
    for (QComboBox* box : editor->findChildren<QComboBox*>()) {
        if (box->count() < 2 || box->itemText(0) != QStringLiteral("Presets")) continue;
        box->setCurrentIndex(1);
        emit box->activated(1);
        editor->RefreshNow();
        EXPECT_EQ(editor->PresetCaption(), box->itemText(1));
        ParameterControl* control = editor->Control(0);
        control->SetPositionFromUser(OtherPosition(m_host->GetParameterPosition(0)));
        editor->RefreshNow();
        EXPECT_EQ(editor->PresetCaption(), QStringLiteral("Presets"));
    }
    delete editor;
}

INSTANTIATE_TEST_SUITE_P(Plugins, EveryEditor, testing::ValuesIn(EveryPlugin()), CaseName);
