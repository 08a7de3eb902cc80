#pragma once

#include "FeedParser/Text/TidyPipe.h"
#include "Foundation/RunLoopSource.h"
#include "Foundation/URL.h"
#include "Foundation/Uncopyable.h"
#include "Foundation/UniqueFD.h"

#include <sys/types.h>

#include <memory>
#include <string>
#include <string_view>

namespace Orvane::FeedParser {

/// The program "orvane-tidy", which tidies what could hang, bloat or crash the process that asks:
/// Tidy recurses, and takes minutes for some 20 KB. It is started on demand, serves one document
/// after the other, and is killed where one takes too long; the next document starts it anew. It
/// ends by itself when it has had nothing to do for a while, and with the process that started it.
///
/// Waiting for it stops the thread, at most `Bounds::kTidySeconds`, and does not turn the run loop:
/// a getter that tidies must not let anything else happen. The run loop's thread; the loop only
/// notices that an idle helper has ended, and reaps it.
class TidyHelper : Foundation::Uncopyable {
 public:
    /// The helper of the process.
    static TidyHelper& getShared();

    /// `seconds` is how long it may take for a document.
    explicit TidyHelper(double seconds);
    /// Ends the program.
    ~TidyHelper();

    /// Tidies as the tidier of the class does. The code is `TidyResult::kNothing`, with the reason,
    /// if that takes too long or too much, or the program can't be started, which is warned about.
    TidyResult tidy(const char* className, std::string_view markup, int encoding,
                    const Foundation::URL* base);

    /// Ends the program and reaps it, if it runs.
    void stop();
    /// The program's process; -1 if it does not run.
    pid_t getPID() const { return mPID; }

    /// Where the program is: in `$ORVANE_PROGRAMS`, or else where the library's own are installed,
    /// or else in the tree of the program that runs, which may be one that was just built.
    static std::string getPath();

 private:
    bool start();
    bool startAndAwait();
    /// Whether the program runs; one that has ended is reaped.
    bool isThere();
    TidyPipe::Outcome exchange(const char* className, std::string_view markup, int encoding,
                               std::string_view base, TidyReply& reply);
    /// Reaps the program, killing it first if it has not ended. Whether it had ended well.
    bool reap();

    double mSeconds;
    Foundation::UniqueFD mSocket;
    pid_t mPID = -1;
    bool mHasWarned = false;
    std::unique_ptr<Foundation::FileDescriptorSource> mWatch;  ///< notices the program's end
};

}  // namespace Orvane::FeedParser
