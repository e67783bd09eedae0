#include "properties/CC_PropertyCallProgressTone.h"

#include "properties/CC_PropertyId.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>

namespace
{
using Tones = MG_Tones::ECallProgressTone;
}

TEST(CC_PropertyCallProgressTone, PrintsTheToneAlone)
{
    CC_PropertyCallProgressTone property(CC_PropertyId::CALL_PROGRESS_TONE, Tones::RINGING, "Fr");
    EXPECT_EQ("ringing tone", VALUE_OF(property));
    EXPECT_STREQ("Fr", property.getText().c_str());
    EXPECT_EQ(Tones::RINGING, property.getTone());
    EXPECT_EQ("Invalid value", REFUSAL_OF(property, "ringing tone"));
    EXPECT_EQ("no tone", VALUE_OF(CC_PropertyCallProgressTone(CC_PropertyId::CALL_PROGRESS_TONE)));
}

TEST(CC_PropertyCallProgressTone, TonesThatPrintTheSameDifferByTheirText)
{
    CC_PropertyCallProgressTone const plain(CC_PropertyId::CALL_PROGRESS_TONE, Tones::BUSY);
    CC_PropertyCallProgressTone withText(CC_PropertyId::CALL_PROGRESS_TONE, Tones::BUSY, "x");
    EXPECT_EQ(VALUE_OF(plain), VALUE_OF(withText));
    EXPECT_FALSE(plain.isEqual(withText));
    withText.setText("");
    EXPECT_TRUE(plain.isEqual(withText));
    withText.setTone(Tones::DIAL);
    EXPECT_FALSE(plain.isEqual(withText));
}
