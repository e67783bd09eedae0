// The typed accessors that are not simply one value of one property.
#include "properties/CC_PropertyInformationTransferCapability.h"
#include "tests/support/TestAccessorE164.h"

namespace
{
using A = CC_CallAdapterE164;
using Negotiating = CC_PropertyCodecNegotiating;
using ParametrizedString = CC_PropertyParametrizedString::ParametrizedString;
using Wait = CC_PropertyWaitForMessage;
namespace Id = CC_PropertyId;

class CC_CallAdapterE164_OtherAccessors_Test : public AccessorLines
{
protected:
    CC_CallAdapterE164_OtherAccessors_Test() { EXPECT_EQ(a.dial(), XCode::OK); }
    A& own = *a.adapter;
    A const& other = *b.adapter;
};
} // namespace

TEST_F(CC_CallAdapterE164_OtherAccessors_Test, ReferencesToNothingLastForEver)
{
    A const idle;
    EXPECT_EQ(&idle.getPeerE164(), &String::s_empty);
    EXPECT_EQ(&idle.getPeerSupportedCodecs(), &VoipCodecListSet::EMPTY());
    EXPECT_EQ(&idle.getPeerCodec(), &VoipCodecAndMode::EMPTY());
}

TEST_F(CC_CallAdapterE164_OtherAccessors_Test, TheTransferCapabilityIsTheCalls)
{
    using Capability = CC_PropertyInformationTransferCapability;
    EXPECT_EQ(A().getInformationTransferCapability(), QInformationTransferCapability::SPEECH);
    EXPECT_EQ(own.getInformationTransferCapability(), QInformationTransferCapability::SPEECH);
    ASSERT_EQ(
        own.setOwnProperty(Capability(Id::INFORMATION_TRANSFER_CAPABILITY, QInformationTransferCapability::VIDEO)),
        XCode::OK);
    EXPECT_EQ(own.getInformationTransferCapability(), QInformationTransferCapability::SPEECH) << "not the leg's";
    ASSERT_EQ(own.setCallProperty(
                  Capability(Id::INFORMATION_TRANSFER_CAPABILITY, QInformationTransferCapability::AUDIO_3_1_KHZ)),
              XCode::OK);
    EXPECT_EQ(own.getInformationTransferCapability(), QInformationTransferCapability::AUDIO_3_1_KHZ);
    EXPECT_EQ(other.getInformationTransferCapability(), QInformationTransferCapability::AUDIO_3_1_KHZ);
}

TEST_F(CC_CallAdapterE164_OtherAccessors_Test, ATransferCapabilityOfAnotherClassReadsAsTheDefault)
{
    ASSERT_EQ(own.setCallProperty(CC_PropertyUnsigned(Id::INFORMATION_TRANSFER_CAPABILITY, 16)), XCode::OK);
    EXPECT_EQ(own.getInformationTransferCapability(), QInformationTransferCapability::SPEECH);
}

TEST_F(CC_CallAdapterE164_OtherAccessors_Test, TheCauseIsThePeersPropertyItself)
{
    EXPECT_EQ(A().getPeerCauseProperty(), nullptr);
    ASSERT_EQ(own.setOwnProperty(CC_PropertyCause(Id::CAUSE, QCause::USER_BUSY, 486)), XCode::OK);
    EXPECT_EQ(other.getPeerCauseProperty(), other.getPeerProperty(Id::CAUSE));
    auto const* const cause = dynamic_cast<CC_PropertyCause const*>(other.getPeerCauseProperty());
    ASSERT_NE(cause, nullptr);
    EXPECT_EQ(cause->getCause(), QCause::USER_BUSY);
}

TEST_F(CC_CallAdapterE164_OtherAccessors_Test, ACauseOfAnotherClassIsGivenAsItIs)
{
    ADD(m_filters,
        [](CC_PropertyContainer& properties)
        {
            properties.remove(Id::CAUSE);
            return properties.set(CC_PropertyUnsigned(Id::CAUSE, 17));
        });
    b.renew();
    filterOutputOfB();
    ASSERT_EQ(b.accept(*a.adapter->getCall()), XCode::OK);
    ASSERT_NE(b.adapter->getPeerCauseProperty(), nullptr);
    EXPECT_EQ(b.adapter->getPeerCauseProperty()->getTypeId(), CC_PropertyUnsigned::TYPE_ID());
}

TEST_F(CC_CallAdapterE164_OtherAccessors_Test, StateAndCodeOfTheNegotiationAreOneProperty)
{
    for (A const* const adapter : {&other, static_cast<A const*>(&own)})
    {
        EXPECT_EQ(adapter->getOwnCodecNegotiatingState(), Negotiating::NOT_CAPABLE);
        EXPECT_EQ(adapter->getPeerCodecNegotiatingState(), Negotiating::NOT_CAPABLE);
        EXPECT_EQ(adapter->getOwnCodecNegotiatingCode(), 0U);
        EXPECT_EQ(adapter->getPeerCodecNegotiatingCode(), 0U);
    }
    EXPECT_EQ(own.setOwnCodecNegotiatingState(Negotiating::NEGOTIATED, 96), XCode::OK);
    EXPECT_EQ(own.getOwnCodecNegotiatingState(), Negotiating::NEGOTIATED);
    EXPECT_EQ(own.getOwnCodecNegotiatingCode(), 96U);
    EXPECT_EQ(other.getPeerCodecNegotiatingState(), Negotiating::NEGOTIATED);
    EXPECT_EQ(other.getPeerCodecNegotiatingCode(), 96U);
    EXPECT_EQ(own.setOwnCodecNegotiatingState(Negotiating::REQUEST), XCode::OK);
    EXPECT_EQ(other.getPeerCodecNegotiatingState(), Negotiating::REQUEST);
    EXPECT_EQ(other.getPeerCodecNegotiatingCode(), 0U) << "the state alone has code 0";
    EXPECT_EQ(A().setOwnCodecNegotiatingState(Negotiating::IDLE), XCode::ABSENT);
}

TEST_F(CC_CallAdapterE164_OtherAccessors_Test, StateAndTypeOfTheMessageAwaitedAreOneProperty)
{
    for (A const* const adapter : {&other, static_cast<A const*>(&own)})
    {
        EXPECT_EQ(adapter->getOwnWaitForMessageState(), Wait::NOT_CAPABLE);
        EXPECT_EQ(adapter->getPeerWaitForMessageState(), Wait::NOT_CAPABLE);
        EXPECT_EQ(adapter->getOwnWaitForMessageType(), Wait::UNDEFINED);
        EXPECT_EQ(adapter->getPeerWaitForMessageType(), Wait::UNDEFINED);
    }
    EXPECT_EQ(own.setOwnWaitForMessageState(Wait::WAIT_FOR_MESSAGE, Wait::PRACK), XCode::OK);
    EXPECT_EQ(own.getOwnWaitForMessageState(), Wait::WAIT_FOR_MESSAGE);
    EXPECT_EQ(own.getOwnWaitForMessageType(), Wait::PRACK);
    EXPECT_EQ(other.getPeerWaitForMessageState(), Wait::WAIT_FOR_MESSAGE);
    EXPECT_EQ(other.getPeerWaitForMessageType(), Wait::PRACK);
    EXPECT_EQ(own.setOwnWaitForMessageState(Wait::MESSAGE_ARRIVED), XCode::OK);
    EXPECT_EQ(other.getPeerWaitForMessageState(), Wait::MESSAGE_ARRIVED);
    EXPECT_EQ(other.getPeerWaitForMessageType(), Wait::UNDEFINED) << "the state alone has type 0";
    EXPECT_EQ(A().setOwnWaitForMessageState(Wait::IDLE), XCode::ABSENT);
}

TEST_F(CC_CallAdapterE164_OtherAccessors_Test, AWrongClassReadsAsNoNegotiationNoMessageAndNoContent)
{
    for (unsigned int const id : {Id::CODEC_NEGOTIATING, Id::WAIT_FOR_MESSAGE, Id::USER_TO_USER_INFORMATION})
        ASSERT_EQ(own.setOwnProperty(CC_PropertyUnsigned(id, 3)), XCode::OK);
    EXPECT_EQ(own.getOwnCodecNegotiatingState(), Negotiating::NOT_CAPABLE);
    EXPECT_EQ(other.getPeerCodecNegotiatingState(), Negotiating::NOT_CAPABLE);
    EXPECT_EQ(other.getPeerCodecNegotiatingCode(), 0U);
    EXPECT_EQ(own.getOwnWaitForMessageState(), Wait::NOT_CAPABLE);
    EXPECT_EQ(other.getPeerWaitForMessageType(), Wait::UNDEFINED);
    EXPECT_EQ(own.getOwnUserToUser(), ParametrizedString::EMPTY());
    EXPECT_EQ(other.getPeerUserToUser(), ParametrizedString::EMPTY());
}

TEST_F(CC_CallAdapterE164_OtherAccessors_Test, TheirSettersPassThroughTheInputFilters)
{
    ADD(m_filters,
        [](CC_PropertyContainer& properties)
        {
            for (unsigned int const id : {Id::CODEC_NEGOTIATING, Id::WAIT_FOR_MESSAGE, Id::USER_TO_USER_INFORMATION})
                properties.remove(id);
            return XCode::OK;
        });
    filterInputOfA();
    EXPECT_EQ(own.setOwnCodecNegotiatingState(Negotiating::NEGOTIATED, 96), XCode::OK);
    EXPECT_EQ(own.setOwnCodecNegotiatingState(Negotiating::NEGOTIATED), XCode::OK);
    EXPECT_EQ(own.setOwnWaitForMessageState(Wait::IDLE, Wait::PRACK), XCode::OK);
    EXPECT_EQ(own.setOwnWaitForMessageState(Wait::IDLE), XCode::OK);
    EXPECT_EQ(own.setOwnUserToUser(ParametrizedString("00")), XCode::OK);
    EXPECT_EQ(a.leg(Id::CODEC_NEGOTIATING) + a.leg(Id::WAIT_FOR_MESSAGE) + a.leg(Id::USER_TO_USER_INFORMATION), "---");
}

TEST_F(CC_CallAdapterE164_OtherAccessors_Test, AMessageRepeatedToTheUserIsANewOne)
{
    auto const counter = [this]
    {
        auto const* const property =
            dynamic_cast<CC_PropertyParametrizedString const*>(other.getPeerProperty(Id::USER_TO_USER_INFORMATION));
        return property != nullptr ? property->getUpdateCounter() : 999;
    };
    EXPECT_EQ(own.getOwnUserToUser(), ParametrizedString::EMPTY());
    EXPECT_EQ(other.getPeerUserToUser(), ParametrizedString::EMPTY());
    ParametrizedString message("00a1");
    ASSERT_EQ(message.parameters.append({"encoding", "hex"}), XCode::OK);
    listen();
    EXPECT_EQ(own.setOwnUserToUser(message), XCode::OK);
    EXPECT_EQ(counter(), 0U);
    EXPECT_EQ(own.getOwnUserToUser(), message);
    EXPECT_EQ(other.getPeerUserToUser(), message);
    settle();
    EXPECT_EQ(b.module.take(), (Lines{"b: peer changed (User-to-User Information)"}));
    EXPECT_EQ(own.setOwnUserToUser(message), XCode::OK);
    EXPECT_EQ(counter(), 1U);
    settle();
    EXPECT_EQ(b.module.take(), (Lines{"b: peer changed (User-to-User Information)"})) << "though it reads the same";
    EXPECT_EQ(own.setOwnUserToUser(own.getOwnUserToUser()), XCode::OK);
    EXPECT_EQ(counter(), 2U);
    EXPECT_EQ(A().setOwnUserToUser(message), XCode::ABSENT);
}

TEST_F(CC_CallAdapterE164_OtherAccessors_Test, WithoutMemoryAMessageReadsAsEmptyAndIsNotSet)
{
    ParametrizedString const message("a message that is too long to be kept without memory");
    FailingAllocator::failNth(1);
    XCode const result = own.setOwnUserToUser(message);
    FailingAllocator::stop();
    EXPECT_EQ(result, XCode::FAILURE);
    EXPECT_EQ(a.own(Id::USER_TO_USER_INFORMATION), "-");
    ASSERT_EQ(own.setOwnUserToUser(message), XCode::OK);
    FailingAllocator::failNth(1);
    ParametrizedString const read = other.getPeerUserToUser();
    FailingAllocator::stop();
    EXPECT_TRUE(FailingAllocator::hasFailed());
    EXPECT_EQ(read, ParametrizedString::EMPTY());
    EXPECT_EQ(other.getPeerUserToUser(), message);
}
