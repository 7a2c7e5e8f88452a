#include <gtest/gtest.h>

#include "Common/Algorithms/NoteValue.h"

TEST(NoteValue, CaptionsAndBeatsAgree) {
    const zen::ParameterDefinition d = zen::NoteValueParameter("SYNC", "Sync", 0.0f);
    ASSERT_EQ(d.choices.size(), 17);
    EXPECT_EQ(zen::NoteValueBeats(0), 0.0);
    EXPECT_EQ(zen::NoteValueBeats(17), 0.0);
    // Every caption "a/b" with its T (2/3) or D (3/2), as quarter notes.
    for (int i = 1; i < d.choices.size(); ++i) {
        QString caption = d.choices[i];
        double factor = 1.0;
        if (caption.endsWith('T')) factor = 2.0 / 3.0;
        if (caption.endsWith('D')) factor = 1.5;
        if (factor != 1.0) caption.chop(1);
        const QStringList parts = caption.split('/');
        const double beats = 4.0 * parts[0].toDouble() / parts[1].toDouble() * factor;
        EXPECT_DOUBLE_EQ(zen::NoteValueBeats(i), beats) << d.choices[i].toStdString();
    }
    EXPECT_DOUBLE_EQ(zen::NoteValueMs(9, 120.0), 500.0);  // a quarter at 120 BPM
}
