#include "services/CC_ServiceBlindTransferStatus.h"

#include "tests/support/ServiceTesting.h"

#include <gtest/gtest.h>

TEST(CC_ServiceBlindTransferStatus, PrintsTheCausesName)
{
    CC_ServiceBlindTransferStatus const service(QCause::NO_ANSWER_FROM_USER);
    EXPECT_EQ("Blind transfer status (Cause: No answer from user (user alerted))", LINE_OF(service));
    EXPECT_EQ("own Blind transfer status\n  Cause: No answer from user (user alerted)\n", DUMP(service, 1, "own "));
    EXPECT_EQ("Blind transfer status\n", DUMP(service, 0));
    EXPECT_EQ(QCause::NO_ANSWER_FROM_USER, service.getCause());
    EXPECT_LIMITS_KEPT(service);
    EXPECT_NO_THROW_WITHOUT_MEMORY(service);
}
