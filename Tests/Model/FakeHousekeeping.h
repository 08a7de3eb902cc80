#pragma once

#include "Model/Housekeeping.h"

#include <functional>

/// Counts what it is asked. It is the port of the process while it lives.
class FakeHousekeeping : public Orvane::Housekeeping {
 public:
    FakeHousekeeping() { setCurrent(this); }
    ~FakeHousekeeping() override { setCurrent(nullptr); }
    void updateAllUnreadCountsSoon() override { ++recounts; }
    int expungeOldArticles() override {
        ++expunges;
        if (onExpunge) onExpunge();
        return 0;
    }

    int recounts = 0;
    int expunges = 0;
    std::function<void()> onExpunge;
};
