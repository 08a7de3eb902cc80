#include "FeedParser/Text/Tidier.h"

#include "FeedParser/Text/MarkupLook.h"
#include "FeedParser/Text/TidyDocument.h"
#include "FeedParser/Text/TidyHelper.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Logger.h"

#include <utility>

namespace Orvane::FeedParser {

using Foundation::AutoreleasePool;
using Foundation::Data;
using Foundation::DataReturner;
using Foundation::Ref;
using Foundation::URL;

namespace {

struct Option {
    const char* name;
    const char* value;
};

constexpr Option kOptions[] = {
    {"fix-uri", "no"},        {"wrap", "0"},
    {"indent-spaces", "0"},   {"tab-size", "1"},
    {"newline", "LF"},        {"indent", "no"},
    {"vertical-space", "no"}, {"numeric-entities", "yes"},
    {"escape-cdata", "yes"},  {"quote-ampersand", "yes"},
    {"tidy-mark", "no"},      {"drop-proprietary-attributes", "no"},
    {"hide-comments", "yes"}, {"indent-attributes", "no"},
};

bool hasNothingToRepair(std::string_view bytes) {
    return bytes.find_first_of("<&") == std::string_view::npos;
}

bool isSuccess(int code) {
    return code == 0 || code == 1;
}

/// As Tidy calls it. "raw" leaves every byte above 127 as it is.
const char* encodingName(const MarkupEncoding::Text& text) {
    return text.isUTF8 ? "utf8" : "raw";
}

void trimEnd(std::string& text) {
    text.erase(text.find_last_not_of("\t\n\r ") + 1);
}

}  // namespace

Tidier::Tidier() = default;
Tidier::~Tidier() = default;

bool Tidier::setupTidyOptions() {
    for (const Option& option : kOptions) {
        if (!mDoc->set(option.name, option.value)) return false;
    }
    return true;
}

bool Tidier::open() {
    if (mDoc && !mDoc->isWornOut()) return true;
    mDoc = TidyDocument::create();
    if (!mDoc) return false;
    if (setupTidyOptions()) return true;
    Foundation::gWarn.log("Tidier: setupTidyOptions failed!");
    mDoc.reset();
    return false;
}

DataReturner Tidier::tidy(Data* data, int encoding, URL* baseURL) {
    const AutoreleasePool pool;
    const std::string_view bytes = Data::asBytes(data).view();
    gLogTidier.log("Tidying %u bytes (class=%s, encoding=%i, baseURL=%@)...",
                   static_cast<unsigned>(bytes.size()), getClassName(), encoding, baseURL);
    gLogTidierVerbose.log("Tidier input:\n%.*s", static_cast<int>(bytes.size()), bytes.data());
    if (hasNothingToRepair(bytes)) return DataReturner::retained(data);

    TidyResult result =
        mayTidyHere(bytes) ? tidyHere(bytes, encoding, baseURL)
                           : TidyHelper::getShared().tidy(getClassName(), bytes, encoding, baseURL);
    if (result.code == TidyResult::kNothing) {
        gLogParser.log("Not tidied (%u bytes, encoding=%i, baseURL=%@): %s",
                       static_cast<unsigned>(bytes.size()), encoding, baseURL, result.messages);
        return nullptr;
    }
    if (!result.isSuccess()) {
        gLogParser.log("Tidy failed, rc=%i (%u bytes, encoding=%i, baseURL=%@)...", result.code,
                       static_cast<unsigned>(bytes.size()), encoding, baseURL);
        gLogTidier.log("Tidy Errors:\n%s", result.messages);
        return nullptr;
    }
    const std::string& output = result.output;
    gLogTidierVerbose.log("Tidier output:\n%.*s", static_cast<int>(output.size()), output.data());
    gLogTidier.log("...tidied into %u bytes", static_cast<unsigned>(output.size()));
    if (output.empty()) {
        Foundation::gWarn.log("Tidy returned 0 bytes of output (from %u bytes input)!",
                              static_cast<unsigned>(bytes.size()));
    }
    return Data::adopt(std::move(result.output));
}

bool Tidier::mayTidyHere(std::string_view markup) const {
    return MarkupLook::isSmallAndShallow(markup) && (mReadsXML || MarkupLook::isPlainHTML(markup));
}

TidyResult Tidier::tidyHere(std::string_view bytes, int encoding, URL* baseURL) {
    if (!open()) return TidyResult::nothing("Tidy can't be set up");
    TidyResult result;
    result.code = repair(MarkupEncoding::toUTF8(bytes, encoding), baseURL, result.output);
    if (!result.isSuccess()) {
        result.output.clear();
        result.messages = mDoc->getMessages();
        mDoc.reset();
    }
    if (mTrim) trimEnd(result.output);
    return result;
}

int Tidier::repairHTML(const MarkupEncoding::Text& text, HTMLMending::Kind kind,
                       std::string& output) {
    HTMLMending mending(kind);
    const std::string mended = mending.mend(text.bytes);
    const int code = mDoc->repair(mended, encodingName(text));
    if (isSuccess(code)) output = mDoc->save();
    return code;
}

int Tidier::repairXML(const MarkupEncoding::Text& text, XMLMending::Kind kind,
                      std::string& output) {
    XMLMending mending(kind, text.isUTF8);
    const std::string mended = mending.mend(text.bytes);
    const int code = mDoc->repair(mended, encodingName(text));
    if (isSuccess(code)) output = mending.restore(mDoc->save());
    return code;
}

}  // namespace Orvane::FeedParser
