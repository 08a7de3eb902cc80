#pragma once

#include "Foundation/Uncopyable.h"

#include <map>
#include <set>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

namespace Orvane::FeedParser {

struct MarkupToken;

/// Makes broken XML whole enough for Tidy, which gives up on the first end tag that does not fit,
/// and keeps Tidy from changing texts, which it breaks into lines at every tag.
///
/// `mend` ends what was left open, passes over what was never opened, over control characters, junk
/// around the root, comments, instructions and the document type; declares prefixes that nobody
/// did; and escapes each "&" and "<" that begins nothing. Line feeds and no-break spaces are marked
/// by characters of their own, so that `restore` can tell them from the breaks and spaces that Tidy
/// makes.
class XMLMending : Foundation::Uncopyable {
 public:
    enum class Kind {
        Feed,     ///< a document with a root
        Snippet,  ///< any content, which gets a root of its own
    };
    /// The root of a mended snippet.
    static constexpr std::string_view kSnippetRoot = "orvane";

    /// `isUTF8` tells whether the markup is, whatever it says of itself.
    XMLMending(Kind kind, bool isUTF8);
    ~XMLMending();

    std::string mend(std::string_view markup);
    /// What Tidy made of mended markup, in the lines of the original.
    std::string restore(const std::string& tidied) const;

    /// The namespace that is meant by a prefix that is not declared.
    static std::string getNamespace(std::string_view prefix);
    /// Whether a namespace is one that nobody knows, made up for such a prefix.
    static bool isMadeUpNamespace(std::string_view uri);

 private:
    /// An element that has begun and not ended.
    struct Open {
        std::string name;
        std::size_t prefixes;  ///< how many of `mPrefixes` were declared before it
        bool isDropped;        ///< too deep: its tags are left out
    };
    struct Attribute {
        std::string name;
        std::string value;
    };
    using Attributes = std::vector<Attribute>;

    void chooseMarks(std::string_view markup);
    void beginSnippet();
    void handle(const MarkupToken& token);
    void handleStart(const MarkupToken& token);
    void handleEnd(std::string_view name);
    void handleText(std::string_view text);
    void handleData(std::string_view text);
    void handleInstruction(std::string_view whole);
    void readEntities(std::string_view documentType);

    Attributes readAttributes(std::string_view text);
    bool isWanted(const Attribute& attribute) const;
    void cleanNamespace(std::string& uri) const;
    std::string expand(std::string_view value);
    void declare(const Attributes& attributes);
    void usePrefixOf(std::string_view name, bool isElement);
    void closeImplied(std::string_view name);
    void writeStart(const std::string& name, const Attributes& attributes, bool isEmpty);
    void writeText(std::string_view text, bool keepReferences, char quote);
    /// For the "&" at the start of `text`. Gives how much of it that was.
    std::size_t writeReference(std::string_view text, bool keepReferences);
    void closeTop();
    void finish();

    Kind mKind;
    bool mIsUTF8;
    std::string mLine;   ///< stands for a line feed
    std::string mSpace;  ///< stands for a no-break space
    std::string mOut;
    std::size_t mRootNameEnd = 0;  ///< where declarations can be put in, 0 before the root
    bool mIsDone = false;          ///< the root has ended
    int mDepth = 0;
    bool mHitDepth = false;
    std::vector<Open> mOpen;
    std::unordered_map<std::string, int> mOpenCounts;  ///< by name in lower case
    std::vector<std::string> mPrefixes;                ///< declared, those of inner elements last
    std::set<std::string, std::less<>> mUndeclared;
    std::map<std::string, std::string, std::less<>> mEntities;  ///< of the document type
    std::size_t mExpanded = 0;                                  ///< bytes that came from entities
};

}  // namespace Orvane::FeedParser
