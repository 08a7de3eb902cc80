#pragma once

#include "Foundation/ArrayOf.h"
#include "Foundation/Ref.h"

#include <algorithm>
#include <functional>
#include <type_traits>
#include <utility>

namespace Orvane {

/// The class of the objects that a call gives, be it as `T*`, `Ref<T>` or `Returner<T>`.
template <class Result>
struct ObjectOf;
template <class T>
struct ObjectOf<T*> {
    using type = T;
};
template <class T>
struct ObjectOf<Foundation::Ref<T>> {
    using type = T;
};
template <class T>
struct ObjectOf<Foundation::Returner<T>> {
    using type = T;
};
template <class Call, class... Args>
using ResultOf = typename ObjectOf<std::decay_t<std::invoke_result_t<Call, Args...>>>::type;

/// Whether a list holds this very object. A null list holds nothing.
template <class T>
bool ov_containsObjectIdenticalTo(const Foundation::ArrayOf<T>* list, const T* object) {
    return list && std::find(list->begin(), list->end(), object) != list->end();
}

/// The results of `call(element, arguments...)` for each element, in a new list. Null for null.
template <class T, class Call, class... Args>
auto ov_arrayByApplyingSelector(const Foundation::ArrayOf<T>* list, Call call, const Args&... args)
    -> Foundation::Returner<Foundation::ArrayOf<ResultOf<Call, T*, const Args&...>>> {
    using Result = ResultOf<Call, T*, const Args&...>;
    if (!list) return nullptr;
    Foundation::Ref<Foundation::MutableArrayOf<Result>> results =
        Foundation::MutableArrayOf<Result>::array();
    for (T* element : *list) {
        const Foundation::Ref<Result> result = std::invoke(call, element, args...);
        results->add(result);
    }
    return Foundation::Returner<Foundation::MutableArrayOf<Result>>(std::move(results));
}

/// Replaces each element by the result of `call(element, arguments...)`. Null is an empty list.
template <class T, class Call, class... Args>
void ov_applySelector(Foundation::MutableArrayOf<T>* list, Call call, const Args&... args) {
    const std::size_t count = list ? list->count() : 0;
    for (std::size_t i = 0; i < count; ++i) {
        const Foundation::Ref<T> result = std::invoke(call, list->at(i), args...);
        list->set(i, result);
    }
}

}  // namespace Orvane
