#include "properties/CC_PropertyRedirectingReason.h"

#include "platform/base/NameOf.h"
#include "properties/CC_PropertyId.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>

TEST(CC_PropertyRedirectingReason, PrintsTheNameOfItsValue)
{
    EXPECT_EQ("Unspecified", VALUE_OF(CC_PropertyRedirectingReason(CC_PropertyId::REDIRECTING_REASON,
                                                                   QReasonForRedirection::UNSPECIFIED)));
    EXPECT_EQ("Unknown", VALUE_OF(CC_PropertyRedirectingReason(CC_PropertyId::REDIRECTING_REASON,
                                                               QReasonForRedirection::UNKNOWN)));
    EXPECT_EQ("Call forwarding no reply",
              VALUE_OF(CC_PropertyRedirectingReason(CC_PropertyId::REDIRECTING_REASON,
                                                    QReasonForRedirection::FORWARDING_NO_REPLY)));
    CC_PropertyRedirectingReason const invalid(CC_PropertyId::REDIRECTING_REASON,
                                               static_cast<QReasonForRedirection>(3));
    EXPECT_EQ(ERROR::INVALID, VALUE_OF(invalid));
    EXPECT_STREQ("Redirecting-Reason", invalid.getTypeName());
}

TEST(CC_PropertyRedirectingReason, BeginsWithZeroAndComparesItsValue)
{
    CC_PropertyRedirectingReason property(CC_PropertyId::REDIRECTING_REASON);
    EXPECT_EQ(static_cast<QReasonForRedirection>(0), property.getValue());
    CC_PropertyRedirectingReason const other(CC_PropertyId::REDIRECTING_REASON,
                                             QReasonForRedirection::FORWARDING_NO_REPLY);
    EXPECT_FALSE(property.isEqual(other));
    property.setValue(QReasonForRedirection::FORWARDING_NO_REPLY);
    EXPECT_TRUE(property.isEqual(other));
}

TEST(CC_PropertyRedirectingReason, TakesNoText)
{
    CC_PropertyRedirectingReason property(CC_PropertyId::REDIRECTING_REASON,
                                          QReasonForRedirection::FORWARDING_NO_REPLY);
    EXPECT_EQ("Invalid value", REFUSAL_OF(property, "Unspecified"));
}
