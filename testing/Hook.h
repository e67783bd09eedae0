#pragma once

#include "testing/FailingAllocator.h"

#include <functional>
#include <utility>

/// A function that a test puts into a fake, run inside the notification. It may do anything there, also replace itself
/// or destroy the fake. One that is empty does nothing and answers with a plain value (an XCode: OK).
///
///     observer.m_onPeerPropertyChange = [](CC_CallAdapter& adapter, CC_Flags const&) { adapter.cleanup(); };
template <class Signature>
class Hook;

/// The hook of that signature.
template <class Result, class... Arguments>
class Hook<Result(Arguments...)>
{
public:
    /// Any callable of the signature; null: none.
    template <class Function>
    Hook& operator=(Function&& function)
    {
        m_function = std::forward<Function>(function);
        return *this;
    }
    /// Whether there is a function.
    explicit operator bool() const { return static_cast<bool>(m_function); }

    /// Runs the function that is there now, also when it is replaced meanwhile; without one a plain value.
    Result operator()(Arguments... arguments) const
    {
        std::function<Result(Arguments...)> const running = copy();
        return running ? running(std::forward<Arguments>(arguments)...) : Result();
    }

private:
    std::function<Result(Arguments...)> copy() const
    {
        FailingAllocator::Pause const unseen;
        return m_function;
    }

    std::function<Result(Arguments...)> m_function;
};
