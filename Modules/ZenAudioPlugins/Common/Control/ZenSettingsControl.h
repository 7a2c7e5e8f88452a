// Base of the console's control plug-ins: each edits one settings document
// of the host core.
//
// The state text is the document itself, as XML. LoadState takes a whole
// document and refuses one that does not pass its schema (changing
// nothing); attributes it leaves out take their defaults. The numeric
// settings of the document's single records and fixed arrays are also
// parameters, so hosts and control surfaces can bind them: identifier
// "<Class>::<KEY>" from the setting's key ("channel3.eq1Frequency" ->
// "BChainSettings::CHANNEL3_EQ1_FREQUENCY"), label "Channel 3 EQ 1 Frequency".
// Lists (bindings, destinations) and texts live in the document only.
#pragma once

#include <mutex>
#include <string>
#include <vector>

#include "Common/ZenControlPluginImpl.h"
#include "HostCore/Settings/SettingsDocument.h"

class ZenSettingsControl : public ZenControlPluginImpl {
public:
    std::string SaveState() const override;
    bool LoadState(const std::string& state) override;

    const zen::host::DocumentSchema& Schema() const { return m_schema; }
    // The document as the parameters leave it.
    zen::host::SettingsDocument Document() const;

protected:
    ZenSettingsControl(const char* className, const zen::host::DocumentSchema& schema);

    bool OnParameterChanged(std::uint32_t index, float value) override;

private:
    struct Binding {
        std::size_t section, record, field;
    };
    struct Table {
        zen::ParameterTableDefinition definitions;
        std::vector<Binding> bindings;  // by parameter index
    };
    static const Table& TableOf(const char* className, const zen::host::DocumentSchema& schema);

    const zen::host::DocumentSchema& m_schema;
    const Table& m_table;
    mutable std::mutex m_mutex;  // the document: state calls against each other
    zen::host::SettingsDocument m_document;
};
