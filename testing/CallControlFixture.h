#pragma once

#include "properties/CC_Factory.h"
#include "testing/DrivenLoop.h"
#include "testing/FakeMediaContextRepository.h"

class CC_CallPool;
class CC_Context;

/// Call control as an application sets it up, ready for calls: a driven loop, a media context repository, the built-in
/// property factory and the context "SWITCH". Its end takes everything back, so that every instance counter returns.
///
///     struct MyTest : testing::Test, CallControlFixture {};   // with GoogleTest
///     CallControlFixture callControl;                         // without
///
///     CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
///     ...
///     callControl.m_loop.settle();
///
/// Adapters, providers and endpoints of the test must be gone before it is; calls whose legs are gone are cleaned up.
class CallControlFixture
{
public:
    CallControlFixture();
    ~CallControlFixture();
    CallControlFixture(CallControlFixture const&) = delete;
    CallControlFixture& operator=(CallControlFixture const&) = delete;

    /// Null once the test has destroyed the context. @{
    CC_Context* getContext() const;
    CC_CallPool* getPool() const;
    /// @}

    /// As the loop's. @{
    bool turn() { return m_loop.turn(); }
    unsigned int settle() { return m_loop.settle(); }
    /// @}

    /// The parts, for what a test does with them itself. @{
    DrivenLoop m_loop;
    FakeMediaContextRepository m_mediaContexts;
    CC_Factory m_factory;
    /// @}
};
