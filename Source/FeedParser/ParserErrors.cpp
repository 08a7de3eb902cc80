#include "FeedParser/Parser.h"
#include "FeedParser/Text/Bounds.h"
#include "Foundation/Logger.h"
#include "Foundation/UTF8.h"
#include "Utilities/XMLText.h"

#include <libxml/encoding.h>
#include <libxml/parser.h>
#include <libxml/xmlerror.h>
#include <libxml/xmlreader.h>
#include <string>
#include <string_view>
#include <utility>

namespace Orvane::FeedParser {

namespace {

std::string_view withoutLineEnd(const char* message) {
    std::string_view text = message ? message : "";
    while (text.ends_with('\n')) {
        text.remove_suffix(1);
    }
    return text;
}

int lineOf(void* locator) {
    return locator ? xmlTextReaderLocatorLineNumber(locator) : -1;
}

}  // namespace

void Parser::handleError(const char* message, int, void* locator) {
    int code = 0;
    bool isFatal = false;
    if (const xmlError* error = xmlGetLastError()) {
        code = error->code;
        isFatal = error->level == XML_ERR_FATAL;
        if (!message) message = error->message;
        noteError(code);
        if (code == XML_SAVE_NOT_UTF8) isFatal = true;
    }
    gLogParser.log("%sError %i, Line %d: %s", isFatal ? "Fatal " : "", code, lineOf(locator),
                   std::string(withoutLineEnd(message)));
    ++mErrorCount;
    if (isFatal) {
        mFatalError = true;
    } else {
        xmlResetLastError();
    }
    if (mErrorCount >= Bounds::kParserErrors) stopAfterTooManyErrors(locator);
}

void Parser::noteError(int code) {
    switch (code) {
        case XML_SAVE_NOT_UTF8:
            mBadUTF8 = true;
            break;
        case XML_ERR_INVALID_CHAR:
            // That is how this libxml2 puts it as well, and about control characters too.
            if (claimsToBeUTF8() && !isUTF8()) mBadUTF8 = true;
            break;
        case XML_NS_ERR_UNDEFINED_NAMESPACE:
            mUndefinedNamespace = true;
            break;
        default:
            break;
    }
}

bool Parser::isUTF8() {
    if (!mIsUTF8) mIsUTF8 = Foundation::UTF8::isValid(mData->view());
    return *mIsUTF8;
}

bool Parser::claimsToBeUTF8() const {
    const xmlChar* name = xmlTextReaderConstEncoding(mReader);
    return !name || xmlParseCharEncoding(xmlCString(name)) == XML_CHAR_ENCODING_UTF8;
}

void Parser::stopAfterTooManyErrors(void* locator) {
    if (!std::exchange(mStopped, true)) Bounds::logHit("errors", Bounds::kParserErrors);
    mFatalError = true;
    if (locator) xmlStopParser(static_cast<xmlParserCtxtPtr>(locator));
}

}  // namespace Orvane::FeedParser
