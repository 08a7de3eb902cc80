#include "Foundation/AutoreleasePool.h"
#include "Foundation/Logger.h"
#include "Foundation/URL.h"
#include "Model/AuthorCore.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Utilities/XMLElement.h"

#include <exception>
#include <string>

// An entry as an element of Atom (RFC 4287).

namespace Orvane {

using Foundation::AutoreleasePool;
using Foundation::Date;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using Foundation::URL;

namespace {

constexpr const char* kAtomNamespace = "http://www.w3.org/2005/Atom";
constexpr const char* kAtomType = "application/atom+xml";

void remove(XMLElement& element, const char* name) {
    element.ov_removeChildrenWithLocalName(name, kAtomNamespace);
}

/// A new child of Atom's namespace, whatever the default one is where it stands.
Ref<XMLElement> add(XMLElement& element, const char* name) {
    const Ref<XMLElement> child = XMLElement::element(name, kAtomNamespace);
    const Ref<XMLNode> added = element.addChild(child.get());
    return static_cast<XMLElement*>(added.get());
}

/// Adds nothing without a text. `type` is an attribute, null for none. Whether there was a text.
bool addText(XMLElement& element, const char* name, const String* text,
             const String* type = nullptr) {
    if (String::isEmpty(text)) return false;
    const Ref<XMLElement> child = add(element, name);
    if (type) child->setAttribute("type", type);
    child->addText(text);
    return true;
}

void addLink(XMLElement& element, const URL* url, const char* relation, const String* type,
             long long length) {
    if (!url) return;
    const Ref<XMLElement> link = add(element, "link");
    link->setAttribute("rel", relation);
    if (!String::isEmpty(type)) link->setAttribute("type", type);
    link->setAttribute("href", url->text());
    if (length != 0) link->setAttribute("length", std::to_string(length));
}

void replaceDateElement(XMLElement& element, const char* name, const Date* date) {
    remove(element, name);
    if (!date) return;
    const Ref<String> text = date->toStringUsingFormat(Date::getAtomFormat());
    addText(element, name, text.get());
}

/// Whether the data could be read as XHTML; without children, nothing is added.
bool addXHTML(XMLElement& element, const char* name, const ContentCore& content) {
    const Foundation::Data* data = content.getData();
    const Ref<XMLElement> division = data ? XMLElement::ov_XHTMLElementWithData(data) : nullptr;
    if (!division.get()) return false;
    if (division->getChildCount() == 0) return true;
    const Ref<XMLElement> child = add(element, name);
    child->setAttribute("type", "xhtml");
    const Ref<XMLNode> added = child->addChild(division.get());
    return true;
}

void replaceContentElement(XMLElement& element, const char* name, const ContentCore* content) {
    remove(element, name);
    if (!content) return;
    Ref<String> type = content->getAtomType();
    if (type->view() == "xhtml") {
        if (addXHTML(element, name, *content)) return;
        type = String::string("html");
    }
    addText(element, name, content->getAtomString(false), type.get());
}

void addAuthor(XMLElement& element, const AuthorCore& author) {
    const Ref<XMLElement> child = add(element, "author");
    addText(*child, "name", author.mName);
    addText(*child, "email", author.mEmail);
    if (const URL* url = author.mURL) addText(*child, "uri", url->getString());
}

void removeWhatColumnsHave(XMLElement& element) {
    remove(element, "title");
    remove(element, "id");
    remove(element, "author");
    for (const char* relation : {"alternate", "enclosure"}) {
        element.ov_removeChildrenWithLocalName("link", kAtomNamespace, "rel", relation);
    }
}

}  // namespace

Returner<XMLElement> EntryCore::_parseXMLRepresentation() const {
    const ContentCore* source = getXMLRepresentation();
    return source ? XMLElement::ov_elementWithData(source->getData(), false) : nullptr;
}

Returner<XMLElement> EntryCore::getXMLElement(bool stripped) const {
    const AutoreleasePool pool;
    try {
        Ref<XMLElement> element = _parseXMLRepresentation();
        if (element.get() && stripped) _updateAtomXML(*element, true);
        return element;
    } catch (const std::exception& exception) {
        Foundation::gWarn.log("EntryCore::getXMLElement: %s", exception.what());
        return nullptr;
    }
}

const char* EntryCore::_updateAtomXML(XMLElement& element, bool removeOnly) const {
    removeWhatColumnsHave(element);
    if (removeOnly) {
        for (const char* name : {"published", "updated", "content", "summary"}) {
            remove(element, name);
        }
        return kAtomType;
    }
    if (!addText(element, "title", mTitle)) const Ref<XMLElement> empty = add(element, "title");
    const Ref<String> html = String::string("text/html");
    addLink(element, mAlternateURL, "alternate", html.get(), 0);
    addText(element, "id", mID);
    replaceDateElement(element, "published", mDatePublished);
    replaceDateElement(element, "updated", mDateUpdated);
    replaceContentElement(element, "content", getContent());
    replaceContentElement(element, "summary", getSummary());
    if (const AuthorCore* author = getAuthor()) addAuthor(element, *author);
    for (auto enclosure = getEnclosures(nullptr); enclosure.hasRow(); enclosure.nextRow()) {
        addLink(element, enclosure->mURL, "enclosure", enclosure->mMIMEType, enclosure->mLength);
    }
    return kAtomType;
}

}  // namespace Orvane
