#pragma once

#include "FeedParser/Info.h"
#include "FeedParser/Tag.h"
#include "Foundation/Ref.h"
#include "Foundation/RefCounted.h"
#include "Foundation/URL.h"

#include <cstdint>
#include <optional>
#include <string>

namespace Orvane::FeedParser {

/// What one element of a document means, while that is read and until its parent has taken what it
/// wants. Chosen by the element's name alone, never by its parent, so that one set of contexts
/// reads every dialect and mixtures of them.
///
/// An element's context is made, `start`ed and, if it asks for raw XML of the last kind or is
/// empty, given the attributes. At the element's end it is `end`ed and then offered to the
/// contexts around it, the nearest first, until one takes it.
///
/// A tag other than `UnknownTag` has one class of context, whichever vocabulary it came from: who
/// looks at a child's tag knows its class.
class Context : public Foundation::RefCounted {
 public:
    /// What of its element a context wants as text.
    enum class RawXMLType : std::int32_t {
        None = 0,
        Outer = 1,              ///< the element; then its children become contexts
        InnerThenChildren = 2,  ///< its content; then its children become contexts
        Inner = 3,              ///< its content and the attributes; children are skipped
    };

    /// The context that stands below all others.
    static Foundation::Returner<Context> newRootContext();
    /// The context for an element. Each text may be null. `lenient` lets the names of Dublin Core,
    /// RDF, the content module and FOAF match with any prefix.
    static Foundation::Returner<Context> newChild(const char* uri, const char* prefix,
                                                  const char* localName, bool lenient);
    /// The tag of a name: see `sStringToTag`.
    static Tag tagForString(const char* text) { return sStringToTag(text); }

    virtual RawXMLType getRawXMLType() const { return RawXMLType::None; }
    /// Takes what it wants of a child that has ended. Whether nobody else is to be asked.
    virtual bool handleFinishedChild(Context* child);
    virtual void start() {}
    virtual void gotAttribute(const char* prefix, const char* name, const char* value);
    virtual void end() {}
    /// The tag of the element's name, whatever the context makes of it.
    virtual Tag getLiteralTag() const { return tag; }
    /// Whether anybody looks at `raw`. If not, the XML that `getRawXMLType` names is read, since
    /// an error in it counts, but not kept.
    virtual bool keepsRawXML() const { return true; }

    /// The URL that links in the element are relative to; null if none is known.
    Foundation::URLReturner getBaseURL() const;

    mutable std::optional<std::string> raw;  ///< the XML that it asked for
    Info* info = nullptr;                    ///< not owned
    const Tag tag;
    /// Not owned: the parsed document's. Null for none.
    const char* baseURI = nullptr;

 protected:
    explicit Context(Tag theTag) : tag(theTag) {}
};

}  // namespace Orvane::FeedParser
