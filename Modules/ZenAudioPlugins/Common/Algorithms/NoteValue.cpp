#include "NoteValue.h"

#include <QCoreApplication>
#include <iterator>

namespace zen {

namespace {

// In list order after "Off", quarter notes each.
constexpr double kBeats[] = {0.125,       0.25 * 2.0 / 3.0, 0.25, 0.5 * 2.0 / 3.0, 0.375, 0.5, 2.0 / 3.0, 0.75, 1.0,
                             4.0 / 3.0, 1.5,              2.0,  3.0,             4.0,   8.0, 16.0};

}  // namespace

ParameterDefinition NoteValueParameter(const char* name, const char* label, float defaultValue) {
    return ListParameter(name, label,
                         {QT_TRANSLATE_NOOP("NoteValue", "Off"), "1/32", "1/16T", "1/16", "1/8T", "1/16D", "1/8",
                          "1/4T", "1/8D", "1/4", "1/2T", "1/4D", "1/2", "1/2D", "1/1", "2/1", "4/1"},
                         defaultValue);
}

double NoteValueBeats(int index) {
    if (index < 1 || index > static_cast<int>(std::size(kBeats))) return 0.0;
    return kBeats[index - 1];
}

}  // namespace zen
