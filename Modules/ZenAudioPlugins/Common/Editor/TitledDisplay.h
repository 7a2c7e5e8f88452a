// A display that paints itself under a centred title and is sized in lines
// of its font, so that it reads the same at every scale factor.
#pragma once

#include <QPainter>
#include <QSize>
#include <QString>

#include "EditorDisplay.h"

class TitledDisplay : public EditorDisplay {
    Q_OBJECT

protected:
    // Sizes in lines of text: the preferred one and the least that stays readable.
    TitledDisplay(const QString& title, QSize lines, QSize minimumLines, QWidget* parent);

    // Antialiases `painter`, draws the title in the text colour and leaves
    // that pen set; returns the height of a line.
    double PaintTitle(QPainter& painter) const;

    QSize sizeHint() const override;
    QSize minimumSizeHint() const override;

private:
    QString m_title;
    QSize m_lines, m_minimumLines;
};
