#include "FeedParser/Parser.h"

#include "FeedParser/DocumentGuard.h"
#include "FeedParser/EncodingAliases.h"
#include "FeedParser/LibXMLHooks.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "SQLite/RowIterator.h"
#include "Utilities/XMLText.h"

#include <libxml/encoding.h>
#include <libxml/xmlreader.h>
#include <utility>

namespace Orvane::FeedParser {

using Foundation::AutoreleasePool;
using Foundation::Data;
using Foundation::gWarn;
using Foundation::Ref;
using Foundation::String;
using Foundation::URL;

namespace {

constexpr int kAttempts = 4;
constexpr int kTidyingAttempt = 1;

/// The encoding that an attempt forces upon the document; null for the one that it declares.
const char* forcedEncoding(int attempt) {
    switch (attempt) {
        case 2:
            return "CP1252";
        case 3:
            return "UTF-8";
        default:
            return nullptr;
    }
}

void readerError(void* parser, const char* message, xmlParserSeverities severity,
                 xmlTextReaderLocatorPtr locator) {
    if (!parser) return;
    Foundation::callGuarded(__PRETTY_FUNCTION__, [&] {
        static_cast<Parser*>(parser)->handleError(message, severity, locator);
    });
}

}  // namespace

/// What libxml2 holds and has set while an attempt lasts, in the order in which that is made.
class Parser::Attempt : Foundation::Uncopyable {
 public:
    explicit Attempt(Parser& parser)
        : mParser(parser), mHooks(parser), mInput(parser.mData->asBytes(), parser.mBudget) {}
    ~Attempt() {
        // Closing frees the document as well, unless its first element was seen.
        mNextDocument.release();
        xmlTextReaderClose(mParser.mReader);
        xmlFreeTextReader(std::exchange(mParser.mReader, nullptr));
        xmlFreeDoc(std::exchange(mParser.mDoc, nullptr));
        if (mInput.isOverBudget()) mParser.mIsOverBudget = true;
    }

    DocumentInput& input() { return mInput; }
    void endReading() { mHooks.endReading(); }

 private:
    Parser& mParser;
    LibXMLHooks mHooks;
    DocumentInput mInput;
    EntitySubset::NextDocument mNextDocument;
};

Parser::Parser(Data* data, URL* url)
    : mInfo(new Info(this, url)), mBudget(Data::asBytes(data).getLength()) {
    const AutoreleasePool pool;
    [[maybe_unused]] static const bool sIsSetUp = [] {
        registerEncodingAliases();
        EntitySubset::shared();
        return true;
    }();
    mData = DocumentGuard::check(data);
    startParsing();
    postprocess();
}

Parser::~Parser() {
    // The result may outlive the parser.
    if (mInfo.get()) mInfo->parser = nullptr;
}

void Parser::startParsing() {
    do {
        mFatalError = false;
        attemptParse();
    } while (mFatalError && mayTryAgain());
    gLogParser.log("Finished parsing; mAttempt=%i, mFatalError=%i", mAttempt, mFatalError);
}

bool Parser::mayTryAgain() const {
    return mAttempt != kAttempts && !mIsOverBudget;
}

void Parser::attemptParse() {
    gLogParser.log("Beginning attempt #%i", mAttempt + 1);
    if (mAttempt == kTidyingAttempt && !tidyDocument()) return;
    mAttemptCount = mAttempt + 1;
    if (Data::asBytes(mData.get()).isEmpty()) return;
    {
        Attempt attempt(*this);
        if (!openReader(attempt)) return;
        readDocument();
        attempt.endReading();
        if (mFatalError) ++mAttempt;
        if (mAttempt == 1) learnFromFirstAttempt();
        unwind();
        if (mFatalError) {
            const Ref<URL> url = mInfo->url;
            mInfo = Ref<Info>(new Info(this, url.get()));
        }
    }
    gLogParser.resetIndentation();
    gLogParserVerbose.resetIndentation();
    gLogParserDates.resetIndentation();
}

void Parser::clearAttempt() {
    mErrorCount = 0;
    mFatalError = false;
    mIsLastAttempt = mAttempt == kAttempts - 1;
    mBadUTF8 = false;
    mSawFirstElement = false;
    mRawBytes = 0;
    mEntries = 0;
    mEntityBytes = 0;
    mHitRawBytes = false;
    mStopped = false;
    mIsUTF8.reset();
    mContextStack.clear();
}

bool Parser::openReader(Attempt& attempt) {
    constexpr int kOptions = XML_PARSE_RECOVER | XML_PARSE_NONET | XML_PARSE_NOCDATA;
    const char* encoding = forcedEncoding(mAttempt);
    // Else what the document declares would replace it.
    const int options = encoding ? kOptions | XML_PARSE_IGNORE_ENC : kOptions;
    const Ref<String> base = mInfo->url.get() ? mInfo->url->getString() : nullptr;
    // Piece by piece, so that it can be ended where it takes too long.
    mReader = xmlReaderForIO(DocumentInput::read, nullptr, &attempt.input(),
                             base.get() ? base->utf8().c_str() : nullptr, encoding, options);
    if (!mReader) {
        gWarn.log("FeedParser:  xmlReaderForMemory() failed!");
        return false;
    }
    clearAttempt();
    xmlTextReaderSetErrorHandler(mReader, readerError, this);
    // References stay in the XML that contexts get, who undo them with all other escapes.
    xmlTextReaderSetParserProp(mReader, XML_PARSER_SUBST_ENTITIES, 0);
    Ref<Context> root = Context::newRootContext();
    root->baseURI = xmlCString(xmlTextReaderConstBaseUri(mReader));
    root->info = mInfo.get();
    mContextStack.push_back(std::move(root));
    return true;
}

void Parser::readDocument() {
    while (!mInfo->done && xmlTextReaderRead(mReader) == 1) {
        switch (xmlTextReaderNodeType(mReader)) {
            case XML_READER_TYPE_END_ELEMENT:
                handleEndElement();
                break;
            case XML_READER_TYPE_ELEMENT:
                handleStartElement();
                break;
            default:
                break;
        }
    }
}

void Parser::learnFromFirstAttempt() {
    if (mBadUTF8) {
        // A document that is not the UTF-8 which it claims to be is taken for Latin-1.
        mEncoding = XML_CHAR_ENCODING_8859_1;
    } else {
        mEncoding = xmlParseCharEncoding(xmlCString(xmlTextReaderConstEncoding(mReader)));
    }
    if (mInfo->kind == Info::PageKind && mInfo->page.get()) mTidyAsHTML = true;
}

void Parser::unwind() {
    while (!mContextStack.empty()) {
        popTopAndHandleIt();
    }
}

void Parser::postprocess() {
    FeedCore* feed = mInfo->getFeed();
    if (!feed) return;
    // Plain text is made of markup that is tidied first: only of what counted in the end.
    if (const ContentCore* description = mInfo->description.get()) {
        feed->mSubtitle.setValue(description->getPlainTextString());
    }
    feed->setXMLData(mData.get());
    const bool hasAuthors = mInfo->defaultAuthors.get() || mInfo->defaultContributors.get();
    const bool hasTime = mInfo->defaultTimePublished.get() || mInfo->defaultTimeZonePublished.get();
    if (!hasAuthors && !hasTime) return;
    for (auto entry = feed->getEntries(nullptr); entry.hasRow(); entry.nextRow()) {
        const AutoreleasePool pool;
        if (hasAuthors) {
            entry->useDefaultAuthors(mInfo->defaultAuthors.get(), mInfo->defaultContributors.get());
        }
        if (hasTime) {
            entry->useDefaultTimePublished(mInfo->defaultTimePublished.get(),
                                           mInfo->defaultTimeZonePublished.get());
        }
    }
}

}  // namespace Orvane::FeedParser
