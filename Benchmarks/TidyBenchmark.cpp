#include "Benchmarks/Measure.h"
#include "FeedParser/Text/HTMLSnippetTidier.h"
#include "FeedParser/Text/TidyDocument.h"
#include "FeedParser/Text/XMLSnippetTidier.h"
#include "Foundation/AutoreleasePool.h"

#include <libxml/parser.h>
#include <libxml/tree.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

/// What it costs to tidy contents of real feeds and make them safe, beside Tidy alone, with the
/// same options, on the same contents.

using namespace Benchmarks;
using namespace Foundation;
using namespace Orvane::FeedParser;

namespace {

constexpr int kUTF8 = 1;

/// Tidy alone, as the class of `T` sets it up.
template <class T>
class Bare : public T {
 public:
    std::size_t repairAlone(const std::string& markup) {
        if (!this->open()) return 0;
        const int code = this->mDoc->repair(markup, "utf8");
        return code == 0 || code == 1 ? this->mDoc->save().size() : 0;
    }
};

struct Content {
    Ref<Data> data;
    bool isXML;
};

std::string dump(const xmlNode* parent) {
    xmlBuffer* buffer = xmlBufferCreate();
    for (xmlNode* child = parent->children; child; child = child->next)
        xmlNodeDump(buffer, parent->doc, child, 0, 0);
    std::string text(reinterpret_cast<const char*>(xmlBufferContent(buffer)));
    xmlBufferFree(buffer);
    return text;
}

std::string textOf(const xmlNode* node) {
    xmlChar* content = xmlNodeGetContent(node);
    std::string text(reinterpret_cast<const char*>(content));
    xmlFree(content);
    return text;
}

void collect(const xmlNode* node, std::vector<Content>& into) {
    for (; node; node = node->next) {
        if (node->type != XML_ELEMENT_NODE) continue;
        const std::string_view name = reinterpret_cast<const char*>(node->name);
        if (name != "description" && name != "encoded" && name != "content" && name != "summary") {
            collect(node->children, into);
            continue;
        }
        const bool isXML = xmlChildElementCount(const_cast<xmlNode*>(node)) > 0;
        const std::string text = isXML ? dump(node) : textOf(node);
        if (text.find_first_of("<&") == std::string::npos) continue;
        into.push_back({Data::data(text.data(), text.size()), isXML});
    }
}

std::vector<Content> readContents(const std::filesystem::path& folder) {
    std::vector<Content> contents;
    for (const auto& file : std::filesystem::recursive_directory_iterator(folder)) {
        if (!file.is_regular_file()) continue;
        xmlDoc* document = xmlReadFile(file.path().c_str(), nullptr,
                                       XML_PARSE_RECOVER | XML_PARSE_NOERROR | XML_PARSE_NOWARNING |
                                           XML_PARSE_NONET | XML_PARSE_NOCDATA);
        if (!document) continue;
        collect(xmlDocGetRootElement(document), contents);
        xmlFreeDoc(document);
    }
    return contents;
}

void reportContents(const std::vector<Content>& contents, const Tidier& html, const Tidier& xml) {
    std::size_t bytes = 0, here = 0;
    for (const Content& content : contents) {
        bytes += content.data->getLength();
        if ((content.isXML ? xml : html).mayTidyHere(content.data->view())) ++here;
    }
    std::printf("%zu contents of %zu bytes, %zu of them tidied in place\n", contents.size(), bytes,
                here);
}

}  // namespace

int main() {
    const char* corpus = std::getenv("ORVANE_CORPUS");
    if (!corpus) {
        std::printf("ORVANE_CORPUS names no folder of documents\n");
        return 0;
    }
    const AutoreleasePool pool;
    const std::vector<Content> contents = readContents(std::filesystem::path(corpus) / "real");
    const Ref<HTMLSnippetTidier> html = Returner<HTMLSnippetTidier>::adopted(new HTMLSnippetTidier);
    const Ref<XMLSnippetTidier> xml = Returner<XMLSnippetTidier>::adopted(new XMLSnippetTidier);
    reportContents(contents, *html.get(), *xml.get());
    const Ref<URL> base = URL::url(String::string("http://example.org/feeds/index.xml"));
    Bare<HTMLSnippetTidier> bareHTML;
    Bare<XMLSnippetTidier> bareXML;

    constexpr int kRounds = 5;
    std::size_t failures = 0;
    const Comparison all = compare(
        [&] {
            for (const Content& content : contents) {
                const AutoreleasePool inner;
                Tidier* tidier = html.get();
                if (content.isXML) tidier = xml.get();
                const Ref<Data> tidied = tidier->tidy(content.data.get(), kUTF8, base.get());
                if (!tidied.get()) ++failures;
                keep(tidied);
            }
        },
        [&] {
            for (const Content& content : contents) {
                const std::string markup(content.data->view());
                keep(content.isXML ? bareXML.repairAlone(markup) : bareHTML.repairAlone(markup));
            }
        },
        kRounds);
    report("tidy a content and make it safe", all, static_cast<double>(contents.size()),
           "Tidy alone");
    if (failures > 0) std::printf("%zu times there was no result\n", failures);
    std::printf("tidy %.2f\n", all.ratio());
}
