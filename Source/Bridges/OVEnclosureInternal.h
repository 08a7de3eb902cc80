#pragma once

#include "Bridges/OVInternal.h"
#include "Model/EnclosureCore.h"

#include <Orvane/OVEnclosure.h>

#include <memory>

class OVClient;

/// The state of an `OVEnclosure`.
class OVEnclosureInternal : public OVInternal {
 public:
    /// The row, for use: see `OVInternal::useCore`.
    Orvane::EnclosureCore& core() const { return static_cast<Orvane::EnclosureCore&>(useCore()); }
    /// The same to look at; null only while the object is made.
    Orvane::EnclosureCore* peek() const { return static_cast<Orvane::EnclosureCore*>(getCore()); }

    /// Of its own is handed on to the entry.
    void _setClient(const std::shared_ptr<OVClient>& newClient) { client = newClient; }

    std::shared_ptr<OVClient> client;  ///< through which it was found; may be null
};
