#pragma once

#include "FeedParser/Text/TidyMemory.h"
#include "Foundation/Uncopyable.h"

#include <memory>
#include <string>
#include <string_view>

struct _TidyDoc;

namespace Orvane::FeedParser {

/// A document of HTML Tidy with its options, for one markup after the other. Any one thread.
class TidyDocument : Foundation::Uncopyable {
 public:
    /// Null if Tidy has no memory for it.
    static std::unique_ptr<TidyDocument> create();
    ~TidyDocument();

    /// Sets the option of a name from Tidy's manual. False if Tidy refuses.
    [[nodiscard]] bool set(const char* option, const char* value);
    /// Reads, repairs and checks `input`, of and for an encoding named as Tidy does. Gives Tidy's
    /// own result: 0, 1 with warnings, 2 with errors, and negative where it could not go on.
    int repair(std::string_view input, const char* encoding);
    /// The markup that the last repair made.
    std::string save();
    /// What Tidy wrote about the last repair; cut if there is much.
    std::string getMessages() const;
    /// Whether it was cut.
    bool hasCutMessages() const { return mIsCut; }
    /// Whether it has served long enough: what Tidy forgets to free of each markup stays with it.
    bool isWornOut() const { return mRepairs >= kRepairs; }

    /// For Tidy: whether one more message is to be written.
    bool countReport();

 private:
    struct Buffers;
    static constexpr int kRepairs = 100;

    TidyDocument();

    TidyMemory mMemory;
    const _TidyDoc* mDocument;
    std::unique_ptr<Buffers> mBuffers;
    int mRepairs = 0;
    int mReports = 0;
    bool mIsCut = false;
};

}  // namespace Orvane::FeedParser
