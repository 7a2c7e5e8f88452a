// The editor of every registered plug-in: a control per parameter that moves
// its parameter along the library's taper and follows changes made elsewhere,
// and a lifetime that leaves no timer or thread behind.
#include <gtest/gtest.h>

#include <QAbstractEventDispatcher>
#include <QApplication>
#include <QDir>
#include <QPointer>
#include <QTimer>
#include <cmath>
#include <memory>
#include <string>
#include <vector>

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

INSTANTIATE_TEST_SUITE_P(Plugins, EveryEditor, testing::ValuesIn(EveryPlugin()), CaseName);
