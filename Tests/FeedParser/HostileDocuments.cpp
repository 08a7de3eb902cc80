#include "FeedParser/HostileDocuments.h"

namespace {

constexpr std::size_t kMiB = 1 << 20;

std::string times(std::size_t count, const std::string& text) {
    std::string all;
    all.reserve(count * text.size());
    for (std::size_t i = 0; i < count; ++i)
        all += text;
    return all;
}

/// As often as fits into 1 MiB, with room for what stands around it.
std::string mebibyteOf(const std::string& text) {
    return times((kMiB - 1000) / text.size(), text);
}

/// `make(0) make(1) ...`, up to 1 MiB.
std::string mebibyteOf(const std::function<std::string(std::size_t)>& make) {
    std::string all;
    for (std::size_t i = 0; all.size() < kMiB - 2000; ++i)
        all += make(i);
    return all;
}

std::string rss(const std::string& channel) {
    return "<rss version=\"2.0\"><channel><title>Title</title>" + channel + "</channel></rss>";
}

std::string item(const std::string& content) {
    return rss("<item><title>Item</title>" + content + "</item>");
}

std::string escaped(const std::string& markup) {
    std::string text;
    for (const char c : markup) {
        if (c == '<') {
            text += "&lt;";
        } else if (c == '&') {
            text += "&amp;";
        } else {
            text += c;
        }
    }
    return text;
}

std::string description(const std::string& markup) {
    return item("<description>" + escaped(markup) + "</description>");
}

std::string withSubset(const std::string& subset, const std::string& document) {
    return "<?xml version=\"1.0\"?><!DOCTYPE rss [" + subset + "]>" + document;
}

/// Entities of which each stands for ten of the one before it.
std::string tenfoldEntities(int levels, const std::string& first) {
    std::string subset = "<!ENTITY e0 \"" + first + "\">";
    for (int i = 1; i <= levels; ++i) {
        const std::string below = "&e" + std::to_string(i - 1) + ";";
        subset += "<!ENTITY e" + std::to_string(i) + " \"" + times(10, below) + "\">";
    }
    return subset;
}

std::string tenfoldParameterEntities(int levels) {
    std::string subset = "<!ENTITY % p0 \"<!ENTITY x 'y'>\">";
    for (int i = 1; i <= levels; ++i) {
        const std::string below = "&#37;p" + std::to_string(i - 1) + ";";
        subset += "<!ENTITY % p" + std::to_string(i) + " \"" + times(10, below) + "\">";
    }
    return subset + "%p" + std::to_string(levels) + ";";
}

const std::vector<HostileDocument> kEntityBombs = {
    {"ParameterEntities", [] { return withSubset(tenfoldParameterEntities(4), rss("<item/>")); }},
    {"ParameterEntitiesDeep",
     [] { return withSubset(tenfoldParameterEntities(30), rss("<item/>")); }},
    {"ParameterEntitiesThatNameThemselves",
     [] {
         return withSubset(
             "<!ENTITY % a \"<!ENTITY x 'y'>&#37;b;\"><!ENTITY % b \"&#37;a;&#37;a;\">%a;",
             rss(""));
     }},
    {"ParameterEntityErrors",
     [] {
         return withSubset("<!ENTITY % a \"" + times(1000, "<!BAD>") + "\">" + times(30, "%a;"),
                           rss(""));
     }},
    {"BillionLaughs",
     [] {
         return withSubset(tenfoldEntities(10, "lol"), item("<description>&e10;</description>"));
     }},
    {"BillionLaughsInAnAttribute",
     [] { return withSubset(tenfoldEntities(10, "lol"), item("<link href=\"&e10;\"/>")); }},
    {"AMillionLaughsInManyAttributes",
     [] {
         return withSubset(tenfoldEntities(5, "lol"), rss(times(40000, "<link href=\"&e5;\"/>")));
     }},
    {"BillionLaughsOfElements",
     [] { return withSubset(tenfoldEntities(8, "<item></item>"), rss("&e8;")); }},
    {"OneLongEntityOften",
     [] {
         return withSubset("<!ENTITY long \"" + times(60000, "x") + "\">",
                           item("<description>" + times(100000, "&long;") + "</description>"));
     }},
    {"ALongEntityInManyTexts",
     [] {
         return withSubset(
             "<!ENTITY long \"" + times(7000, "<b>x</b>") + "\">",
             rss(times(17000, "<item><title>&long;&long;&long;&long;</title></item>")));
     }},
    {"AMebibyteOfAttributesByEntity",
     [] {
         return withSubset(
             "<!ENTITY long \"" + times(60000, "x") + "\">",
             rss(times(1000, "<item><link title=\"" + times(100, "&long;") + "\"/></item>")));
     }},
    {"DefaultAttributes",
     [] {
         return withSubset("<!ATTLIST item a CDATA \"" + times(60000, "x") + "\">",
                           rss(times(100000, "<item/>")));
     }},
    {"ManyDefaultAttributes",
     [] {
         std::string subset;
         for (int i = 0; i < 2000; ++i)
             subset += "<!ATTLIST item a" + std::to_string(i) + " CDATA \"x\">";
         return withSubset(subset, rss(times(100000, "<item/>")));
     }},
    {"ALongAttributeDeclaration",
     [] {
         return withSubset("<!ATTLIST item " + mebibyteOf([](std::size_t i) {
                               return "a" + std::to_string(i) + " CDATA \"x\" ";
                           }) + ">",
                           rss(""));
     }},
    {"EntitiesThatNameThemselves",
     [] {
         return withSubset("<!ENTITY a \"&b;\"><!ENTITY b \"&a;\">", item("<title>&a;</title>"));
     }},
    {"ManyEntities",
     [] {
         return withSubset(
             mebibyteOf([](std::size_t i) { return "<!ENTITY e" + std::to_string(i) + " \"x\">"; }),
             rss(""));
     }},
    {"AnUnclosedSubset", [] { return "<!DOCTYPE rss [" + mebibyteOf("<!ENTITY a 'b'>"); }},
    {"UndeclaredEntities", [] { return rss(mebibyteOf("&foo;")); }},
    {"ReferencesOnly", [] { return item("<title>" + mebibyteOf("&nbsp;") + "</title>"); }},
};

const std::vector<HostileDocument> kNestings = {
    {"NestedElements", [] { return times(100000, "<a>"); }},
    {"NestedElementsWithEnds", [] { return times(100000, "<a>") + times(100000, "</a>"); }},
    {"NestedElementsOfAFeed", [] { return rss(times(100000, "<b>")); }},
    {"NestedMarkupInContent", [] { return description(times(100000, "<div>")); }},
    {"NestedBoldInContent", [] { return description(times(100000, "<b>")); }},
    {"NestedListsInContent", [] { return description(times(20000, "<ul><li>")); }},
    {"NestedTablesInContent", [] { return description(times(20000, "<table><tr><td>")); }},
    {"NestedElementsOfAPage", [] { return "<html><head>" + times(100000, "<div>"); }},
    {"NestedFeeds",
     [] { return times(200, "<rss>") + times(kMiB / 2, "x") + times(200, "</rss>"); }},
    {"NestedEntries",
     [] {
         return "<feed>" + times(200, "<entry>") + times(kMiB / 2, "x") + times(200, "</entry>") +
                "</feed>";
     }},
    {"NestedEntriesInManyEntries",
     [] {
         return "<feed>" +
                times(300, times(100, "<entry>") + times(1000, "x") + times(100, "</entry>")) +
                "</feed>";
     }},
    {"NestedNamespaces",
     [] {
         std::string open;
         for (int i = 0; i < 170; ++i) {
             open += "<a ";
             for (int j = 0; j < 200; ++j)
                 open += "xmlns:a" + std::to_string(i * 200 + j) + "=\"b\" ";
             open += ">";
         }
         return "<rss><channel>" + open + times(30000, "<a0:b/>");
     }},
    {"NestedAuthors",
     [] { return item(times(100, "<author>") + times(kMiB / 2, "x") + times(100, "</author>")); }},
    {"NestedPersons",
     [] {
         return "<rdf xmlns='http://www.w3.org/1999/02/22-rdf-syntax-ns#'>" +
                times(30000, "<Person><knows>");
     }},
    {"NestedBases",
     [] {
         return times(200, "<feed xml:base=\"" + times(4000, "x") + "\">") + times(200, "</feed>");
     }},
};

const std::vector<HostileDocument> kTidying = {
    {"UnclosedInlinesInAPage", [] { return "<html>" + times(20480 / 9, "<font><p>"); }},
    {"UnclosedInlinesInContent", [] { return description(times(20480 / 9, "<font><p>")); }},
    {"AMebibyteOfUnclosedInlines", [] { return description(times(60000, "<font><p>")); }},
    {"ManyContentsOfUnclosedInlines",
     [] {
         return rss(times(40, "<item><description>" + escaped(times(1300, "<font><p>")) +
                                  "</description></item>"));
     }},
    {"UnclosedInlinesInAFeed", [] { return "<rss><channel>" + times(20480 / 9, "<font><p>"); }},
    {"ManyAttributesOfAPage", [] { return "<html><body " + mebibyteOf("a=b ") + ">"; }},
    {"UnknownElementsOfAPage", [] { return "<html><head>" + mebibyteOf("<x-y>"); }},
    {"AmpersandsInAFeed", [] { return item("<title>" + mebibyteOf("& ") + "</title>"); }},
    {"AmpersandsInContent", [] { return description(times(kMiB / 8, "& ")); }},
    {"LessThanInAFeed", [] { return item(mebibyteOf("< ")); }},
    {"CommentsWithoutEnd", [] { return rss(mebibyteOf("<!--")); }},
    {"CDATAWithoutEnd", [] { return rss(mebibyteOf("<![CDATA[")); }},
    {"InstructionsWithoutEnd", [] { return rss(mebibyteOf("<?x ")); }},
    {"Scripts", [] { return description(times(15000, "<script>x</script><style>y")); }},
    {"CrossedTagsOfAFeed", [] { return rss(mebibyteOf("<a></b>")); }},
    {"StartTagsWithoutEnd", [] { return mebibyteOf("<a b='"); }},
    {"EndsOfTags", [] { return "<rss" + mebibyteOf(">"); }},
    {"ScriptsOfAPage", [] { return "<html><head>" + mebibyteOf("<script>"); }},
    {"EndsOnly", [] { return rss(mebibyteOf("</x>")); }},
    {"CrossedTags", [] { return description(times(20000, "<b><i></b></i>")); }},
    {"Forms", [] { return description(times(20000, "<form><select><option>")); }},
};

const std::vector<HostileDocument> kCrowds = {
    {"EmptyElements", [] { return rss(mebibyteOf("<a/>")); }},
    {"EmptyItems", [] { return rss(mebibyteOf("<item/>")); }},
    {"Items", [] { return rss(mebibyteOf("<item><title>x</title><guid>y</guid></item>")); }},
    {"ItemsWithContents",
     [] { return rss(mebibyteOf("<item><description>&lt;b>x</description></item>")); }},
    {"Enclosures", [] { return item(mebibyteOf("<enclosure url=\"x\"/>")); }},
    {"Links", [] { return rss(mebibyteOf("<link href=\"x\"/>")); }},
    {"EmptyLinks", [] { return rss(mebibyteOf("<link/>")); }},
    {"LinksOfALongBase",
     [] {
         return "<feed xmlns=\"http://www.w3.org/2005/Atom\" xml:base=\"http://a/" +
                times(kMiB / 2, "b") + "/\">" + times(15000, "<entry><link href=\"c\"/></entry>") +
                "</feed>";
     }},
    {"LinksOfTheLongestBase",
     [] {
         return "<feed xmlns=\"http://www.w3.org/2005/Atom\" xml:base=\"http://a/" +
                times(2000, "b") + "/\">" + times(30000, "<entry><link href=\"c\"/></entry>") +
                "</feed>";
     }},
    {"Titles", [] { return rss(mebibyteOf("<title>x</title>")); }},
    {"Authors", [] { return rss(mebibyteOf("<author>x</author>") + "<item/>"); }},
    {"AuthorsAndItems",
     [] { return rss(times(20000, "<author>x</author>") + times(20000, "<item/>")); }},
    {"Attributes",
     [] {
         return "<rss " +
                mebibyteOf([](std::size_t i) { return "a" + std::to_string(i) + "='x' "; }) +
                "><channel/></rss>";
     }},
    {"AttributesOfEmptyElements",
     [] {
         const std::string attributes = [] {
             std::string all;
             for (int i = 0; i < 900; ++i)
                 all += " a" + std::to_string(i) + "=''";
             return all;
         }();
         return rss(mebibyteOf("<a" + attributes + "/>"));
     }},
    {"Namespaces",
     [] {
         return "<rss " +
                mebibyteOf([](std::size_t i) { return "xmlns:n" + std::to_string(i) + "='x' "; }) +
                "><channel/></rss>";
     }},
    {"NamespacesUsedByMany",
     [] {
         std::string document = "<rss";
         for (int i = 0; i < 400; ++i)
             document += " xmlns:n" + std::to_string(i) + "='u" + std::to_string(i) + "'";
         document += "><channel>";
         for (int i = 0; document.size() < kMiB - 1000; ++i)
             document += "<item><n" + std::to_string(i % 400) + ":x/></item>";
         return document + "</channel></rss>";
     }},
    {"UndeclaredPrefixes", [] { return rss(mebibyteOf("<a:b/>")); }},
    {"ManyUndeclaredPrefixes",
     [] {
         return rss(mebibyteOf([](std::size_t i) { return "<p" + std::to_string(i) + ":b/>"; }));
     }},
    {"LinksOfAPage", [] { return "<html><head>" + mebibyteOf("<link href=\"x\"/>"); }},
    {"LinksAndBasesOfAPage",
     [] {
         return "<html><head>" + times(25000, "<link href=\"x\"/>") +
                times(25000, "<base href=\"y\"/>") + "</head></html>";
     }},
    {"BasesAndLinksOfAPage",
     [] { return "<html><head>" + mebibyteOf("<base/><link/>") + "</head></html>"; }},
    {"Friends",
     [] {
         return "<rdf:RDF xmlns:rdf='http://www.w3.org/1999/02/22-rdf-syntax-ns#' "
                "xmlns='http://xmlns.com/foaf/0.1/'><Person>" +
                mebibyteOf("<knows><Person/></knows>") + "</Person></rdf:RDF>";
     }},
    {"ControlCharacters", [] { return rss("<title>" + mebibyteOf("\x01") + "</title>"); }},
    {"BytesThatAreNoUTF8", [] { return rss("<title>" + mebibyteOf("\xFF") + "</title>"); }},
    {"NULBytes", [] { return rss("<title>" + mebibyteOf(std::string(1, '\0')) + "</title>"); }},
    {"Zeros", [] { return std::string(kMiB, '\0'); }},
    {"UnknownElementsAround",
     [] { return rss(mebibyteOf([](std::size_t i) { return "<x" + std::to_string(i) + "/>"; })); }},
};

const std::vector<HostileDocument> kLongTexts = {
    {"ALongDate", [] { return item("<pubDate>" + times(32768, "1") + "</pubDate>"); }},
    {"ALongDateOfWords",
     [] { return item("<pubDate>" + times(32768 / 4, "Jan ") + "</pubDate>"); }},
    {"ManyLongDates",
     [] { return rss(times(31, "<item><pubDate>" + times(16384, "1 ") + "</pubDate></item>")); }},
    {"ManyOddDates",
     [] { return rss(mebibyteOf("<item><pubDate>1 2 3 4 5 6 7 8 9</pubDate></item>")); }},
    {"TagsWithoutEndInATitle",
     [] { return item("<title>" + times(kMiB / 10, "&amp;lt;a") + "</title>"); }},
    {"TagsWithoutEndInADescription",
     [] { return rss("<description>" + times(kMiB / 10, "&amp;lt;a") + "</description>"); }},
    {"ALongName", [] { return "<" + mebibyteOf("x") + "/>"; }},
    {"ALongAttribute", [] { return "<rss a='" + mebibyteOf("x") + "'><channel/></rss>"; }},
    {"ALongAuthor", [] { return item("<author>" + mebibyteOf("a@b.c (") + "</author>"); }},
    {"ALongRelation", [] { return rss("<link rel='" + mebibyteOf("a ") + "' href='x'/>"); }},
    {"ALongURL", [] { return rss("<link href='" + mebibyteOf("../") + "'/>"); }},
    {"ALongURLToEscape", [] { return rss("<link href='http://x/" + mebibyteOf("% ") + "'/>"); }},
    {"ALongComment", [] { return rss("<!--" + mebibyteOf("- ") + "-->"); }},
    {"BlanksOnly", [] { return mebibyteOf(" "); }},
    {"TextOnly", [] { return mebibyteOf("x "); }},
    {"BlanksInFront", [] { return times(kMiB / 2, " ") + "<?xml version='1.0'?>" + rss(""); }},
    {"JunkBehind", [] { return rss("") + mebibyteOf("<junk "); }},
    {"SecondRoots", [] { return mebibyteOf("<rss><channel/></rss>"); }},
    {"BinaryContent",
     [] {
         return "<feed><entry><content type='a/b'>" + mebibyteOf("AAAA") +
                "</content></entry></feed>";
     }},
};

const std::vector<HostileDocument> kSizes = {
    {"TenMegabytesOfEmptyElements", [] { return rss(times(2500000, "<a/>")); }},
    {"TenMegabytesOfStartTags", [] { return times(3300000, "<a>"); }},
};
}  // namespace

const std::vector<HostileFamily>& hostileFamilies() {
    static const std::vector<HostileFamily> sFamilies = {
        {"EntityBombs", kEntityBombs}, {"Nestings", kNestings},   {"Tidying", kTidying},
        {"Crowds", kCrowds},           {"LongTexts", kLongTexts}, {"Sizes", kSizes},
    };
    return sFamilies;
}
