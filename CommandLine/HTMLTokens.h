#pragma once

#include <cstddef>
#include <map>
#include <string>
#include <string_view>

namespace Commands {

/// The pieces of HTML, one after the other: texts with their references resolved, and tags.
class HTMLTokens {
 public:
    enum class Kind { Text, Open, Close, End };

    explicit HTMLTokens(std::string_view html) : mHTML(html) {}

    /// Goes to the next piece and gives its kind.
    Kind next();
    /// Leaves out what stands before the end tag of a name: the content of scripts and styles.
    void skipTo(std::string_view name);

    const std::string& text() const { return mText; }
    /// Of a tag, in lower case.
    const std::string& name() const { return mName; }
    /// Of a tag; empty for one that it has not got.
    std::string attribute(const std::string& name) const;

    /// A text with its references resolved.
    static std::string resolved(std::string_view text);

 private:
    Kind readTag();
    void readAttributes(std::string_view text);

    std::string_view mHTML;
    std::size_t mAt = 0;
    std::string mText;
    std::string mName;
    std::map<std::string, std::string> mAttributes;
};

}  // namespace Commands
