#pragma once

#include "FeedParser/Context.h"
#include "FeedParser/DocumentInput.h"
#include "FeedParser/EntitySubset.h"
#include "FeedParser/Info.h"
#include "FeedParser/RawXML.h"
#include "Foundation/Data.h"
#include "Foundation/Ref.h"
#include "Foundation/URL.h"
#include "Foundation/Uncopyable.h"

#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

struct _xmlDoc;
struct _xmlNode;
struct _xmlTextReader;

namespace Orvane::FeedParser {

class Tidier;

/// Finds out what a document of bytes from anywhere is: a feed, a single entry, a web page, a
/// person, or nothing. All work is done as the parser is made; read the `Info` and drop it.
///
/// The document is taken as hostile, and as badly made: up to four attempts are made at it, with
/// repairs in between. Bad input throws nothing and opens no file and no connection.
///
/// REQUIRES: `SQLite::Database::initialize` was called; the database need not be open.
///
/// Sets hooks of libxml2 that hold for the process: one parser at a time, on one thread.
class Parser : Foundation::Uncopyable {
 public:
    /// Parses. `data` and `url`, which is the document's own, may be null.
    Parser(Foundation::Data* data, Foundation::URL* url);
    virtual ~Parser();

    /// What the document turned out to be: of kind `UnknownKind` if nothing. Owned by the parser.
    Info* getInfo() const { return mInfo.get(); }

    // How it went, for those who look into documents.

    /// How many attempts were made, from 1 to 4; not counted is one before which the document could
    /// not be repaired.
    int getAttemptCount() const { return mAttemptCount; }
    /// The class of the tidier whose output was parsed in the end; null if the document itself was.
    const char* getTidierName() const { return mTidierName; }

    /// For libxml2: an error or a warning in the document.
    void handleError(const char* message, int severity, void* locator);

 private:
    class Attempt;

    void startParsing();
    void postprocess();

    // One attempt.

    void attemptParse();
    void clearAttempt();
    bool openReader(Attempt& attempt);
    bool mayTryAgain() const;
    void readDocument();
    void learnFromFirstAttempt();
    void unwind();

    // Mending, before the second attempt.

    bool tidyDocument();
    Foundation::DataReturner tidyAsHTML(Tidier& tidier);

    // The document's elements.

    void handleStartElement();
    void handleFirstElement();
    bool pushContext(const _xmlNode* element);
    void handleContent(_xmlNode* element, Context* context);
    bool readXML(Context* context, bool outer);
    bool keepXML(_xmlNode* element, Context* context, bool outer);
    bool mayKeepXML(const Context* context);
    void handleAttributes(const _xmlNode* element);
    void advanceReaderToElementEnd(Tag tag);
    void handleEndElement();
    bool contextStackContainsLiteralTag(Tag tag) const;
    void popTopAndHandleIt();

    void noteError(int code);
    bool claimsToBeUTF8() const;
    bool isUTF8();
    void stopAfterTooManyErrors(void* locator);

    std::int32_t mAttempt = 0;  ///< how many attempts have failed
    std::int32_t mErrorCount = 0;
    bool mFatalError = false;
    bool mIsLastAttempt = false;
    bool mBadUTF8 = false;
    /// Lets names match with any prefix. Unlike what is noted of an attempt, this stays.
    bool mUndefinedNamespace = false;
    bool mSawFirstElement = false;
    _xmlTextReader* mReader = nullptr;  ///< null between attempts
    _xmlDoc* mDoc = nullptr;            ///< the reader's, once the first element was seen
    int mEncoding = 0;                  ///< libxml2's `xmlCharEncoding`, as attempt 1 learned it
    bool mTidyAsHTML = false;
    Foundation::Ref<Info> mInfo;
    Foundation::Ref<Foundation::Data> mData;
    std::vector<Foundation::Ref<Context>> mContextStack;  ///< the root first

    RawXML mRawXML;
    std::size_t mRawBytes = 0;     ///< raw XML that contexts got in this attempt
    std::size_t mEntries = 0;      ///< in this attempt
    std::size_t mEntityBytes = 0;  ///< what entities in attributes came to in this attempt
    bool mHitRawBytes = false;     ///< in this attempt
    bool mStopped = false;         ///< too many errors in this attempt
    bool mIsOverBudget = false;    ///< no further attempt may be made
    ParseBudget mBudget;
    std::optional<bool> mIsUTF8;  ///< whether the bytes are, once somebody asked in this attempt
    int mAttemptCount = 0;
    const char* mTidierName = nullptr;
};

}  // namespace Orvane::FeedParser
