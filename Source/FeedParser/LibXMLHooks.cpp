#include "FeedParser/LibXMLHooks.h"

#include "FeedParser/Parser.h"
#include "Foundation/Guard.h"

#include <libxml/parser.h>
#include <libxml/xmlerror.h>
#include <cstdarg>
#include <cstdio>

namespace Orvane::FeedParser {

namespace {

xmlParserInputPtr disableExternalEntityLoading(const char*, const char*, xmlParserCtxtPtr) {
    return nullptr;
}

// The one function of the parser with C varargs: libxml2 calls it so.
__attribute__((format(printf, 2, 3))) void handleGenericError(void* context, const char* format,
                                                              ...) {
    if (!context) return;
    char message[256];
    va_list arguments;
    va_start(arguments, format);
    std::vsnprintf(message, sizeof message, format, arguments);
    va_end(arguments);
    Foundation::callGuarded(__PRETTY_FUNCTION__, [&] {
        static_cast<Parser*>(context)->handleError(message, 0, nullptr);
    });
}

}  // namespace

LibXMLHooks::LibXMLHooks(Parser& parser) : mSavedLoader(xmlGetExternalEntityLoader()) {
    xmlSetExternalEntityLoader(disableExternalEntityLoading);
    xmlSetGenericErrorFunc(&parser, handleGenericError);
}

LibXMLHooks::~LibXMLHooks() {
    endReading();
    xmlSetExternalEntityLoader(mSavedLoader);
}

void LibXMLHooks::endReading() {
    xmlSetGenericErrorFunc(nullptr, nullptr);
}

}  // namespace Orvane::FeedParser
