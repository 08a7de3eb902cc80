#pragma once

#include "Foundation/TimeZone.h"
#include "Support/EnvVar.h"

#include <optional>

namespace Support {

/// Makes the zone of a name the default one while it lives.
class DefaultZone {
 public:
    explicit DefaultZone(const char* name) {
        mVariable.emplace("TZ", name);
        Foundation::TimeZone::resetDefaultZone();
    }
    ~DefaultZone() {
        mVariable.reset();
        Foundation::TimeZone::resetDefaultZone();
    }
    DefaultZone(const DefaultZone&) = delete;
    DefaultZone& operator=(const DefaultZone&) = delete;

 private:
    std::optional<EnvVar> mVariable;
};

}  // namespace Support
