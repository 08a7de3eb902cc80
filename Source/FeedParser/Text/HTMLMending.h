#pragma once

#include "Foundation/Uncopyable.h"

#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

namespace Orvane::FeedParser {

struct HTMLElement;
struct MarkupToken;

/// Takes out of HTML what Tidy can't do: the tags of elements that it does not know, for it gives
/// up on them; those beyond the bounds of depth, for it recurses; and instructions, conditional
/// sections and control characters. Nothing else changes but ampersands in attributes that begin
/// no complete reference: Tidy takes "&copy=1" in a URL for one.
class HTMLMending : Foundation::Uncopyable {
 public:
    enum class Kind {
        Page,
        /// Content, of which Tidy gives only the body: scripts and styles go too, and so do the
        /// tags of "noscript", which Tidy would move into the head together with what it holds.
        Snippet,
    };

    explicit HTMLMending(Kind kind);
    ~HTMLMending();

    std::string mend(std::string_view markup);

 private:
    /// How many elements of a name are open, and how many were left out, the end tags of which are
    /// to be left out too.
    struct Count {
        int open = 0;
        int leftOut = 0;
    };

    void handle(const MarkupToken& token);
    void handleStart(const MarkupToken& token);
    void handleEnd(const MarkupToken& token);
    bool isBeyondBounds(const HTMLElement& element);
    /// A block begins. Ends the inline elements that are open if Tidy has repeated enough of them.
    void limitRepeats();
    void copyTag(const MarkupToken& token);
    void copyAttributes(const MarkupToken& token);
    void copyText(std::string_view text);
    void copyWithReferences(std::string_view text);

    bool isLeftOut(std::string_view name) const;
    const HTMLElement* findKnown(const std::string& name) const;
    void leaveForeign(const std::string& name);
    bool isForeign() const { return !mForeignRoots.empty(); }

    Kind mKind;
    std::string mOut;
    std::string mRawText;                    ///< the element that has begun and knows no markup
    std::vector<std::string> mForeignRoots;  ///< each "svg" and "math" that is open
    int mHTMLInForeign = 0;  ///< how many elements are open within them that may hold HTML
    int mDepth = 0;
    int mInlines = 0;
    int mRepeatedInlines = 0;  ///< how many were open, of all blocks together, as each began
    bool mHitDepth = false;
    bool mHitInlines = false;
    bool mHitRepeats = false;
    std::unordered_map<std::string, Count> mCounts;
};

}  // namespace Orvane::FeedParser
