#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Foundation/UTF8.h"
#include "Fuzz/FuzzTarget.h"
#include "Utilities/XMLDocumentReader.h"
#include "Utilities/XMLElement.h"

#include <cstdio>

using namespace Foundation;
using namespace Orvane;

namespace {

/// Whatever was read is written so that it can be read, and its children can be taken out.
void check(const XMLElement* element) {
    if (!element) return;
    const Ref<Data> written = element->ov_asData();
    std::string error;
    const Ref<XMLTree> again = readXMLDocument(written->view(), XMLTolerance::None, error);
    if (!again) {
        std::fprintf(stderr, "%s: %.*s\n", error.c_str(), static_cast<int>(written->view().size()),
                     written->view().data());
    }
    require(again.get() != nullptr);
    const Ref<String> document = element->ov_asDocumentString();
    const Ref<String> text = element->getStringValue();
    require(UTF8::isValid(text->view()) && UTF8::isValid(document->view()));
    const Ref<XMLElement::Elements> children = element->getElements();
    for (XMLElement* child : *children.get()) {
        child->detach();
        const Ref<String> alone = child->toString();
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const unsigned char* bytes, std::size_t size) {
    static NoLog sNoLog;
    const AutoreleasePool pool;
    const Ref<Data> data = Data::data(bytes, size);
    check(Ref<XMLElement>(XMLElement::ov_elementWithData(data, false)).get());
    check(Ref<XMLElement>(XMLElement::ov_elementWithData(data, true)).get());
    check(Ref<XMLElement>(XMLElement::ov_XHTMLElementWithData(data)).get());
    return 0;
}
