#pragma once

#include "FeedParser/MergeTest.h"
#include "FeedParser/ParserPort.h"

#include <string>
#include <vector>

/// An item of a document of RSS.
struct Item {
    std::string guid;
    std::string title = "Title";
    std::string date = "Tue, 06 Jun 2006 10:00:00 GMT";
    int length = 0;      ///< of its enclosure; none for 0
    std::string text{};  ///< "Text of" its GUID if empty
    std::string more{};  ///< what no column has
};

/// A test that merges a feed's documents one after the other, from their bytes on.
class ReplayTest : public MergeTest {
 protected:
    ReplayTest() { Orvane::DocumentParser::setCurrent(&parser); }
    ~ReplayTest() noexcept override { Orvane::DocumentParser::setCurrent(nullptr); }

    static std::string XMLOf(const Item& item) {
        std::string xml = "<item><title>" + item.title + "</title><guid>" + item.guid +
                          "</guid><pubDate>" + item.date + "</pubDate><description>" +
                          (item.text.empty() ? "Text of " + item.guid : item.text) +
                          "</description>" + item.more;
        if (item.length != 0) {
            xml += "<enclosure url=\"http://example.org/a.mp3\" type=\"audio/mpeg\" length=\"" +
                   std::to_string(item.length) + "\"/>";
        }
        return xml + "</item>";
    }
    static Orvane::FeedCore* parse(const std::vector<Item>& items) {
        std::string xml = "<rss version=\"2.0\"><channel><title>News</title>";
        for (const Item& item : items) {
            xml += XMLOf(item);
        }
        Orvane::FeedCore* parsed =
            Orvane::FeedCore::createFeed(data(xml + "</channel></rss>"), url(kAddress));
        parsed->mURL.setValue(url(kAddress));
        return parsed;
    }
    /// Parses and merges the document of these items.
    std::string read(const std::vector<Item>& items) { return merge(parse(items)); }

    Orvane::FeedParser::ParserPort parser;
};
