#pragma once

#include "Arguments.h"

#include <Orvane/OVClient.h>

#include <memory>
#include <string>

namespace Commands {

/// The client that a verb acts for.
class Session {
 public:
    /// Whom the command line acts for if nothing else is said: the pages of the browser show what
    /// this one has subscribed to.
    static constexpr const char* kClient = "com.tarnwick.Brisko";
    /// The largest enclosures of a client that is made here. It keeps entries for good.
    static constexpr double kMaxEnclosureSize = 500e6;

    /// Opens the database, and makes the client if there is none of that name. Throws `Failure`,
    /// with the cure.
    explicit Session(const Arguments& arguments);

    OVClient& client() const { return *mClient; }
    const std::string& clientName() const { return mName; }

 private:
    void open();
    void setUp() const;

    std::string mName;
    std::shared_ptr<OVClient> mClient;
};

}  // namespace Commands
