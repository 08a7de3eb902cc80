#pragma once

#include "Listing.h"
#include "Verb.h"

#include <Orvane/OVClient.h>

#include <memory>
#include <vector>

namespace Commands {

/// `orvane feeds`: what the client has subscribed to.
class FeedsVerb : public Verb {
 public:
    const VerbSpec& getSpec() const override;
    ExitStatus run(const Arguments& arguments) override;

    /// The feeds in the order of their titles.
    static std::vector<std::shared_ptr<OVFeed>> sorted(std::vector<std::shared_ptr<OVFeed>> feeds);
    /// The same in a list.
    static Listing list(const std::vector<std::shared_ptr<OVFeed>>& feeds);
};

}  // namespace Commands
