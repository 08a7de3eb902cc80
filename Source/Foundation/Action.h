#pragma once

#include "Foundation/Uncopyable.h"

#include <memory>
#include <utility>

namespace Orvane {

/// A callback with one target, the way all parts of the system call back.
class Action : Foundation::Uncopyable {
 public:
    class Receiver {
     public:
        virtual void operator()(void* sender) = 0;
        virtual ~Receiver() = default;
    };

    /// Replaces, and destroys, the receiver. May be null.
    void setReceiver(std::unique_ptr<Receiver> receiver) { mReceiver = std::move(receiver); }

    /// Calls the receiver, if there is one, inside a pool of its own. Whatever it throws is
    /// reported and stops here.
    void invoke(void* sender) noexcept;

 private:
    std::unique_ptr<Receiver> mReceiver;
};

/// An action whose sender is a T.
template <class T>
class ActionOf : public Action {
 public:
    class ReceiverOf : public Action::Receiver {};

    using Action::setReceiver;
    template <class Context>
    void setReceiver(void (*function)(T*, Context), Context context);

    void invoke(T* sender) noexcept { Action::invoke(sender); }
};

/// Calls a method of an object, which it does not own.
template <class Sender, class Target>
class MethodReceiver : public ActionOf<Sender>::ReceiverOf {
 public:
    using Method = void (Target::*)(Sender*);

    MethodReceiver(Target* target, Method method) : mTarget(target), mMethod(method) {}

    void operator()(void* sender) override { (mTarget->*mMethod)(static_cast<Sender*>(sender)); }

 private:
    Target* mTarget;
    Method mMethod;
};

/// Calls a function with a context, which it holds by value; each call passes a copy.
template <class Sender, class Context>
class FunctionReceiver : public ActionOf<Sender>::ReceiverOf {
 public:
    using Function = void (*)(Sender*, Context);

    FunctionReceiver(Function function, Context context)
        : mFunction(function), mContext(std::move(context)) {}

    void operator()(void* sender) override { mFunction(static_cast<Sender*>(sender), mContext); }

 private:
    Function mFunction;
    Context mContext;
};

template <class Sender, class Context>
std::unique_ptr<FunctionReceiver<Sender, Context>> receiver(void (*function)(Sender*, Context),
                                                            Context context) {
    return std::make_unique<FunctionReceiver<Sender, Context>>(function, std::move(context));
}

template <class Sender, class Target>
std::unique_ptr<MethodReceiver<Sender, Target>> receiver(Target* target,
                                                         void (Target::*method)(Sender*)) {
    return std::make_unique<MethodReceiver<Sender, Target>>(target, method);
}

template <class T>
template <class Context>
void ActionOf<T>::setReceiver(void (*function)(T*, Context), Context context) {
    setReceiver(receiver(function, std::move(context)));
}

}  // namespace Orvane
