#include "ConsoleDocuments.h"

#include <pugixml.hpp>

#include "BChainDocument.h"
#include "IOInterfaceDocument.h"
#include "OscillatorDocument.h"
#include "PerformanceDocument.h"
#include "RemoteControlDocument.h"
#include "TalkbackDocument.h"

namespace zen::host {

const std::vector<const DocumentSchema*>& ConsoleDocuments() {
    static const std::vector<const DocumentSchema*> schemas = {
        &BChainDocument::Schema(),      &IOInterfaceDocument::Schema(),   &OscillatorDocument::Schema(),
        &PerformanceDocument::Schema(), &RemoteControlDocument::Schema(), &TalkbackDocument::Schema()};
    return schemas;
}

const DocumentSchema* FindConsoleDocument(const std::string& root) {
    for (const DocumentSchema* schema : ConsoleDocuments())
        if (schema->root == root) return schema;
    return nullptr;
}

std::string DocumentRoot(const std::string& xml) {
    pugi::xml_document doc;
    if (!doc.load_buffer(xml.data(), xml.size())) return {};
    return doc.document_element().name();
}

}  // namespace zen::host
