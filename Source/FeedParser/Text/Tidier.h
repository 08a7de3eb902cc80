#pragma once

#include "FeedParser/Text/HTMLMending.h"
#include "FeedParser/Text/MarkupEncoding.h"
#include "FeedParser/Text/TidyResult.h"
#include "FeedParser/Text/XMLMending.h"
#include "Foundation/Data.h"
#include "Foundation/RefCounted.h"
#include "Foundation/Returner.h"
#include "Foundation/URL.h"

#include <memory>
#include <string_view>

namespace Orvane::FeedParser {

class TidyDocument;

/// Repairs markup with HTML Tidy. The classes derived from it differ in what they take the markup
/// for.
///
/// Whatever its encoding, markup is made UTF-8 before it is repaired, as far as the encoding is
/// known: Tidy cuts references to characters that its own output cannot hold.
class Tidier : public Foundation::RefCounted {
 public:
    ~Tidier() override;

    /// Sets the options of `mDoc`. False if Tidy refuses one.
    virtual bool setupTidyOptions();
    virtual const char* getClassName() const = 0;

    /// The repaired markup. `data` itself if there is nothing to repair: no "<" and no "&". Null
    /// if the markup is beyond repair, or takes too much time or memory. `encoding` is libxml2's
    /// `xmlCharEncoding` of the bytes; where that tells none, the markup's own declaration counts.
    /// `baseURL`, which may be null, is what relative URLs in a snippet count from. Never throws
    /// for bad markup.
    Foundation::DataReturner tidy(Foundation::Data* data, int encoding, Foundation::URL* baseURL);

    /// Repairs in this process, for as long as it takes, which may be for ever: see `mayTidyHere`.
    /// Logs nothing but bounds.
    TidyResult tidyHere(std::string_view bytes, int encoding, Foundation::URL* baseURL);

    /// Whether a cheap look finds that repairing the markup can't take much.
    bool mayTidyHere(std::string_view markup) const;

    /// Makes `mDoc` with its options, if it is not there. False if it cannot be had.
    bool open();

 protected:
    Tidier();

    /// Mends `text` and has Tidy repair it; `output` is the result where that is 0 or 1. `mDoc` is
    /// open. Gives Tidy's result.
    virtual int repair(const MarkupEncoding::Text& text, Foundation::URL* baseURL,
                       std::string& output) = 0;
    int repairHTML(const MarkupEncoding::Text& text, HTMLMending::Kind kind, std::string& output);
    int repairXML(const MarkupEncoding::Text& text, XMLMending::Kind kind, std::string& output);

    std::unique_ptr<TidyDocument> mDoc;  ///< made on first use, and anew after a failure
    bool mTrim = false;                  ///< strip white space from the end of the output
    bool mReadsXML = false;              ///< takes markup for XML
};

}  // namespace Orvane::FeedParser
