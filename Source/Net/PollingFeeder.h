#pragma once

#include "Foundation/Data.h"
#include "Model/FeedCore.h"
#include "Net/Feeder.h"
#include "Net/HTTPRequest.h"

#include <cstdint>
#include <optional>

namespace Orvane {

/// Refreshes a feed by asking for its document, over HTTP or from a file, whenever it is told to;
/// parses what comes, and merges it into the feed.
///
/// Two things spare the parsing where nothing is new: a conditional request, and the hash of the
/// last document. A feed that has moved for good keeps its URL and gets the new one beside it,
/// which is asked first from then on, and the old one once more where that fails.
class PollingFeeder : public Feeder {
 public:
    /// Seconds after which a feed that nobody wants to be refreshed is, when it is asked for.
    static constexpr double kUnscheduledInterval = 1800.0;

    /// Whether feeds can be fetched from there: by "http", "https" and "file". False for null.
    static bool supportsURL(const Foundation::URL* url);

    explicit PollingFeeder(const Foundation::Ref<FeedCore>& feed);
    ~PollingFeeder() override;

    void removed() override;
    bool needsRefresh() const override;
    void refreshFromData(Foundation::Data* data) override;
    /// Merges a document into the feed. Whether that changed it; `error` is set if it could not be
    /// read as a feed. What parsing or merging throws is reported, and becomes an error of
    /// `OVInternalError`: the feed is then to be fetched again as if this had not been.
    bool parseFeed(Foundation::Data* data, Foundation::NetError& error);

    /// How many there are in the process.
    static int getObjectCount() { return sObjectCount; }

 protected:
    bool doRefresh() override;
    void cancelRefresh() override;

 private:
    void startRequest(Foundation::URL* url);
    bool askForPassword(Foundation::URL* url);
    void gotPassword(std::uint32_t lookUp, Foundation::URL* url, Foundation::String* password);
    void openRequest(Foundation::URL* url);
    void clearRequest();
    void openedConnection(URLRequest* request);
    void gotStatus(URLRequest* request);
    void finished(URLRequest* request);
    void gotError(URLRequest* request);
    void gotError(Foundation::NetError error);
    void _fetchFromFile();
    void parseFeed();
    bool isNew(Foundation::Data* data);
    bool parseAndMerge(Foundation::Data* data, Foundation::NetError& error);
    Foundation::Returner<FeedCore> parse(Foundation::Data* data);
    bool merge(FeedCore* parsed);

    static std::int32_t sOdometer;
    static std::int32_t sObjectCount;

    Foundation::Ref<HTTPRequest> mRequest;
    Foundation::Ref<Foundation::Data> mData;     ///< what came, until it is parsed
    Foundation::Ref<Foundation::URL> mFinalURL;  ///< where the data came from, and its base
    Foundation::Ref<Foundation::URL> mFinalPermanentURL;
    bool mFetchAnnounced = false;  ///< in this refresh
    const std::int32_t mSerial;
    /// What was known of the document before it was fetched, for when it cannot be merged.
    std::optional<FeedCore::ReadState> mBefore;
    bool mIsParseDue = false;         ///< the document waits for the next turn of the loop
    std::uint32_t mLookUp = 0;        ///< of a password; an answer to an earlier one counts no more
    bool mHasStoredPassword = false;  ///< the feed's password came from the user's store
};

}  // namespace Orvane
