#pragma once

#include "Foundation/Uncopyable.h"

namespace Orvane {

/// The entries that nobody wants to keep any longer: first seen before the expiration dates of all
/// subscriptions of their feed that have one, not flagged, and no longer in the feed's document.
///
/// Goes by what is saved, and deletes behind the backs of the rows in memory, which the caller lets
/// go before. Lists the entries in a temporary table while it lives. Operations throw
/// `SQLite::Exception`. REQUIRES: a transaction, which outlives it, so that no failure leaves the
/// table or half of the work behind.
class ExpiredEntries : Foundation::Uncopyable {
 public:
    /// Finds them.
    ExpiredEntries();

    /// Deletes them with their enclosures, contents and files. How many rows that were.
    int remove();

    /// Deletes entries of feeds in memory that are older than two days. Nobody uses them any more.
    /// How many there were.
    static int bustGhosts();

 private:
    static int removeContents();
    static void removeFiles();
};

}  // namespace Orvane
