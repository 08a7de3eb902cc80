#pragma once

#include "ExitStatus.h"
#include "Listing.h"

#include <Orvane/OVClient.h>

#include <string>

namespace Commands {

/// Looks at all that Orvane needs, one thing after the other, and writes down what it finds.
class Examination {
 public:
    /// A feed that has had nothing new for so many seconds may have been given up.
    static constexpr double kStaleSeconds = 365.0 * 24 * 3600;
    /// Less room than this on the disk is too little.
    static constexpr unsigned long long kLeastRoom = 100'000'000;

    Examination();

    // Of the machine.

    void storage();
    void bus();
    void units();
    void keyring(bool isNeeded);
    /// `newest` is the latest date in the database.
    void clock(const std::optional<OVDate>& newest, const OVDate& now);

    // Of what is in the database.

    void database(long long feeds, long long entries);
    /// What is wrong with each feed.
    void feeds(const std::vector<std::shared_ptr<OVFeed>>& all, const OVDate& now);

    // What is found.

    void good(const std::string& what, const std::string& text);
    void warning(const std::string& what, const std::string& text, const std::string& cure);
    void problem(const std::string& what, const std::string& text, const std::string& cure);

    const Listing& findings() const { return mFindings; }
    std::size_t problemCount() const { return mProblems; }

 private:
    void add(const std::string& what, const char* result, const std::string& text,
             const std::string& cure, Listing::Style style);

    Listing mFindings;
    std::size_t mProblems = 0;
};

}  // namespace Commands
