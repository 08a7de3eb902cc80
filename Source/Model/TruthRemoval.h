#pragma once

namespace Foundation {
class URL;
}

namespace Orvane {

class FeedCore;

/// How the directories of feeds' saved entries go. One is taken away at once, by the extension
/// "deleted.at." with the time in seconds, and deleted under that name on the thread of
/// `FileDeletionQueue`.
struct TruthRemoval {
    /// Takes the directory of a feed away. That it cannot be draws a warning. Within a transaction
    /// its files stay until the loop's next turn, and it gets its name back if the feed is still
    /// there then, as by `finish`.
    static void remove(const FeedCore* feed, Foundation::URL* directory);

    /// Deals with what an earlier process has left under such names. It is deleted, but for the
    /// directory of a feed that is still there with its archived entries, and has no other one: the
    /// feed's deletion never came to its end, and the directory gets its name back.
    /// REQUIRES: the database of the process is open. Throws `SQLite::Exception`.
    static void finish();
};

}  // namespace Orvane
