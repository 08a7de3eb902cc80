#include "EndToEnd/FeedDocument.h"

#include "Foundation/Clock.h"

#include <ctime>

namespace {

constexpr const char* kBytesType = "application/octet-stream";

bool isAtom(Dialect dialect) {
    return dialect == Dialect::Atom03 || dialect == Dialect::Atom10;
}

std::string escaped(const std::string& text) {
    std::string result;
    for (const char c : text) {
        if (c == '&') {
            result += "&amp;";
        } else if (c == '<') {
            result += "&lt;";
        } else {
            result += c;
        }
    }
    return result;
}

std::string base64(const std::string& text) {
    static const char* const kDigits =
        "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
    std::string result;
    for (std::size_t i = 0; i < text.size(); i += 3) {
        std::uint32_t bits = 0;
        for (std::size_t j = 0; j < 3; ++j) {
            bits = bits << 8 | (i + j < text.size() ? static_cast<unsigned char>(text[i + j]) : 0);
        }
        for (std::size_t j = 0; j < 4; ++j) {
            result += i + j > text.size() ? '=' : kDigits[bits >> (18 - 6 * j) & 63];
        }
    }
    return result;
}

/// A time as a dialect writes it.
std::string timeText(double date, bool isAtom) {
    const auto seconds = static_cast<std::time_t>(date + Foundation::kUnixEpochOffset);
    std::tm parts = {};
    gmtime_r(&seconds, &parts);
    char text[64];
    const std::size_t length =
        isAtom ? std::strftime(text, sizeof text, "%Y-%m-%dT%H:%M:%SZ", &parts)
               : std::strftime(text, sizeof text, "%a, %d %b %Y %H:%M:%S GMT", &parts);
    return {text, length};
}

std::string element(const std::string& name, const std::string& text) {
    return "<" + name + ">" + text + "</" + name + ">";
}

std::string atomContent(const FeedContent& feed, const Post& post) {
    const bool isOld = feed.dialect == Dialect::Atom03;
    const std::string html = isOld ? " type=\"text/html\" mode=\"escaped\"" : " type=\"html\"";
    switch (feed.writing) {
        case Writing::CDATA:
            return "<content" + html + "><![CDATA[" + post.html + "]]></content>";
        case Writing::XHTML:
            return "<content type=\"" + std::string(isOld ? "application/xhtml+xml" : "xhtml") +
                   "\">" + storedContentOf(feed, post) + "</content>";
        case Writing::Base64:
            return "<content type=\"" + std::string(kBytesType) +
                   (isOld ? "\" mode=\"base64\">" : "\">") + base64(post.html) + "</content>";
        case Writing::Plain:
            return "<content>" + escaped(storedContentOf(feed, post)) + "</content>";
        case Writing::Escaped:
            break;
    }
    return "<content" + html + ">" + escaped(post.html) + "</content>";
}

std::string rssContent(const FeedContent& feed, const Post& post) {
    if (feed.writing != Writing::CDATA) return element("description", escaped(post.html));
    return element("description", "<![CDATA[" + post.html + "]]>");
}

std::string atomEntry(const FeedContent& feed, const Post& post) {
    std::string text = element("title", escaped(post.title));
    if (post.hasGUID) text += element("id", keyOf(feed, post));
    text += "<link rel=\"alternate\" href=\"" + post.link + "\"/>";
    if (!post.enclosure.empty()) {
        text += "<link rel=\"enclosure\" type=\"audio/mpeg\" length=\"" +
                std::to_string(post.enclosureLength) + "\" href=\"" + post.enclosure + "\"/>";
    }
    return element("entry", text + atomContent(feed, post)) + "\n";
}

std::string rssItem(const FeedContent& feed, const Post& post) {
    std::string text = element("title", escaped(post.title)) + element("link", post.link);
    if (post.hasGUID) {
        text += "<guid isPermaLink=\"false\">" + keyOf(feed, post) + "</guid>";
    }
    if (!post.enclosure.empty()) {
        text += "<enclosure url=\"" + post.enclosure + "\" type=\"audio/mpeg\" length=\"" +
                std::to_string(post.enclosureLength) + "\"/>";
    }
    text += rssContent(feed, post);
    if (feed.dialect != Dialect::RSS10) return element("item", text) + "\n";
    return "<item rdf:about=\"" + post.link + "\">" + text + "</item>\n";
}

std::string atomDocument(const FeedContent& feed) {
    const bool isOld = feed.dialect == Dialect::Atom03;
    std::string text = isOld ? "<feed version=\"0.3\" xmlns=\"http://purl.org/atom/ns#\">"
                             : "<feed xmlns=\"http://www.w3.org/2005/Atom\">";
    text += element("title", escaped(feed.title)) + "<link rel=\"alternate\" href=\"" + feed.home +
            "\"/>";
    if (feed.date) {
        text += element(isOld ? "modified" : "updated", timeText(*feed.date, true));
    }
    for (const Post& post : feed.posts)
        text += atomEntry(feed, post);
    return text + "</feed>\n";
}

std::string rssDocument(const FeedContent& feed) {
    std::string channel = element("title", escaped(feed.title)) + element("link", feed.home);
    if (feed.date) {
        channel += element("lastBuildDate", timeText(*feed.date, false));
    }
    std::string items;
    for (const Post& post : feed.posts)
        items += rssItem(feed, post);
    if (feed.dialect == Dialect::RSS10) {
        return "<rdf:RDF xmlns:rdf=\"http://www.w3.org/1999/02/22-rdf-syntax-ns#\" "
               "xmlns=\"http://purl.org/rss/1.0/\"><channel rdf:about=\"" +
               feed.home + "\">" + channel + "</channel>\n" + items + "</rdf:RDF>\n";
    }
    const char* const version = feed.dialect == Dialect::RSS091   ? "0.91"
                                : feed.dialect == Dialect::RSS092 ? "0.92"
                                                                  : "2.0";
    return "<rss version=\"" + std::string(version) + "\">" + element("channel", channel + items) +
           "</rss>\n";
}

/// Text in UTF-8 that has no characters beyond U+00FF, in one byte each.
std::string latin1(const std::string& text) {
    std::string result;
    for (std::size_t i = 0; i < text.size(); ++i) {
        const auto c = static_cast<unsigned char>(text[i]);
        if (c < 0x80) {
            result += text[i];
        } else {
            result +=
                static_cast<char>((c & 3) << 6 | (static_cast<unsigned char>(text[++i]) & 63));
        }
    }
    return result;
}

}  // namespace

std::string keyOf(const FeedContent& feed, const Post& post) {
    return post.hasGUID ? "tag:" + feed.home + "," + std::to_string(post.number) : post.link;
}

std::string storedContentOf(const FeedContent& feed, const Post& post) {
    if (!isAtom(feed.dialect)) return post.html;
    if (feed.writing == Writing::Plain) return "Post " + std::to_string(post.number) + " & more";
    if (feed.writing != Writing::XHTML) return post.html;
    return "<div xmlns=\"http://www.w3.org/1999/xhtml\">" + post.html + "</div>";
}

std::string contentTypeOf(const FeedContent& feed) {
    if (!isAtom(feed.dialect)) return "text/html";
    switch (feed.writing) {
        case Writing::XHTML:
            return "application/xhtml+xml";
        case Writing::Base64:
            return kBytesType;
        case Writing::Plain:
            return "text/plain";
        case Writing::Escaped:
        case Writing::CDATA:
            break;
    }
    return "text/html";
}

std::string documentOf(const FeedContent& feed) {
    const std::string head = "<?xml version=\"1.0\" encoding=\"" + feed.encoding + "\"?>\n";
    const std::string text = head + (isAtom(feed.dialect) ? atomDocument(feed) : rssDocument(feed));
    return feed.encoding == "utf-8" ? text : latin1(text);
}
