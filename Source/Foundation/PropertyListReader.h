#pragma once

#include "Foundation/ArrayOf.h"
#include "Foundation/DictionaryOf.h"
#include "Foundation/PropertyListError.h"
#include "Foundation/Uncopyable.h"

#include <exception>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

typedef struct _GMarkupParseContext GMarkupParseContext;
typedef struct _GMarkupParser GMarkupParser;
typedef struct _GError GError;

namespace Foundation {

/// Builds the tree of one property list from the events of GLib's XML parser, which knows no
/// entities but the five of XML, checks the encoding and does not recurse.
class PropertyListReader : Uncopyable {
 public:
    /// The value that `xml` holds. Throws `PropertyListError`. To be called once.
    Returner<PFRefCounted> read(std::string_view xml);

 private:
    /// A container that has begun and not ended; one of the two is set.
    struct Container {
        Ref<MutableArrayOf<PFRefCounted>> array;
        Ref<MutableDictionary> dictionary;
        std::optional<std::string> key;  ///< the key that waits for its value
    };
    struct Callbacks;

    template <class Step>
    void guarded(GMarkupParseContext* context, GError** error, Step step) noexcept;

    void startElement(std::string_view name);
    void endElement(std::string_view name);
    void text(std::string_view text);

    void checkPlace() const;
    void startContainer(std::string_view name);
    void endContainer();
    void endKey();
    void place(PFRefCounted* value);

    std::vector<Container> mContainers;
    bool mIsInside = false;            ///< the root element has begun
    std::optional<std::string> mLeaf;  ///< the element that has begun and holds text only
    std::string mText;                 ///< what it holds so far
    bool mHasValue = false;
    Ref<PFRefCounted> mValue;
    std::exception_ptr mFailure;  ///< what a callback threw
};

}  // namespace Foundation
