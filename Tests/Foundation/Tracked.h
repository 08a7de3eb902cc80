#pragma once

#include "Foundation/PFRefCounted.h"
#include "Foundation/RefCounted.h"

#include <string>
#include <vector>

/// Objects of both kinds that write their name into a list when they are destroyed.

using Deaths = std::vector<std::string>;

class TrackedObject : public Foundation::RefCounted {
 public:
    TrackedObject(std::string name, Deaths* deaths) : mName(std::move(name)), mDeaths(deaths) {}
    ~TrackedObject() override { mDeaths->push_back(mName); }

 private:
    std::string mName;
    Deaths* mDeaths;
};

class TrackedValue : public Foundation::PFRefCounted {
 public:
    TrackedValue(std::string name, Deaths* deaths) : mName(std::move(name)), mDeaths(deaths) {}
    ~TrackedValue() override { mDeaths->push_back(mName); }

 private:
    std::string mName;
    Deaths* mDeaths;
};
