#pragma once

#include "platform/media/MG_ITerminationRepository.h"

/// A termination repository to be handed to call control, which keeps it and asks nothing of it. It is call control's
/// while it lives, and lives where the test puts it.
///
///     FakeTerminationRepository terminations;
///     EXPECT_EQ(CallControl::GET_MG_TERMINATION_REPOSITORY(), &terminations);
class FakeTerminationRepository : public MG_ITerminationRepository
{
public:
    FakeTerminationRepository();
    ~FakeTerminationRepository() override;
};
