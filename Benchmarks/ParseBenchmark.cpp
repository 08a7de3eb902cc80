#include "Benchmarks/Measure.h"
#include "FeedParser/Parser.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "SQLite/Database.h"

#include <libxml/tree.h>
#include <libxml/xmlreader.h>

#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

/// What it costs to make free rows of documents, beside libxml2's reader over the same bytes: a
/// bare walk, and one that expands the root and writes it as the parser has to. Nothing of the
/// contents is tidied. All are measured in processor time, and documents that have to be repaired
/// first are left out.

using namespace Benchmarks;
using namespace Foundation;
using namespace Orvane;

namespace {

constexpr int kRounds = 11;

double processorSeconds() {
    timespec time = {};
    clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &time);
    return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_nsec) * 1e-9;
}

template <class Body>
double processorSecondsOf(Body&& body) {
    const double start = processorSeconds();
    body();
    return processorSeconds() - start;
}

std::string contentOf(const std::filesystem::path& path) {
    std::ifstream file(path, std::ios::binary);
    std::stringstream content;
    content << file.rdbuf();
    return content.str();
}

bool isReadAtOnce(const std::string& document) {
    const AutoreleasePool pool;
    const Ref<Data> data = Data::data(document.data(), document.size(), false);
    const FeedParser::Parser parser(data.get(), nullptr);
    return parser.getAttemptCount() == 1 && parser.getInfo()->getFeed();
}

std::vector<std::string> readCorpus(const std::filesystem::path& folder) {
    std::vector<std::string> documents;
    for (const auto& entry : std::filesystem::directory_iterator(folder)) {
        std::string document = contentOf(entry.path());
        if (isReadAtOnce(document)) documents.push_back(std::move(document));
    }
    return documents;
}

void parse(const std::string& document) {
    const AutoreleasePool pool;
    const Ref<Data> data = Data::data(document.data(), document.size(), false);
    const FeedParser::Parser parser(data.get(), nullptr);
    keep(parser.getInfo());
}

xmlTextReaderPtr open(const std::string& document) {
    constexpr int kOptions =
        XML_PARSE_RECOVER | XML_PARSE_NONET | XML_PARSE_NOCDATA | XML_PARSE_NOERROR;
    return xmlReaderForMemory(document.data(), static_cast<int>(document.size()), nullptr, nullptr,
                              kOptions);
}

void close(xmlTextReaderPtr reader) {
    xmlDocPtr doc = xmlTextReaderCurrentDoc(reader);
    xmlFreeTextReader(reader);
    xmlFreeDoc(doc);
}

void walk(const std::string& document) {
    const xmlTextReaderPtr reader = open(document);
    while (xmlTextReaderRead(reader) == 1) {
        keep(xmlTextReaderNodeType(reader));
    }
    close(reader);
}

void dumpRoot(xmlTextReaderPtr reader) {
    const xmlNodePtr root = xmlTextReaderExpand(reader);
    if (!root) return;
    const xmlBufferPtr buffer = xmlBufferCreate();
    keep(xmlNodeDump(buffer, root->doc, root, 0, 0));
    xmlBufferFree(buffer);
}

/// The reader as the parser uses it, with nothing made of what it reads.
void walkAndDump(const std::string& document) {
    const xmlTextReaderPtr reader = open(document);
    bool isRoot = true;
    while (xmlTextReaderRead(reader) == 1) {
        if (xmlTextReaderNodeType(reader) != XML_READER_TYPE_ELEMENT) continue;
        if (std::exchange(isRoot, false)) dumpRoot(reader);
    }
    close(reader);
}

struct Times {
    double parser, bare, walk;
};

Times measure(const std::vector<std::string>& documents) {
    std::vector<double> parser, bare, walked;
    const auto over = [&](void (*body)(const std::string&)) {
        return processorSecondsOf([&] {
            for (const std::string& document : documents)
                body(document);
        });
    };
    for (int i = 0; i < kRounds; ++i) {
        parser.push_back(over(parse));
        bare.push_back(over(walkAndDump));
        walked.push_back(over(walk));
    }
    return {median(parser), median(bare), median(walked)};
}

void reportLine(const char* what, double seconds, double bytes, double floor) {
    std::printf("%-44s %8.1f ms  %8.1f MB/s  ratio to the walk %.2f\n", what, seconds * 1e3,
                bytes / seconds / 1e6, seconds / floor);
}

}  // namespace

int main(int argc, char** argv) {
    const char* corpus = std::getenv("ORVANE_CORPUS");
    if (!corpus && argc < 2) {
        std::puts("ORVANE_CORPUS is not set: there are no documents to parse");
        return 0;
    }
    SQLite::Database::initialize();
    const std::string folder = argc > 1 ? argv[1] : std::string(corpus) + "/real/files";
    const std::vector<std::string> documents = readCorpus(folder);
    double bytes = 0;
    for (const std::string& document : documents)
        bytes += static_cast<double>(document.size());
    std::printf("%zu documents, %.1f MB\n", documents.size(), bytes / 1e6);

    const Times times = measure(documents);
    reportLine("libxml2's reader, a bare walk", times.walk, bytes, times.walk);
    reportLine("the same, the root expanded and written", times.bare, bytes, times.walk);
    reportLine("bytes to free rows", times.parser, bytes, times.walk);
    std::printf("parse %.2f\n", times.parser / times.bare);
}
