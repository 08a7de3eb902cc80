#pragma once

#include "Bridges/OVInternal.h"
#include "Bridges/ParameterException.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Logger.h"
#include "Foundation/PublicErrors.h"

#include <Orvane/OVError.h>
#include <Orvane/OVException.h>

#include <optional>
#include <string>
#include <type_traits>

/// What stands around every operation of the public interface: a pool, and one of the three ways in
/// which failures of the core become those that applications see. That a parameter is bad is always
/// thrown, as a `ParameterException`.

namespace Orvane {

/// The public form of the exception in flight. REQUIRES: called from a catch handler.
OVError currentError();

/// Throws `OVException` for a parameter that an operation cannot take. `text` tells which.
void requireParameter(bool condition, const char* function, const char* text);

/// For getters of values: reports a failure under `where` and throws `OVException`.
template <class Body>
auto raising(const char* where, Body&& body) -> std::invoke_result_t<Body> {
    try {
        const Foundation::AutoreleasePool pool;
        OVInternal::catchUp();
        return body();
    } catch (const OVException&) {
        throw;
    } catch (...) {
        Foundation::warnAndRaiseCurrentException(where);
    }
}

/// For what gives objects and lists: reports a failure under `where` and gives an empty result, and
/// the error unless `error` is null. A failure of an operation that it uses counts as its own.
template <class Body>
auto reporting(const char* where, Body&& body, std::optional<OVError>* error = nullptr)
    -> std::invoke_result_t<Body> {
    if (error) error->reset();
    try {
        const Foundation::AutoreleasePool pool;
        OVInternal::catchUp();
        return body();
    } catch (const ParameterException&) {
        throw;
    } catch (...) {
        if (error) *error = currentError();
        Foundation::warnAboutCurrentException(where);
    }
    return std::invoke_result_t<Body>();
}

/// For setters: throws `OVException` if the body fails or gives false. A failure is reported.
template <class Body>
void changing(const char* setter, Body&& body) {
    std::optional<OVError> error;
    try {
        const Foundation::AutoreleasePool pool;
        OVInternal::catchUp();
        if (body()) return;
    } catch (const OVException&) {
        throw;
    } catch (...) {
        error = currentError();
        Foundation::warnAboutCurrentException(setter);
    }
    const std::string text = OVFormat("Orvane: -%s failed", setter);
    if (!error) throw OVException(text);
    throw OVException(text, *error);
}

}  // namespace Orvane
