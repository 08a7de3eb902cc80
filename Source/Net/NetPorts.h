#pragma once

#include "Foundation/Uncopyable.h"
#include "Net/KeyringCredentialStore.h"
#include "Net/PollingFeederFactory.h"

namespace Orvane {

/// What this layer does behind the model's ports, connected while this lives: feeders, the reading
/// of files, and the user's store of passwords.
class NetPorts : Foundation::Uncopyable {
 public:
    NetPorts();
    ~NetPorts();

 private:
    PollingFeederFactory mFeeders;
    KeyringCredentialStore mCredentials;
};

}  // namespace Orvane
