#include "HTMLText.h"

#include "HTMLTokens.h"
#include "TextLayout.h"

#include <Orvane/OVException.h>
#include <Orvane/OVLink.h>

#include <algorithm>
#include <set>
#include <utility>

namespace Commands {

namespace {

/// Elements that begin and end a block, with an empty line around it or without.
const std::set<std::string> kParagraphs = {"p",  "h1", "h2",     "h3",      "h4",         "h5",
                                           "h6", "ul", "ol",     "pre",     "blockquote", "table",
                                           "dl", "hr", "figure", "article", "section"};
const std::set<std::string> kLines = {"div", "li", "tr", "dt", "dd", "br", "figcaption"};
const std::set<std::string> kHidden = {"script", "style", "title", "template"};

constexpr std::size_t kStep = 2;
constexpr std::size_t kNarrowest = 20;

/// Writes blocks of text, wrapped, as tags begin and end them.
class Writer {
 public:
    explicit Writer(std::size_t columns) : mColumns(columns) {}

    void add(const std::string& text) {
        if (mPreformatted == 0) {
            mBlock += text;
            return;
        }
        for (const char c : text) {
            if (c == '\n') {
                endLine();
            } else {
                mBlock += c;
            }
        }
    }

    /// Ends the block; an empty line follows before the next one if `isParagraph`.
    void end(bool isParagraph) {
        writeBlock();
        mWantsGap = mWantsGap || isParagraph;
    }
    void indent(int steps) { mDepth = std::max(0, mDepth + steps); }
    void setPreformatted(int change) { mPreformatted = std::max(0, mPreformatted + change); }
    /// What stands in front of the next block.
    void setBullet(const std::string& bullet) { mBullet = bullet; }

    std::string finish() {
        writeBlock();
        return mText;
    }

 private:
    void endLine() {
        if (mBlock.empty()) mText += '\n';
        writeBlock();
    }

    void writeBlock() {
        std::string block;
        block.swap(mBlock);
        if (block.find_first_not_of(" \t\r\n") == std::string::npos) return;
        if (mWantsGap && !mText.empty()) mText += '\n';
        mWantsGap = false;
        const std::size_t blanks = static_cast<std::size_t>(mDepth) * kStep;
        const std::size_t left = mColumns > blanks + kNarrowest ? mColumns - blanks : kNarrowest;
        std::string lines = mPreformatted > 0
                                ? std::string(blanks, ' ') + TextLayout::clean(block)
                                : TextLayout::wrap(TextLayout::clean(block), left, blanks);
        if (!mBullet.empty() && mBullet.size() <= blanks) {
            lines.replace(blanks - mBullet.size(), mBullet.size(), mBullet);
        }
        mBullet.clear();
        mText += lines + '\n';
    }

    std::size_t mColumns;
    std::string mText;
    std::string mBlock;
    std::string mBullet;
    int mDepth = 0;
    int mPreformatted = 0;
    bool mWantsGap = false;
};

std::string absolute(const std::string& href, const std::string& base) {
    try {
        const auto link = OVLink::make({}, {}, {}, href, base);
        return link ? link->URL().value_or(href) : href;
    } catch (const OVException&) {
        return href;  // one of them is no URL
    }
}

/// Turns tags into what the writer does.
class Reader {
 public:
    Reader(std::string_view html, std::size_t columns, const std::string& base)
        : mTokens(html), mWriter(columns), mBase(base) {}

    std::string read() {
        for (auto kind = mTokens.next(); kind != HTMLTokens::Kind::End; kind = mTokens.next()) {
            if (kind == HTMLTokens::Kind::Text) {
                mWriter.add(mTokens.text());
            } else if (kind == HTMLTokens::Kind::Open) {
                open(mTokens.name());
            } else {
                close(mTokens.name());
            }
        }
        return mWriter.finish();
    }
    std::vector<std::string> takeLinks() { return std::move(mLinks); }

 private:
    void open(const std::string& name) {
        if (kHidden.contains(name)) return mTokens.skipTo(name);
        if (kParagraphs.contains(name)) mWriter.end(true);
        if (kLines.contains(name)) mWriter.end(false);
        if (name == "blockquote" || name == "dd") mWriter.indent(1);
        if (name == "pre") mWriter.setPreformatted(1);
        if (name == "ul" || name == "ol") {
            mWriter.indent(name == "ol" ? 2 : 1);
            mNumbers.push_back(name == "ol" ? 1 : 0);
        }
        if (name == "li") openItem();
        if (name == "td" || name == "th") mWriter.add("  ");
        if (name == "a") mHrefs.push_back(mTokens.attribute("href"));
        if (name == "img") openImage();
    }

    void close(const std::string& name) {
        if (name == "a") closeLink();
        if (kParagraphs.contains(name)) mWriter.end(true);
        if (kLines.contains(name)) mWriter.end(false);
        if (name == "blockquote" || name == "dd") mWriter.indent(-1);
        if (name == "pre") mWriter.setPreformatted(-1);
        if ((name == "ul" || name == "ol") && !mNumbers.empty()) {
            mWriter.indent(mNumbers.back() > 0 ? -2 : -1);
            mNumbers.pop_back();
        }
    }

    void openItem() {
        if (mNumbers.empty() || mNumbers.back() == 0) return mWriter.setBullet("* ");
        std::string bullet = std::to_string(mNumbers.back()++) + ". ";
        mWriter.setBullet(bullet);
    }

    void openImage() {
        const std::string alternative = mTokens.attribute("alt");
        if (!alternative.empty()) mWriter.add("[" + alternative + "]");
    }

    void closeLink() {
        if (mHrefs.empty()) return;
        const std::string href = mHrefs.back();
        mHrefs.pop_back();
        if (href.empty() || href[0] == '#') return;
        const std::string url = TextLayout::clean(absolute(href, mBase));
        auto found = std::find(mLinks.begin(), mLinks.end(), url);
        if (found == mLinks.end()) found = mLinks.insert(found, url);
        mWriter.add(" [" + std::to_string(found - mLinks.begin() + 1) + "]");
    }

    HTMLTokens mTokens;
    Writer mWriter;
    std::string mBase;
    std::vector<std::string> mLinks;
    std::vector<std::string> mHrefs;
    std::vector<int> mNumbers;  ///< of open lists: the next number, 0 for bullets
};

}  // namespace

HTMLText::HTMLText(std::string_view html, std::size_t columns, const std::string& base) {
    Reader reader(html, columns, base);
    mText = reader.read();
    mLinks = reader.takeLinks();
}

}  // namespace Commands
