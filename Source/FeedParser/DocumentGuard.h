#pragma once

#include "Foundation/Data.h"
#include "Foundation/Ref.h"
#include "Foundation/Returner.h"

#include <cstddef>
#include <string>
#include <string_view>

namespace Orvane::FeedParser {

/// Looks through a document before libxml2 gets it for what would cost that far more than the
/// document's size, and nothing else: it passes over each piece of text at the speed of memory.
class DocumentGuard {
 public:
    /// The document as it may be parsed: `data` itself, unless declarations or attributes had to be
    /// cut out of it. Null if it must not be parsed at all. What was done is logged.
    static Foundation::DataReturner check(Foundation::Data* data);

 private:
    /// `text` must outlive this, and be in an encoding that has ASCII for ASCII.
    explicit DocumentGuard(std::string_view text) : mText(text) {}

    bool checkTags();
    bool checkSubset();
    void cut(std::size_t begin, std::size_t end);
    void checkAttributes(std::size_t tag, std::size_t end);

    std::size_t findSubset();
    std::size_t skipDeclaration(std::size_t from) const;
    std::size_t findSubsetEnd(std::size_t from);

    std::string_view mText;
    std::string mMended;  ///< the document with blanks for what was cut, empty if nothing was
    std::size_t mTags = 0;
    std::size_t mAttributeDeclarationBytes = 0;
};

}  // namespace Orvane::FeedParser
