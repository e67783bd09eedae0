#include "properties/CC_PropertyInformationTransferCapability.h"

#include "platform/base/NameOf.h"
#include "properties/CC_PropertyId.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>

TEST(CC_PropertyInformationTransferCapability, PrintsTheNameOfItsValue)
{
    EXPECT_EQ("Speech", VALUE_OF(CC_PropertyInformationTransferCapability(
                            CC_PropertyId::INFORMATION_TRANSFER_CAPABILITY, QInformationTransferCapability::SPEECH)));
    EXPECT_EQ("3.1 kHz audio",
              VALUE_OF(CC_PropertyInformationTransferCapability(CC_PropertyId::INFORMATION_TRANSFER_CAPABILITY,
                                                                QInformationTransferCapability::AUDIO_3_1_KHZ)));
    CC_PropertyInformationTransferCapability const invalid(CC_PropertyId::INFORMATION_TRANSFER_CAPABILITY,
                                                           static_cast<QInformationTransferCapability>(1));
    EXPECT_EQ(ERROR::INVALID, VALUE_OF(invalid));
    EXPECT_STREQ("Information-Transfer-Capability", invalid.getTypeName());
}

TEST(CC_PropertyInformationTransferCapability, BeginsWithZeroAndComparesItsValue)
{
    CC_PropertyInformationTransferCapability property(CC_PropertyId::INFORMATION_TRANSFER_CAPABILITY);
    EXPECT_EQ(static_cast<QInformationTransferCapability>(0), property.getValue());
    CC_PropertyInformationTransferCapability const other(CC_PropertyId::INFORMATION_TRANSFER_CAPABILITY,
                                                         QInformationTransferCapability::AUDIO_3_1_KHZ);
    EXPECT_FALSE(property.isEqual(other));
    property.setValue(QInformationTransferCapability::AUDIO_3_1_KHZ);
    EXPECT_TRUE(property.isEqual(other));
}

TEST(CC_PropertyInformationTransferCapability, TakesNoText)
{
    CC_PropertyInformationTransferCapability property(CC_PropertyId::INFORMATION_TRANSFER_CAPABILITY,
                                                      QInformationTransferCapability::AUDIO_3_1_KHZ);
    EXPECT_EQ("Invalid value", REFUSAL_OF(property, "Speech"));
}
