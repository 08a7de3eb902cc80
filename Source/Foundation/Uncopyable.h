#pragma once

namespace Foundation {

/// Base of what must be neither copied nor assigned.
class Uncopyable {
 public:
    Uncopyable(const Uncopyable&) = delete;
    Uncopyable& operator=(const Uncopyable&) = delete;

 protected:
    Uncopyable() = default;
    ~Uncopyable() = default;
};

}  // namespace Foundation
