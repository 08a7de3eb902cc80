#pragma once

#include <unordered_set>
#include <utility>
#include <vector>

namespace Orvane {

/// A set that keeps the order in which its elements came.
template <class T>
class OnceList {
 public:
    /// Does nothing if it is there.
    void add(const T& element) {
        if (mKnown.insert(element).second) mElements.push_back(element);
    }
    /// All of them, and leaves none.
    std::vector<T> take() {
        mKnown.clear();
        return std::exchange(mElements, {});
    }

 private:
    std::unordered_set<T> mKnown;
    std::vector<T> mElements;
};

}  // namespace Orvane
