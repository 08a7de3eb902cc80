#pragma once

#include "Foundation/RefCounted.h"

namespace Orvane {

/// Work that a `RequestQueue` starts when its turn has come. It leaves the queue when it has ended.
class Request : public Foundation::RefCounted {
 public:
    virtual void startRequest() = 0;
};

}  // namespace Orvane
