#pragma once

#include <algorithm>
#include <functional>
#include <memory>
#include <type_traits>
#include <vector>

/// Helpers for the lists of objects that operations of the library give.

/// Whether a list holds this very object, and not only an equal one. `object` may be null.
template <class T>
bool ov_containsObjectIdenticalTo(const std::vector<std::shared_ptr<T>>& list, const T* object) {
    return std::any_of(list.begin(), list.end(),
                       [object](const std::shared_ptr<T>& each) { return each.get() == object; });
}

/// A new list of the results of `call(element, arguments...)` for each element, in their order.
/// `call` may be a pointer to an operation of the elements' class; what it throws goes through.
template <class T, class Call, class... Args>
auto ov_arrayByApplyingSelector(const std::vector<std::shared_ptr<T>>& list, Call&& call,
                                const Args&... arguments) {
    using Result =
        std::decay_t<std::invoke_result_t<Call&, const std::shared_ptr<T>&, const Args&...>>;
    std::vector<Result> results;
    results.reserve(list.size());
    for (const std::shared_ptr<T>& each : list) {
        results.push_back(std::invoke(call, each, arguments...));
    }
    return results;
}

/// Replaces each element by the result of `call(element, arguments...)`. If `call` throws, the
/// elements before that one are replaced.
template <class T, class Call, class... Args>
void ov_applySelector(std::vector<std::shared_ptr<T>>& list, Call&& call,
                      const Args&... arguments) {
    for (std::shared_ptr<T>& each : list) {
        each = std::invoke(call, each, arguments...);
    }
}
