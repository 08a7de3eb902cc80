#include "FeedParser/Parser.h"
#include "FeedParser/Text/Bounds.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Logger.h"

#include <libxml/xmlreader.h>
#include <cstring>

namespace Orvane::FeedParser {

using Foundation::AutoreleasePool;
using Foundation::Ref;

namespace {

const char* asText(const xmlChar* text) {
    return reinterpret_cast<const char*>(text);
}

/// What an element is called. libxml2 leaves a prefix that nothing declares in the name.
struct ElementName {
    explicit ElementName(const xmlNode* element)
        : uri(element->ns ? asText(element->ns->href) : nullptr),
          prefix(element->ns ? asText(element->ns->prefix) : nullptr),
          local(asText(element->name)) {
        const char* colon = element->ns ? nullptr : std::strchr(local, ':');
        if (!colon) return;
        undeclaredPrefix.assign(local, colon);
        prefix = undeclaredPrefix.c_str();
        local = colon + 1;
    }
    ElementName(const ElementName&) = delete;

    std::string undeclaredPrefix;
    const char* uri;
    const char* prefix;
    const char* local;
};

bool hasOwnBase(const xmlNode* element) {
    for (const xmlAttr* attribute = element->properties; attribute; attribute = attribute->next) {
        if (attribute->ns && std::strcmp(asText(attribute->name), "base") == 0) return true;
    }
    return false;
}

/// The element that the reader stands on, its start or its end.
xmlNodePtr currentElement(xmlTextReaderPtr reader) {
    return xmlTextReaderCurrentNode(reader);
}

}  // namespace

void Parser::handleStartElement() {
    if (!mSawFirstElement) {
        handleFirstElement();
        mSawFirstElement = true;
    }
    const xmlNodePtr element = currentElement(mReader);
    const bool isEmpty = xmlTextReaderIsEmptyElement(mReader) == 1;
    pushContext(element);
    const Ref<Context> context = mContextStack.back();
    if (isEmpty) {
        handleAttributes(element);
        popTopAndHandleIt();
    } else {
        handleContent(element, context.get());
    }
}

void Parser::handleFirstElement() {
    mDoc = xmlTextReaderCurrentDoc(mReader);
    if (mDoc) EntitySubset::shared().attachTo(mDoc);
}

void Parser::pushContext(const xmlNode* element) {
    const ElementName name(element);
    Ref<Context> child = Context::newChild(name.uri, name.prefix, name.local, mUndefinedNamespace);
    const Context& parent = *mContextStack.back();
    // To ask for the base of each element would walk up to the root each time.
    const bool isAsParent = mContextStack.size() > 1 && !hasOwnBase(element);
    child->baseURI = isAsParent ? parent.baseURI : asText(xmlTextReaderConstBaseUri(mReader));
    child->info = mInfo.get();
    mContextStack.push_back(child);
    child->start();
}

void Parser::handleContent(xmlNodePtr element, Context* context) {
    switch (context->getRawXMLType()) {
        case Context::RawXMLType::None:
            break;
        case Context::RawXMLType::Outer:
            readXML(context, true);
            break;
        case Context::RawXMLType::InnerThenChildren:
            readXML(context, false);
            break;
        case Context::RawXMLType::Inner:
            if (!readXML(context, false)) break;
            handleAttributes(element);
            advanceReaderToElementEnd(context->getLiteralTag());
            handleEndElement();
            break;
    }
}

bool Parser::readXML(Context* context, bool outer) {
    const std::int32_t errorsBefore = mErrorCount;
    std::optional<std::string> xml;
    // Reads up to the element's end, all of the document for a feed: an error on the way, however
    // slight, makes the attempt fail, so that imperfect documents are repaired.
    if (const xmlNodePtr element = xmlTextReaderExpand(mReader)) {
        xml = writeXML(element, context, outer);
    }
    if (!xml || mErrorCount != errorsBefore) {
        gLogParser.log("Fatal error: xmlTextReaderReadOuter/InnerXml failed");
        mFatalError = true;
        return false;
    }
    if (context->keepsRawXML()) context->raw = std::move(xml);
    return true;
}

std::optional<std::string> Parser::writeXML(xmlNodePtr element, const Context* context,
                                            bool outer) {
    if (!context->keepsRawXML() || mFatalError) return std::string();
    std::optional<std::string> xml = outer ? mRawXML.outer(element) : mRawXML.inner(element);
    return xml;
}

void Parser::handleAttributes(const xmlNode* element) {
    Context& context = *mContextStack.back();
    // The reader counts declarations of namespaces among the attributes, in front of the others.
    for (const xmlNs* space = element->nsDef; space; space = space->next) {
        const char* prefix = asText(space->prefix);
        context.gotAttribute(prefix ? "xmlns" : nullptr, prefix ? prefix : "xmlns",
                             asText(space->href));
    }
    for (xmlAttr* attribute = element->properties; attribute; attribute = attribute->next) {
        const char* prefix = attribute->ns ? asText(attribute->ns->prefix) : nullptr;
        const xmlNode* text = attribute->children;
        if (text && text->type == XML_TEXT_NODE && !text->next) {
            context.gotAttribute(prefix, asText(attribute->name), asText(text->content));
            continue;
        }
        xmlChar* value = xmlNodeListGetString(element->doc, attribute->children, 1);
        context.gotAttribute(prefix, asText(attribute->name), value ? asText(value) : "");
        xmlFree(value);
    }
}

void Parser::advanceReaderToElementEnd(Tag tag) {
    while (xmlTextReaderRead(mReader) == 1) {
        if (xmlTextReaderNodeType(mReader) != XML_READER_TYPE_END_ELEMENT) continue;
        const ElementName name(currentElement(mReader));
        if (Context::tagForString(name.local) == tag) return;
    }
}

void Parser::handleEndElement() {
    const xmlNode* element = currentElement(mReader);
    if (!element || element->type != XML_ELEMENT_NODE) return;
    const ElementName name(element);
    const Tag tag = Context::tagForString(name.local);
    if (!contextStackContainsLiteralTag(tag)) {
        Foundation::gWarn.log(
            "FeedParser::handleEndElement: no tag matching '%s' on stack! (localname='%s', "
            "prefix='%s')",
            tagName(tag), name.local, name.prefix ? name.prefix : "(null)");
        return;
    }
    Tag popped;
    do {
        popped = mContextStack.back()->getLiteralTag();
        popTopAndHandleIt();
    } while (popped != tag && mContextStack.size() >= 2);
}

bool Parser::contextStackContainsLiteralTag(Tag tag) const {
    for (auto context = mContextStack.rbegin(); context != mContextStack.rend(); ++context) {
        if ((*context)->getLiteralTag() == tag) return true;
    }
    return false;
}

void Parser::popTopAndHandleIt() {
    const AutoreleasePool pool;
    const Ref<Context> child = std::move(mContextStack.back());
    mContextStack.pop_back();
    child->end();
    for (auto context = mContextStack.rbegin(); context != mContextStack.rend(); ++context) {
        if ((*context)->handleFinishedChild(child.get())) break;
    }
}

}  // namespace Orvane::FeedParser
