#pragma once

#include "Bridges/OVInternal.h"
#include "Foundation/String.h"
#include "Model/ContentCore.h"

#include <Orvane/OVContent.h>

#include <memory>

/// The state of an `OVContent`.
class OVContentInternal : public OVInternal {
 public:
    /// The row, for use: see `OVInternal::useCore`.
    Orvane::ContentCore& core() const { return static_cast<Orvane::ContentCore&>(useCore()); }
    /// The same to look at; null only while the object is made.
    Orvane::ContentCore* peek() const { return static_cast<Orvane::ContentCore*>(getCore()); }

    Foundation::Ref<Foundation::String> plainTextCache;   ///< null until it is asked for
    Foundation::Ref<Foundation::String> plainTextSource;  ///< the HTML that it was made of
};
