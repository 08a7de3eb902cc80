#pragma once

#include <string>

/// The schemas that were: a database of version 10005 and, by the steps that led away from it,
/// those of every later one.
struct OldSchema {
    static constexpr int kOldest = 10005;
    static constexpr int kNewest = 10022;

    /// Makes a database of a version of the process's, which is open and empty, with a client, two
    /// subscriptions, two feeds and three entries, of which the first feed has two.
    static void make(int version);
};
