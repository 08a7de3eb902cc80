#pragma once

#include "FeedParser/Text/TidyPipe.h"
#include "Foundation/Ref.h"
#include "Foundation/Uncopyable.h"

#include <map>
#include <string>

namespace Orvane::FeedParser {

class Tidier;

/// What the program "orvane-tidy" does: tidies what comes through a pipe, within bounds of memory
/// and time that end the process where a document goes beyond.
class TidyService : Foundation::Uncopyable {
 public:
    /// `fd` is the pipe's end; not owned.
    explicit TidyService(int fd);
    ~TidyService();

    /// Bounds the memory of the process, and for each document its time. For good.
    void boundProcess();
    /// Says that it is there, and serves until the other end is gone or asks for nothing for that
    /// long. Gives the exit status: 0, or 1 where what came made no sense.
    int run(double idleSeconds);

 private:
    TidyReply tidy(const TidyRequest& request);

    TidyPipe mPipe;
    bool mIsBound = false;
    std::map<std::string, Foundation::Ref<Tidier>> mTidiers;  ///< by class
};

}  // namespace Orvane::FeedParser
