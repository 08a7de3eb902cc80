#pragma once

#include <cstddef>
#include <string_view>

namespace Orvane::FeedParser {

/// A piece of markup, by views of it.
struct MarkupToken {
    enum class Kind {
        Text,
        StartTag,
        EndTag,
        CharacterData,  ///< a CDATA section
        Comment,
        Instruction,  ///< "<?...>"
        Declaration,  ///< "<!...>"
    };

    Kind kind = Kind::Text;
    std::string_view whole;
    std::string_view name;     ///< of a tag
    std::string_view content;  ///< the attributes of a start tag, the text of a CDATA section
    bool isEmpty = false;      ///< a start tag that ends in "/>"
};

/// Takes markup apart that may be broken anywhere. Nothing is an error: what is not complete is
/// text, or ends with the markup. The time is linear. The markup must outlive the scanner.
class MarkupScanner {
 public:
    /// In XML a "<" ends a tag that has no ">", names may begin with other characters than letters,
    /// and an instruction ends in "?>" if it can.
    enum class Language { XML, HTML };

    MarkupScanner(std::string_view markup, Language language)
        : mMarkup(markup), mLanguage(language) {}

    /// The next piece. False at the end.
    bool next(MarkupToken& token);
    /// Passes over the text of an element that knows no markup ("script"), up to its end tag. Gives
    /// it.
    std::string_view skipRawText(std::string_view name);

 private:
    bool isXML() const { return mLanguage == Language::XML; }
    bool beginsMarkup(std::size_t position) const;
    bool beginsName(std::size_t position) const;
    std::size_t find(std::string_view what, std::size_t from, std::size_t& known) const;
    std::size_t findTagEnd(std::size_t from);
    void readTag(MarkupToken& token);
    void readDelimited(MarkupToken& token, MarkupToken::Kind kind, std::string_view begin,
                       std::string_view end, std::size_t& known);
    void readInstruction(MarkupToken& token);
    void readDeclaration(MarkupToken& token);
    void readText(MarkupToken& token);

    // From where on there is none of something, so that it is looked for only once.
    static constexpr std::size_t kUnknown = static_cast<std::size_t>(-1);
    struct None {
        std::size_t commentEnd = kUnknown, dataEnd = kUnknown, tagEnd = kUnknown,
                    instructionEnd = kUnknown, quote = kUnknown, apostrophe = kUnknown;
    };

    std::string_view mMarkup;
    Language mLanguage;
    std::size_t mPosition = 0;
    bool mSawDocumentType = false;
    mutable None mNone;
};

/// Takes the attributes of a start tag apart.
class AttributeScanner {
 public:
    explicit AttributeScanner(std::string_view attributes) : mRest(attributes) {}

    /// The next attribute, its value as it stands between the quotes. False at the end.
    bool next(std::string_view& name, std::string_view& value);

 private:
    void skipBlanks();
    std::string_view take(std::size_t length);

    std::string_view mRest;
};

}  // namespace Orvane::FeedParser
