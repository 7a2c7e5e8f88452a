// A display of an editor: a widget the editor refreshes at its display rate
// (ZenEditor::kDisplayRate) on the UI thread. Refresh reads what it shows
// through the editor's link (meters, rings, parameter values) and repaints;
// it never touches the audio path.
#pragma once

#include <QWidget>

#include "zen/EditorLink.h"

class EditorDisplay : public QWidget {
    Q_OBJECT

public:
    explicit EditorDisplay(QWidget* parent = nullptr) : QWidget(parent) {}

    // Reads the link and schedules a repaint when anything changed.
    virtual void Refresh(const zen::EditorLink& link) = 0;
};
