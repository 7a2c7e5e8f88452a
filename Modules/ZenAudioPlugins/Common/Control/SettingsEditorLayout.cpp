// The editors of the six settings control plug-ins: a group per record of
// the document, in document order ("Tone"; "Channel 1", "Channel 2", ...),
// holding the record's fields as the control plug-in numbers them (texts
// and lists live in the document only and get no control).
#include <string>
#include <vector>

#include "BChainSettings.h"
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/ZenEditor.h"
#include "HostCore/Settings/Documents/BChainDocument.h"
#include "HostCore/Settings/Documents/IOInterfaceDocument.h"
#include "HostCore/Settings/Documents/OscillatorDocument.h"
#include "HostCore/Settings/Documents/PerformanceDocument.h"
#include "HostCore/Settings/Documents/RemoteControlDocument.h"
#include "HostCore/Settings/Documents/TalkbackDocument.h"
#include "IOInterfaceSettings.h"
#include "OscillatorSettings.h"
#include "PerformanceTesting.h"
#include "RemoteControlSettings.h"
#include "TalkbackSettings.h"

namespace {

using zen::host::DocumentSchema;
using zen::host::FieldType;
using zen::host::SectionSchema;

void BuildSettingsEditor(ZenEditor& editor, const DocumentSchema& schema) {
    const std::uint32_t count = editor.Link().GetParameterCount();
    std::uint32_t index = 0;
    for (const SectionSchema& section : schema.sections) {
        if (section.IsList()) continue;
        for (std::size_t r = 0; r < section.maximumCount; ++r) {
            std::vector<std::string> identifiers;
            for (const zen::host::FieldSchema& field : section.fields) {
                if (field.type == FieldType::Text) continue;
                zen::ParameterInfo info;
                if (index < count && editor.Link().GetParameterInfo(index, info))
                    identifiers.push_back(info.identifier);
                ++index;
            }
            if (identifiers.empty()) continue;
            const QString title = QString::fromStdString(section.label);
            editor.AddGroup(section.IsSingle() ? title : QString("%1 %2").arg(title).arg(r + 1), identifiers);
        }
    }
}

template <const DocumentSchema& (*Schema)()>
void Build(ZenEditor& editor) {
    BuildSettingsEditor(editor, Schema());
}

const EditorLayoutRegistry::Entry kLayouts[] = {
    {BChainSettings::kClassName, &Build<&zen::host::BChainDocument::Schema>},
    {IOInterfaceSettings::kClassName, &Build<&zen::host::IOInterfaceDocument::Schema>},
    {OscillatorSettings::kClassName, &Build<&zen::host::OscillatorDocument::Schema>},
    {PerformanceTesting::kClassName, &Build<&zen::host::PerformanceDocument::Schema>},
    {RemoteControlSettings::kClassName, &Build<&zen::host::RemoteControlDocument::Schema>},
    {TalkbackSettings::kClassName, &Build<&zen::host::TalkbackDocument::Schema>},
};

}  // namespace
