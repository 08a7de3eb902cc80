// What XMLElement adds to a plain tree: whole documents, and children made from values.

#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "Foundation/TimeZone.h"
#include "Utilities/XMLDocumentReader.h"
#include "Utilities/XMLElement.h"

#include <libxml/tree.h>
#include <locale.h>

#include <cmath>
#include <ctime>
#include <memory>
#include <new>

namespace Orvane {

using namespace Foundation;

namespace {

constexpr double kAbsoluteTimeStart = 978307200;  ///< 2001-01-01 in the count of Unix
constexpr int kIndented = 1;

using Buffer = std::unique_ptr<xmlBuffer, void (*)(xmlBuffer*)>;

/// A time in the default zone, as the C library has it.
struct LocalTime {
    explicit LocalTime(const Date& date) {
        TimeZone* zone = TimeZone::defaultZone();
        const std::int32_t offset = zone->getSecondsFromGMT(date.getAbsoluteTime());
        const auto seconds =
            static_cast<std::time_t>(std::floor(date.getAbsoluteTime() + kAbsoluteTimeStart));
        const std::time_t shown = seconds + offset;
        gmtime_r(&shown, &parts);
        parts.tm_gmtoff = offset;
        parts.tm_zone = zone->getName().c_str();
    }
    std::tm parts{};
};

/// The text of a date by a format of `strftime`, whatever language the process speaks.
std::string calendarText(const Date& date, const std::string& format) {
    static const locale_t sPlain = newlocale(LC_ALL_MASK, "C", nullptr);
    const LocalTime local(date);
    // The final mark tells an empty result from one that has no room.
    const std::string marked = format + '.';
    for (std::string text(64, '\0');; text.resize(2 * text.size())) {
        const std::size_t length =
            strftime_l(text.data(), text.size(), marked.c_str(), &local.parts, sPlain);
        if (length > 0) return text.substr(0, length - 1);
    }
}

/// Reads with one tolerance after the other, until one gives a document.
Ref<XMLTree> readTolerantly(std::string_view bytes, bool allowHTML, std::string& error) {
    const XMLTolerance all[] = {XMLTolerance::None,
                                allowHTML ? XMLTolerance::XMLOrHTML : XMLTolerance::XML};
    for (const XMLTolerance tolerance : all) {
        error.clear();
        const Ref<XMLTree> tree = readXMLDocument(bytes, tolerance, error);
        if (tree) return tree;
    }
    return nullptr;
}

}  // namespace

Returner<XMLElement> XMLElement::ov_elementWithData(const Data* data, bool allowHTML) {
    if (!data) return nullptr;
    try {
        std::string error;
        const Ref<XMLTree> tree = readTolerantly(data->view(), allowHTML, error);
        if (tree) return rootOf(tree);
        const Ref<String> reason = String::string(std::move(error));
        gWarn.log("Couldn't parse XML data, error='%@'", reason);
    } catch (const std::exception& exception) {
        gWarn.log("Exception parsing XML: %s", exception.what());
    }
    return nullptr;
}

Returner<XMLElement> XMLElement::ov_XHTMLElementWithData(const Data* data) {
    OV_ASSERT_AS(data, "data");
    std::string text = "<?xml version='1.0' encoding='UTF-8'?><div xmlns='";
    text.append(kXHTMLNamespace).append("'>").append(data->view()).append("</div>");
    const Ref<Data> wrapped = Data::adopt(std::move(text));
    const Ref<XMLElement> wrapper = ov_elementWithData(wrapped, false);
    if (!wrapper || wrapper->getChildCount() != 1) return wrapper;
    const Ref<Elements> only = wrapper->getElements("div", kXHTMLNamespace);
    if (only->isEmpty()) return wrapper;
    const Ref<XMLElement> child = only->at(0);
    child->detach();
    return child;
}

Returner<XMLElement> XMLElement::elementWithHTML(const Data* data, std::string* error) {
    std::string reason;
    const Ref<XMLTree> tree =
        data ? readXMLDocument(data->view(), XMLTolerance::HTML, reason) : nullptr;
    if (error) *error = std::move(reason);
    return tree ? rootOf(tree) : nullptr;
}

DataReturner XMLElement::ov_asData() const {
    const Ref<XMLTree> copy = copyToTree();
    const Buffer buffer(xmlBufferCreate(), xmlBufferFree);
    if (!buffer) throw std::bad_alloc();
    xmlNodeDump(buffer.get(), copy->document(), copy->document()->children, 0, kIndented);
    return Data::adopt(std::string(xmlView(xmlBufferContent(buffer.get()))));
}

StringReturner XMLElement::ov_asDocumentString() const {
    const Ref<XMLTree> copy = copyToTree();
    xmlChar* text = nullptr;
    int size = 0;
    xmlDocDumpFormatMemoryEnc(copy->document(), &text, &size, "UTF-8", kIndented);
    if (!text) throw std::bad_alloc();
    const std::unique_ptr<xmlChar, void (*)(xmlChar*)> held(text, [](xmlChar* c) { xmlFree(c); });
    return String::string(std::string(xmlView(text)));
}

Returner<XMLElement> XMLElement::ov_addChildWithName(TextArgument name, TextArgument stringValue) {
    if (stringValue.isEmpty()) return nullptr;
    Ref<XMLElement> child = ov_addChildWithName(name);
    child->addText(stringValue);
    return child;
}

Returner<XMLElement> XMLElement::ov_addChildWithName(TextArgument name, const Date* dateValue,
                                                     TextArgument calendarFormat) {
    if (!dateValue) return nullptr;
    return ov_addChildWithName(name, calendarText(*dateValue, std::string(calendarFormat.view())));
}

Returner<XMLElement> XMLElement::ov_addChildWithName(TextArgument name, const Date* dateValue,
                                                     DateFormatter* format) {
    if (!dateValue) return nullptr;
    const Ref<String> text = dateValue->toStringUsingFormat(format);
    return ov_addChildWithName(name, text);
}

Returner<XMLElement> XMLElement::ov_addLinkTo(const URL* url, TextArgument rel, TextArgument type,
                                              std::uint64_t length) {
    if (!url) return nullptr;
    Ref<XMLElement> link = ov_addChildWithName("link");
    link->setAttribute("rel", rel);
    if (!type.isEmpty()) link->setAttribute("type", type);
    link->setAttribute("href", url->text());
    if (length != 0) link->setAttribute("length", std::to_string(length));
    return link;
}

void XMLElement::ov_removeChildrenWithLocalName(TextArgument name, TextArgument uri) {
    ov_removeChildrenWithLocalName(name, uri, nullptr, nullptr);
}

void XMLElement::ov_removeChildrenWithLocalName(TextArgument name, TextArgument uri,
                                                TextArgument attribute, TextArgument value) {
    const Ref<String> wanted = value.isNull() ? nullptr : String::string(std::string(value.view()));
    const Ref<Elements> children = getElements(name, uri);
    for (XMLElement* child : *children.get()) {
        const Ref<String> present = attribute.isNull() ? nullptr : child->getAttribute(attribute);
        const bool isEqual =
            present && wanted && Compare(present, wanted, CompareOptions::CaseInsensitive) == 0;
        if (!present || isEqual) child->detach();
    }
}

}  // namespace Orvane
