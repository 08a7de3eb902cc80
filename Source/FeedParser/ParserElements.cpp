#include "FeedParser/Parser.h"
#include "FeedParser/Text/Bounds.h"
#include "FeedParser/Text/XMLMending.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Logger.h"
#include "Utilities/XMLText.h"

#include <libxml/xmlreader.h>
#include <cstring>
#include <limits>
#include <utility>

namespace Orvane::FeedParser {

using Foundation::AutoreleasePool;
using Foundation::Data;
using Foundation::Ref;

namespace {

/// What an element is called. libxml2 leaves a prefix that nothing declares in the name.
struct ElementName {
    explicit ElementName(const xmlNode* element)
        : uri(element->ns ? xmlCString(element->ns->href) : nullptr),
          prefix(element->ns ? xmlCString(element->ns->prefix) : nullptr),
          local(xmlCString(element->name)) {
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
        if (attribute->ns && std::strcmp(xmlCString(attribute->name), "base") == 0) return true;
    }
    return false;
}

/// Reads the values of attributes, with the entities that they refer to up to a bound.
class AttributeText {
 public:
    /// `entityBytes` counts what entities have come to so far.
    explicit AttributeText(std::size_t& entityBytes) : mEntityBytes(entityBytes) {}

    std::string read(const xmlNode* parts) {
        append(parts, 0);
        return std::move(mText);
    }

 private:
    void append(const xmlNode* part, int depth) {
        constexpr int kDeepest = 16;
        for (; part && depth < kDeepest; part = part->next) {
            if (part->type == XML_TEXT_NODE) {
                appendText(xmlCString(part->content), depth);
            } else if (part->type == XML_ENTITY_REF_NODE && part->children && isWithinBound()) {
                append(reinterpret_cast<const xmlEntity*>(part->children)->children, depth + 1);
            }
        }
    }

    void appendText(const char* text, int depth) {
        if (!text) return;
        const std::size_t before = mText.size();
        mText += text;
        if (depth > 0) mEntityBytes += mText.size() - before;
    }

    bool isWithinBound() {
        // A reference costs something as well, also one to an empty entity.
        constexpr std::size_t kReferenceBytes = 8;
        constexpr std::size_t kHit = std::numeric_limits<std::size_t>::max();
        if (mEntityBytes <= Bounds::kEntityBytes) {
            mEntityBytes += kReferenceBytes;
            return true;
        }
        if (std::exchange(mEntityBytes, kHit) != kHit) {
            Bounds::logHit("bytes of entities", Bounds::kEntityBytes);
        }
        return false;
    }

    std::string mText;
    std::size_t& mEntityBytes;
};

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
    if (!pushContext(element)) return;
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

/// False where the element is one entry too many.
bool Parser::pushContext(const xmlNode* element) {
    const ElementName name(element);
    // A repair has declared the prefix, about which there was no error before it.
    if (name.uri && XMLMending::isMadeUpNamespace(name.uri)) mUndefinedNamespace = true;
    Ref<Context> child = Context::newChild(name.uri, name.prefix, name.local, mUndefinedNamespace);
    const bool isEntry = child->tag == EntryTag || child->tag == ItemTag;
    if (isEntry && ++mEntries > Bounds::kEntries) {
        Bounds::logHit("entries", Bounds::kEntries);
        mInfo->done = true;
        return false;
    }
    const Context& parent = *mContextStack.back();
    // To ask for the base of each element would walk up to the root each time.
    const bool isAsParent = mContextStack.size() > 1 && !hasOwnBase(element);
    child->baseURI = isAsParent ? parent.baseURI : xmlCString(xmlTextReaderConstBaseUri(mReader));
    child->info = mInfo.get();
    mContextStack.push_back(child);
    child->start();
    return true;
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
    // Reads up to the element's end, all of the document for a feed: an error on the way, however
    // slight, makes the attempt fail, so that imperfect documents are repaired.
    // The last attempt takes what libxml2 can recover from: nothing would be left to repair it.
    const xmlNodePtr element = xmlTextReaderExpand(mReader);
    const bool isGood = mErrorCount == errorsBefore || (mIsLastAttempt && !mFatalError);
    if (element && isGood && keepXML(element, context, outer)) return true;
    gLogParser.log("Fatal error: xmlTextReaderReadOuter/InnerXml failed");
    mFatalError = true;
    return false;
}

/// False if the XML cannot be written.
bool Parser::keepXML(xmlNodePtr element, Context* context, bool outer) {
    if (!mayKeepXML(context)) return true;
    context->raw = outer ? mRawXML.outer(element) : mRawXML.inner(element);
    if (!context->raw) return false;
    mRawBytes += context->raw->size();
    return true;
}

bool Parser::mayKeepXML(const Context* context) {
    // What is made of a failed attempt is thrown away.
    if (!context->keepsRawXML() || mFatalError) return false;
    const std::size_t most =
        Bounds::kRawXMLBytes + Bounds::kRawXMLFactor * Data::asBytes(mData.get()).getLength();
    if (mRawBytes <= most) return true;
    if (!std::exchange(mHitRawBytes, true)) Bounds::logHit("bytes of raw XML", most);
    return false;
}

void Parser::handleAttributes(const xmlNode* element) {
    Context& context = *mContextStack.back();
    // The reader counts declarations of namespaces among the attributes, in front of the others.
    for (const xmlNs* space = element->nsDef; space; space = space->next) {
        const char* prefix = xmlCString(space->prefix);
        context.gotAttribute(prefix ? "xmlns" : nullptr, prefix ? prefix : "xmlns",
                             xmlCString(space->href));
    }
    for (const xmlAttr* attribute = element->properties; attribute; attribute = attribute->next) {
        const char* prefix = attribute->ns ? xmlCString(attribute->ns->prefix) : nullptr;
        const xmlNode* text = attribute->children;
        if (text && text->type == XML_TEXT_NODE && !text->next) {
            context.gotAttribute(prefix, xmlCString(attribute->name), xmlCString(text->content));
            continue;
        }
        const std::string value = AttributeText(mEntityBytes).read(text);
        context.gotAttribute(prefix, xmlCString(attribute->name), value.c_str());
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
