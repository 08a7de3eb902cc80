#pragma once

#include "Agent/RPC/AgentService.h"
#include "Agent/RPC/ArgumentTypes.h"
#include "Foundation/NetError.h"

#include <array>
#include <cstdint>
#include <string>
#include <tuple>

namespace Orvane::RPC {

/// An argument or result of a routine, as others see it.
struct Parameter {
    const char* name = nullptr;
    const char* type = nullptr;  ///< of `ArgumentTypes.h`
    const char* form = nullptr;  ///< in a message
};

/// What the agent does for its clients, under a number and a name that never change: a method of
/// the object that it has on the user's bus. A reply begins with a status of 32 bits, 0 for
/// success, and has all its results whatever that is.
struct Routine {
    static constexpr std::size_t kMostParameters = 7;
    using Parameters = std::array<Parameter, kMostParameters>;  ///< up to one without a name

    int number;
    const char* name;
    Parameters arguments;
    Parameters results;

    /// The form of a request.
    std::string getSignature() const;
};

template <class... T>
struct Arguments {
    using Names = std::array<const char*, sizeof...(T)>;
    using Values = std::tuple<typename T::Value...>;

    static constexpr Routine::Parameters parameters(const Names& names) {
        Routine::Parameters list;
        [[maybe_unused]] std::size_t i = 0;
        ((list[i] = {names[i], T::kName, T::kForm}, ++i), ...);
        return list;
    }
    static bool read(Foundation::BusMessage& message, Values& values) {
        return std::apply([&](auto&... value) { return (T::read(message, value) && ...); }, values);
    }
    static void append(Foundation::BusMessage& message, const Values& values) {
        std::apply([&](const auto&... value) { (T::append(message, value), ...); }, values);
    }
    /// The first fault of an argument.
    static Fault check(const Values& values) {
        Fault found = Fault::None;
        const auto look = [&](Fault fault) {
            if (found == Fault::None) found = fault;
        };
        std::apply([&](const auto&... value) { (look(T::check(value)), ...); }, values);
        return found;
    }
};
template <class... T>
using Results = Arguments<T...>;

template <class A, class R>
class RoutineOf;

/// A routine with the types of its parameters. Called, it is the client's stub: it sends the
/// request to a port, waits for the reply and gives the status, and fills in the results if that
/// is 0.
template <class... A, class... R>
class RoutineOf<Arguments<A...>, Results<R...>> : public Routine {
 public:
    using ArgumentList = Arguments<A...>;
    using ResultList = Results<R...>;
    /// What does it in the agent.
    using Implementation = void (*)(typename A::In..., typename R::Value&...);

    constexpr RoutineOf(int routineNumber, const char* routineName,
                        const typename ArgumentList::Names& argumentNames,
                        const typename ResultList::Names& resultNames = {})
        : Routine{routineNumber, routineName, ArgumentList::parameters(argumentNames),
                  ResultList::parameters(resultNames)} {}

    std::int32_t operator()(std::uint32_t port, typename A::In... values,
                            typename R::Value&... given) const {
        AgentService& service = AgentService::instance();
        Foundation::BusMessage request = service.newRequest(port, name);
        (A::append(request, values), ...);
        Foundation::BusMessage reply;
        std::int32_t status = service.send(port, request, reply);
        if (status != 0) return status;
        if (!reply.read(status)) return Foundation::MachError::kBadReply;
        if (status != 0 || (R::read(reply, given) && ...)) return status;
        return Foundation::MachError::kBadReply;
    }
};

}  // namespace Orvane::RPC
