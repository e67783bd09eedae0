#include "properties/CC_PropertyTable.h"

#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>
#include <iterator>
#include <memory>

namespace
{
struct Case
{
    unsigned int id;
    char const* longName;
    char const* shortName;
    char const* className; // null: not created
    char const* initialText;
};
// the ids and names are known outside this library: none of them may change
constexpr Case s_cases[] = {
    {0x400100, "Network", "network", "String", ""},
    {0x400101, "Call-Leg-ID", "call-leg-id", "Unsigned", "0x00000000"},
    {0x400200, "E164-Number", "e164", "String", ""},
    {0x400201, "Type-Of-Number", "type-of-number", "Type-Of-Number", "Unknown"},
    {0x400202, "Numbering-Plan", "numbering-plan", "Numbering-Plan", "Unknown"},
    {0x400203, "Presentation-Indicator", "pi", "Presentation-Indicator", "Presentation allowed"},
    {0x400204, "Screening-Indicator", "si", "Screening-Indicator", "User-provided, not screened"},
    {0x400205, "Diversion-Presentation-Indicator", "diversion-pi", "Presentation-Indicator", "Presentation allowed"},
    {0x400206, "Diversion-Screening-Indicator", "diversion-si", "Screening-Indicator", "User-provided, not screened"},
    {0x400207, "Second-E164-Number", "second-e164", "String", ""},
    {0x400208, "Second-Type-Of-Number", "second-type-of-number", "Type-Of-Number", "Unknown"},
    {0x400209, "Second-Numbering-Plan", "second-numbering-plan", "Numbering-Plan", "Unknown"},
    {0x40020a, "Second-Presentation-Indicator", "second-pi", "Presentation-Indicator", "Presentation allowed"},
    {0x40020b, "Second-Screening-Indicator", "second-si", "Screening-Indicator", "User-provided, not screened"},
    {0x40020c, "IP-Address", "ip", "IP-Address", "0.0.0.0"},
    {0x40020d, "Information-Transfer-Capability", "itc", "Information-Transfer-Capability", "Speech"},
    {0x40020e, "Precall-Service", "precall-service", "String", ""},
    {0x40020f, "URI", "uri", nullptr, nullptr},
    {0x400210, "Name", "name", "String", ""},
    {0x400211, "Hops", "hops", "Unsigned", "0x00000000"},
    {0x400212, "Redirecting-E164-Number", "redir-e164", "String", ""},
    {0x400213, "Redirecting-Name", "redir-name", "String", ""},
    {0x400214, "Redirecting-Reason", "redir-reason", "Redirecting-Reason", "Unknown"},
    {0x400215, "Unique Identifier", "unique-id", "Parametrized String", ""},
    {0x400216, "Endpoint-Is-Isdn", "is-isdn", "Boolean", "false"},
    {0x400217, "Redirecting-First-E164-Number", "redir-first-e164", "String", ""},
    {0x400218, "Redirecting-First-Name", "redir-first-name", "String", ""},
    {0x400219, "Redirecting-First-Reason", "redir-first-reason", "Redirecting-Reason", "Unknown"},
    {0x40021a, "Redirecting-Counter", "redir-counter", "Unsigned", "0x00000000"},
    {0x40021b, "Call-Type", "call-type", "CallType", "normal"},
    {0x40021c, "Message Waiting Indication", "mwi", "Boolean", "false"},
    {0x40021d, "Alert-Info", "alert-info", "String", ""},
    {0x40021e, "Connected Number Update", "colp-update", "Boolean", "false"},
    {0x40021f, "(unknown)", "(unknown)", "Unsigned", "0x00000000"},
    {0x400220, "(unknown)", "(unknown)", "Boolean", "false"},
    {0x400221, "(unknown)", "(unknown)", "String", ""},
    {0x400222, "(unknown)", "(unknown)", "String", ""},
    {0x400223, "(unknown)", "(unknown)", "String", ""},
    {0x400224, "(unknown)", "(unknown)", "Boolean", "false"},
    {0x400225, "X-Org-ConnID", "x-org-connid", "String", ""},
    {0x400226, "SIP Headers", "sip-headers", nullptr, nullptr},
    {0x400227, "User-to-User Information", "user-to-user", "Parametrized String", ""},
    {0x400228, "Replaces Information", "replaces", "Parametrized String", ""},
    {0x400229, "Display", "display", "String", ""},
    {0x40022a, "Supported Codecs", "supported-codecs", "Codecs", ""},
    {0x40022b, "Current Codec", "codec", "Codec", ""},
    {0x40022c, "Codec Negotiating", "codec-negotiating", "CodecNegotiating", "Not Capable"},
    {0x40022d, "Wait-for-Message", "wait-for-message", "WaitForMessage", "Not Capable"},
    {0x40022e, "Ready-for-Codec-Negotiation", "ready-negotiation", "Boolean", "false"},
    {0x400400, "Context", "context", "ContextId", "(none)"},
    {0x400401, "Provides Data", "data", "Boolean", "false"},
    {0x400402, "Call-Progress Tone", "call-progress-tone", "Call-Progress-Tone", "no tone"},
    {0x400801, "Supports Overlap-Receiving", "supports-overlap-receiving", "Boolean", "true"},
    {0x400802, "Supports Overlap-Sending", "supports-overlap-sending", "Boolean", "true"},
    {0x400803, "Allows Push-Back", "allows-push-back", "Boolean", "true"},
    {0x400804, "Tariff", "tariff", "Tariff", ""},
    {0x401000, "Charge", "charge", "Charge", ""},
    {0x401001, "Cause", "cause", "Cause", "No error"},
    {0x401002, "Quality-Of-Service", "qos", nullptr, nullptr},
    {0x401003, "State", "state", "Call-Leg-State", "RELEASED"},
};
} // namespace

TEST(CC_PropertyTable, EveryIdHasItsNamesClassAndInitialValue)
{
    ASSERT_EQ(std::size(s_cases), CC_PropertyTable::NUMBER_OF_IDS);
    for (unsigned int i = 0; i < std::size(s_cases); ++i)
    {
        Case const& expected = s_cases[i];
        SCOPED_TRACE(expected.longName);
        CC_PropertyTable::Row const& row = CC_PropertyTable::GET_ROW(i);
        ASSERT_EQ(expected.id, row.id);
        ASSERT_EQ(&row, CC_PropertyTable::FIND(expected.id));
        ASSERT_EQ(expected.className == nullptr, row.create == nullptr);
        if (row.create == nullptr)
        {
            EXPECT_STREQ(expected.longName, row.longName);
            EXPECT_STREQ(expected.shortName, row.shortName);
            continue;
        }
        std::unique_ptr<CC_Property> const property(row.create(row.id));
        ASSERT_NE(nullptr, property);
        EXPECT_EQ(expected.id, property->getId());
        EXPECT_STREQ(expected.longName, property->getPropertyName());
        EXPECT_STREQ(expected.shortName, property->getPropertyShortName());
        EXPECT_STREQ(expected.className, property->getTypeName());
        String text; // two of the classes append
        EXPECT_STREQ(expected.initialText, property->getValueString(text).c_str());
    }
}

TEST(CC_PropertyTable, AnIdBesideTheTableHasNoRow)
{
    for (unsigned int const id : {0U, 0x4000ffU, 0x400102U, 0x40022fU, 0x400800U, 0x401004U, 0xffffffffU})
        EXPECT_EQ(nullptr, CC_PropertyTable::FIND(id)) << std::hex << id;
}
