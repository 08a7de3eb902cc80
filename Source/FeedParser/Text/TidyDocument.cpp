#include "FeedParser/Text/TidyDocument.h"

#include "FeedParser/Text/Bounds.h"

#include <tidy/tidy.h>
#include <tidy/tidybuffio.h>

#include <utility>

namespace Orvane::FeedParser {

namespace {

class Buffer : Foundation::Uncopyable {
 public:
    Buffer() { tidyBufInit(&mBuffer); }
    ~Buffer() { tidyBufFree(&mBuffer); }

    TidyBuffer* get() { return &mBuffer; }
    std::string_view view() const {
        return {reinterpret_cast<const char*>(mBuffer.bp), mBuffer.bp ? mBuffer.size : 0};
    }

 private:
    TidyBuffer mBuffer;
};

Bool filterReport(TidyDoc document, TidyReportLevel, uint, uint, ctmbstr) {
    return static_cast<TidyDocument*>(tidyGetAppData(document))->countReport() ? yes : no;
}

/// Bytes that stay the caller's.
class Attached : Foundation::Uncopyable {
 public:
    explicit Attached(std::string_view bytes) {
        tidyBufInit(&mBuffer);
        // Tidy only reads what it is given to parse.
        auto* start = reinterpret_cast<byte*>(const_cast<char*>(bytes.data()));
        tidyBufAttach(&mBuffer, start, static_cast<uint>(bytes.size()));
    }
    ~Attached() { tidyBufDetach(&mBuffer); }

    TidyBuffer* get() { return &mBuffer; }

 private:
    TidyBuffer mBuffer;
};

}  // namespace

struct TidyDocument::Buffers {
    Buffer messages;
};

std::unique_ptr<TidyDocument> TidyDocument::create() {
    std::unique_ptr<TidyDocument> document(new TidyDocument);
    return document->mDocument ? std::move(document) : nullptr;
}

TidyDocument::TidyDocument()
    : mDocument(tidyCreateWithAllocator(mMemory.getAllocator())),
      mBuffers(std::make_unique<Buffers>()) {
    if (!mDocument) return;
    tidySetAppData(mDocument, this);
    tidySetReportFilter(mDocument, filterReport);
    tidySetErrorBuffer(mDocument, mBuffers->messages.get());
}

TidyDocument::~TidyDocument() {
    if (mDocument) tidyRelease(mDocument);
}

bool TidyDocument::set(const char* option, const char* value) {
    return tidyOptParseValue(mDocument, option, value) == yes;
}

bool TidyDocument::countReport() {
    if (mReports < Bounds::kTidyReports) {
        ++mReports;
        return true;
    }
    if (!mIsCut) Bounds::logHit("kTidyReports", Bounds::kTidyReports);
    mIsCut = true;
    return false;
}

int TidyDocument::repair(std::string_view input, const char* encoding) {
    ++mRepairs;
    mReports = 0;
    mIsCut = false;
    TidyBuffer* messages = mBuffers->messages.get();
    tidyBufClear(messages);
    Attached attached(input);
    int result = tidySetCharEncoding(mDocument, encoding);
    if (result >= 0) result = tidySetErrorBuffer(mDocument, messages);
    if (result >= 0) result = tidyParseBuffer(mDocument, attached.get());
    if (result >= 0) result = tidyCleanAndRepair(mDocument);
    if (result >= 0) result = tidyRunDiagnostics(mDocument);
    return result;
}

std::string TidyDocument::save() {
    Buffer output;
    tidySaveBuffer(mDocument, output.get());
    return std::string(output.view());
}

std::string TidyDocument::getMessages() const {
    return std::string(mBuffers->messages.view());
}

}  // namespace Orvane::FeedParser
