#include "diagnosis/CC_BriefText.h"

#include "properties/CC_PropertyBrief.h"
#include "properties/CC_PropertyClasses.h"
#include "properties/CC_PropertyTable.h"
#include "testing/FakeMediaContext.h"

#include <gtest/gtest.h>
#include <memory>
#include <string>

namespace
{
using CC_RecordFormat::Brief;

std::string RECORDED(unsigned int id, CC_Property const* property)
{
    CC_PropertyBrief const recorded(property);
    std::string_view octets = recorded.getOctets();
    Brief const brief = CC_BriefText::TAKE(octets);
    EXPECT_TRUE(octets.empty());
    return CC_BriefText::OF(id, brief);
}

std::string RECORDED(CC_Property const& property) { return RECORDED(property.getId(), &property); }

std::string PRINTED(CC_Property const& property)
{
    String text;
    return property.getValueString(text).c_str();
}

bool IS_TOO_LARGE(unsigned int id)
{
    return id == CC_PropertyId::CHARGE || id == CC_PropertyId::TARIFF || id == CC_PropertyId::QUALITY_OF_SERVICE;
}

class ModulesText : public CC_PropertyString
{
public:
    using CC_PropertyString::CC_PropertyString;
};
} // namespace

TEST(CC_BriefText, TheFirstValueOfEachIdPrintsAsThePropertyDoes)
{
    for (unsigned int i = 0; i < CC_PropertyTable::NUMBER_OF_IDS; ++i)
    {
        CC_PropertyTable::Row const& row = CC_PropertyTable::GET_ROW(i);
        std::unique_ptr<CC_Property> const property(row.create != nullptr ? row.create(row.id) : nullptr);
        if (property != nullptr && !IS_TOO_LARGE(row.id))
        {
            EXPECT_EQ(RECORDED(*property), PRINTED(*property)) << std::hex << row.id;
        }
    }
}

TEST(CC_BriefText, ValuesPrintAsThePropertyDoes)
{
    using namespace CC_PropertyId;
    TYPtr<MG_IContext> const media(new FakeMediaContext(0x1234));
    IpAddress address;
    ASSERT_EQ(address.setIpAddrAsString("2001:db8::1"), XCode::OK);
    IpAddress network;
    ASSERT_EQ(network.setIpAddrAsString("10.1.0.0/16"), XCode::OK);
    VoipCodecAndMode const held(VoipCodec(MG_Rtp::ECodec::OPUS, 20), VoipCodecAndMode::SEND_ONLY);
    std::unique_ptr<CC_Property> const properties[] = {
        std::make_unique<CC_PropertyString>(NAME, "Ada Lovelace, Countess, 32 octet"),
        std::make_unique<CC_PropertyUnsigned>(HOPS, 0xfedcba9876543210ULL),
        std::make_unique<CC_PropertyBoolean>(PROVIDES_DATA, true),
        std::make_unique<CC_PropertyCallLegState>(STATE, CC_PropertyCallLegState::RELEASED),
        std::make_unique<CC_PropertyCause>(CAUSE, QCause::USER_BUSY, 486),
        std::make_unique<CC_PropertyCause>(CAUSE, QCause::NONE, 480, "not today"),
        std::make_unique<CC_PropertyPresentationIndicator>(PRESENTATION_INDICATOR, QPresentationIndicator::RESTRICTED),
        std::make_unique<CC_PropertyCallProgressTone>(CALL_PROGRESS_TONE, MG_Tones::ECallProgressTone::BUSY, "b"),
        std::make_unique<CC_PropertyCodec>(CURRENT_CODEC, held),
        std::make_unique<CC_PropertyCodecNegotiating>(CODEC_NEGOTIATING, CC_PropertyCodecNegotiating::NEGOTIATED, 8U),
        std::make_unique<CC_PropertyIpAddress>(IP_ADDRESS, address),
        std::make_unique<CC_PropertyIpAddress>(IP_ADDRESS, network),
        std::make_unique<CC_PropertyContextId>(CONTEXT, media.get()),
        std::make_unique<CC_PropertyParametrizedString>(USER_TO_USER_INFORMATION, "00a1"),
    };
    for (auto const& property : properties)
        EXPECT_EQ(RECORDED(*property), PRINTED(*property)) << property->getPropertyName();
}

TEST(CC_BriefText, WhatIsTooLongEndsInAnEllipsis)
{
    std::string const longName(33, 'a');
    EXPECT_EQ(RECORDED(CC_PropertyString(CC_PropertyId::NAME, longName.c_str())), std::string(32, 'a') + "...");
    EXPECT_EQ(RECORDED(CC_PropertyString(CC_PropertyId::NAME, std::string(70000, 'a').c_str())),
              std::string(32, 'a') + "...");
}

TEST(CC_BriefText, TextsOfEveryLengthComeBackWhole)
{
    std::string text;
    for (unsigned int length = 0; length <= Brief::MOST_TEXT; ++length)
    {
        CC_PropertyString const property(CC_PropertyId::NAME, text.c_str());
        EXPECT_EQ(RECORDED(property), text);
        text += static_cast<char>('a' + length % 26);
    }
}

TEST(CC_BriefText, OfATextNothingIsRecordedThatWasInItsPlaceBefore)
{
    std::string text;
    for (unsigned int length = 0; length <= Brief::MOST_TEXT; ++length, text += 'x')
    {
        CC_PropertyString const fresh(CC_PropertyId::NAME, text.c_str());
        CC_PropertyString used(CC_PropertyId::NAME, "ABCDEFGHIJKLMNO");
        used.setValue(text.c_str());
        String shortened("ABCDEFGHIJKLMNO");
        shortened.deleteRegion(0, 15);
        shortened += text;
        CC_PropertyString const copied(CC_PropertyId::NAME, shortened);
        CC_PropertyBrief const expected(&fresh);
        EXPECT_EQ(CC_PropertyBrief(&used).getOctets(), expected.getOctets()) << length;
        EXPECT_EQ(CC_PropertyBrief(&copied).getOctets(), expected.getOctets()) << length;
    }
}

TEST(CC_BriefText, CodecsAreNamedInOrder)
{
    VoipCodecListSet codecs;
    for (auto const codec : {MG_Rtp::ECodec::OPUS, MG_Rtp::ECodec::PCMA})
        ASSERT_EQ(codecs.getList(VoipCodecListSet::SEND_RECEIVE).append(VoipCodec(codec, 20)), XCode::OK);
    EXPECT_EQ(RECORDED(CC_PropertyCodecs(CC_PropertyId::SUPPORTED_CODECS, codecs)), "opus PCMA");
}

TEST(CC_BriefText, OfRecordsAndOfAModulesValuesTheClassIsTold)
{
    EXPECT_EQ(RECORDED(CC_PropertyCharge(CC_PropertyId::CHARGE)),
              std::string("(") + CC_PropertyCharge::TYPE_NAME + ")");
    EXPECT_EQ(RECORDED(ModulesText(CC_PropertyId::NAME, "secret")), "((anonymous namespace)::ModulesText)");
    EXPECT_EQ(RECORDED(CC_PropertyId::NAME, nullptr), "(none)");
}

TEST(CC_BriefText, NumbersOfNoMeaningArePrintedAllTheSame)
{
    for (unsigned int place = 0; place < 256; ++place)
    {
        Brief brief;
        brief.place = static_cast<std::uint8_t>(place);
        brief.first = brief.second = ~0U;
        EXPECT_NE(CC_BriefText::OF(CC_PropertyId::STATE, brief), "!");
    }
}
