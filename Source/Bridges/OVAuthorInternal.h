#pragma once

#include "Bridges/OVInternal.h"
#include "Model/AuthorCore.h"

#include <Orvane/OVAuthor.h>

#include <memory>

/// The state of an `OVAuthor`.
class OVAuthorInternal : public OVInternal {
 public:
    /// The row, for use: see `OVInternal::useCore`.
    Orvane::AuthorCore& core() const { return static_cast<Orvane::AuthorCore&>(useCore()); }
    /// The same to look at; null only while the object is made.
    Orvane::AuthorCore* peek() const { return static_cast<Orvane::AuthorCore*>(getCore()); }
};
