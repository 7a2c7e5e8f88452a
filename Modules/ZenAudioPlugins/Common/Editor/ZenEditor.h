// The editor of every plug-in: a header (name, presets, bypass, latency), the
// plug-in's displays, and its parameters in groups, each with a control that
// knows the parameter's unit, range, taper and choices. Built on a link, so
// the same editor runs beside an instance (zenfx) or over ports (LV2 UI).
//
// A layout function (EditorLayoutRegistry) arranges the class's editor with
// AddGroup / AddDisplay / AddMeters; parameters it does not place still get a
// control, in a last group. One timer at kDisplayRate refreshes displays and
// meters and moves controls to values changed elsewhere (host automation);
// it stops when the editor is hidden and dies with it.
#pragma once

#include <QString>
#include <QWidget>
#include <cstdint>
#include <functional>
#include <initializer_list>
#include <memory>
#include <string>
#include <vector>

#include "zen/EditorLink.h"

class EditorDisplay;
class ParameterControl;
class QTimer;

class ZenEditor : public QWidget {
    Q_OBJECT

public:
    static constexpr int kDisplayRate = 30;  // refreshes per second

    // Builds the editor of `className` on `link` (kept; must outlive the
    // editor unless owned) with the class's registered layout, or the
    // default one.
    static ZenEditor* Create(const char* className, const QString& title, zen::EditorLink& link,
                             QWidget* parent = nullptr);
    static ZenEditor* Create(const char* className, const QString& title, std::unique_ptr<zen::EditorLink> link,
                             QWidget* parent = nullptr);

    ~ZenEditor() override;

    zen::EditorLink& Link() const { return *m_link; }
    const char* ClassName() const { return m_className; }

    // Index of a parameter or meter by the part of its identifier after
    // "::" ("THRESHOLD") or by its whole identifier; -1 when there is none.
    int FindParameter(const char* name) const;
    int FindMeter(const char* name) const;

    // Layout functions: a titled group of controls for the named parameters
    // (names as FindParameter; unknown names are skipped), a display in the
    // display row (the editor takes it), a titled group of level bars for
    // the named meters ("INPUT_PEAK" takes every channel's
    // "INPUT_PEAK_<n>").
    void AddGroup(const QString& title, std::initializer_list<const char*> parameters);
    // The same with names made at run time (the control plug-ins' records).
    void AddGroup(const QString& title, const std::vector<std::string>& parameters);
    void AddDisplay(EditorDisplay* display, int stretch = 1);
    void AddMeters(const QString& title, std::initializer_list<const char*> meters);
    // Runs at every refresh, after the displays.
    void OnRefresh(std::function<void()> callback);

    // For tests and hosts.
    ParameterControl* Control(std::uint32_t parameterIndex) const;
    const std::vector<EditorDisplay*>& Displays() const { return m_displays; }
    void RefreshNow();  // one refresh, as the timer does
    bool IsRefreshing() const;  // the timer runs (while shown)

    // The group a layout placed a parameter in; empty when it has no control.
    QString GroupOf(std::uint32_t parameterIndex) const;
    // What the header's preset box reads: the loaded preset until a
    // parameter moves, else "Presets".
    QString PresetCaption() const;

    // Everything shown (no scrolling), within a screen's size.
    QSize sizeHint() const override;

protected:
    void showEvent(QShowEvent* event) override;
    void hideEvent(QHideEvent* event) override;

private:
    ZenEditor(const char* className, const QString& title, zen::EditorLink& link,
              std::unique_ptr<zen::EditorLink> ownedLink, QWidget* parent);
    void BuildDefaultLayout();
    void Finish();
    void BuildHeader(const QString& title);
    void ApplyLook();
    void UpdatePresetCaption();
    // Next free grid cell of the group area for a group of `cells` controls.
    void PlaceGroup(QWidget* group, int cells);
    // A titled group of controls for these parameters, placed as `cells`.
    void PlaceControls(const QString& title, const std::vector<std::uint32_t>& indices, int cells);

    std::unique_ptr<zen::EditorLink> m_ownedLink;
    zen::EditorLink* m_link;
    const char* m_className;
    std::vector<ParameterControl*> m_controls;  // by parameter index; null until placed
    std::vector<EditorDisplay*> m_displays;
    std::vector<std::function<void()>> m_refreshCallbacks;
    QTimer* m_timer = nullptr;
    // Layout containers (header, display row, group area) belong to the
    // implementation.
    struct Layout;
    std::unique_ptr<Layout> m_layout;
};
