#include "testing/RecordingProvider.h"

#include "calls/CC_Call.h"
#include "properties/CC_PropertyContainer.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyUnsigned.h"
#include "testing/CallControlFixture.h"
#include "testing/RecordingEndpoint.h"

#include "callcontrol/CallControl.h"

#include <gtest/gtest.h>

namespace
{
struct RecordingProviderTest : testing::Test, CallControlFixture
{
    RecordingProviderTest() : m_call(CallControl::ACQUIRE_CALL("SWITCH"))
    {
        EXPECT_TRUE(m_offer.set(CC_PropertyUnsigned(CC_PropertyId::HOPS, 3)).isOk());
    }
    ~RecordingProviderTest() override { CallControl::RELEASE_CALL("SWITCH", m_call); }

    CC_Call* m_call;
    CC_PropertyContainer m_offer;
};
} // namespace

TEST_F(RecordingProviderTest, RecordsWhatItIsAskedToCarry)
{
    RecordingProvider provider("isdn");
    EXPECT_EQ(provider.dial(*m_call, "port", "4989", m_offer), XCode::OK);
    EXPECT_EQ(provider.take(), Lines{"isdn: dial port 4989 (Hops)"});
    EXPECT_EQ(provider.getProviderType(), CC_Provider::USER_DEFINED_INTERFACE);
    EXPECT_EQ(RecordingProvider("s", nullptr, CC_Provider::INTERNAL_SERVICE).getProviderType(),
              CC_Provider::INTERNAL_SERVICE);
}

TEST_F(RecordingProviderTest, OffersToAnEndpointWhenTheTestSaysSo)
{
    Journal journal;
    RecordingProvider provider("isdn", &journal);
    RecordingEndpoint line("line", "pstn", &journal);
    provider.m_dial = [&](CC_Call& call, String const&, String const& destination,
                          CC_PropertyContainer const& properties) { return line.offer(call, destination, properties); };
    line.m_handleOffer = [&](CC_Call& call, String const&, CC_PropertyContainer const&)
    { return &call == m_call ? XCode::REFUSED : XCode::OK; };
    EXPECT_EQ(provider.dial(*m_call, "port", "4989", m_offer), XCode::REFUSED);
    EXPECT_EQ(journal.take(), (Lines{"isdn: dial port 4989 (Hops)", "line: offer 4989 (Hops)"}));
}

TEST_F(RecordingProviderTest, AnEndpointHasNameAndNetwork)
{
    RecordingEndpoint line("line", "pstn");
    EXPECT_EQ(line.getName(), "line");
    EXPECT_EQ(line.getNetwork(), "pstn");
    EXPECT_EQ(line.handleOffer(*m_call, "1", m_offer), XCode::OK);
    InfoContainer info;
    line.getInfo(info, 0, 0, 0, 0, "");
    RecordingProvider("isdn").getInfo(info, 0, 0, 0, 0, "");
    EXPECT_STREQ(info.getString_TreeFormat().c_str(), "Endpoint: line\nProvider: isdn\n");
}
