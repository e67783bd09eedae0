#pragma once

#include "platform/media/MG_IContextRepository.h"
#include "testing/Hook.h"

/// Makes FakeMediaContexts, with the ids 1, 2, 3 and so on, and counts how often it is asked. It is call control's
/// repository while it lives, and lives where the test puts it (no counted pointer deletes it).
///
///     FakeMediaContextRepository mediaContexts;
///     mediaContexts.setFailing(true);
///     CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH"); // its Context property holds none
///     EXPECT_EQ(mediaContexts.getNumberOfRequests(), 1u);
class FakeMediaContextRepository : public MG_IContextRepository
{
public:
    FakeMediaContextRepository();
    ~FakeMediaContextRepository() override;

    /// OK with a new context; FAILURE, and nothing made, while it is failing.
    XCode createContext(TYPtr<MG_IContext>& context) override;

    /// From the next answer on.
    void setFailing(bool isFailing) { m_isFailing = isFailing; }
    /// So far, failed ones and the one under way included.
    unsigned int getNumberOfRequests() const { return m_requests; }

    /// Runs inside each request, before it is answered.
    Hook<void()> m_onRequest;

private:
    bool m_isFailing = false;
    unsigned int m_requests = 0;
    unsigned int m_lastId = 0;
};
