// A reading in large type under its caption: a pitch shift, a measured
// offset, the channel a walk has reached. The update function turns the
// link's values into the text, unit included.
#pragma once

#include <QString>
#include <cstdint>
#include <functional>

#include "EditorDisplay.h"

class ReadoutDisplay : public EditorDisplay {
    Q_OBJECT

public:
    using Update = std::function<QString(const zen::EditorLink& link)>;

    ReadoutDisplay(const QString& caption, Update update, QWidget* parent = nullptr);
    // A meter's reading with `decimals` places and the meter's unit.
    static ReadoutDisplay* ForMeter(const QString& caption, std::uint32_t meter, int decimals,
                                    QWidget* parent = nullptr);
    // A meter that reads 0 or 1 as one of two words.
    static ReadoutDisplay* ForState(const QString& caption, std::uint32_t meter, const QString& off, const QString& on,
                                    QWidget* parent = nullptr);

    void Refresh(const zen::EditorLink& link) override;
    const QString& Text() const { return m_text; }

protected:
    void paintEvent(QPaintEvent* event) override;
    QSize sizeHint() const override;

private:
    static constexpr double kValueScale = 2.0;  // of the font's size

    QFont ValueFont() const;

    QString m_caption;
    Update m_update;
    QString m_text;
    QString m_widest;  // the widest text shown, so the box never shrinks under it
};
