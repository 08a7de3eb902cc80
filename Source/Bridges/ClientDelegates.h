#pragma once

#include <Orvane/OVClientDelegate.h>
#include <Orvane/OVObject.h>

#include <functional>

namespace Orvane {

class ClientCore;

/// The delegates of the clients in this process, for those who have something to tell them and
/// know nothing of what clients are.
class ClientDelegates {
 public:
    /// The delegate of a client; null if it has none.
    static OVClientDelegate* get(const OVObject* client);
    /// Null takes it away. Not owned.
    static void set(const OVObject* client, OVClientDelegate* delegate);

    /// Lets `call` tell the delegate of the client that is a row, which may be null, something.
    /// Does nothing where there is none. What it throws is reported and goes no further.
    static void tell(const ClientCore* row, const std::function<void(OVClientDelegate&)>& call);
};

}  // namespace Orvane
