#include "sip/endpoint/SipFocus.h"

#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "media/codec/VoiceCodec.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyCause.h"
#include "properties/CC_PropertyCodecs.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyUnsigned.h"
#include "services/CC_ServiceBlindTransferStatus.h"
#include "services/CC_ServiceConferenceRefer.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/message/SipCause.h"
#include "sip/message/SipParty.h"
#include "sip/message/SipProperty.h"
#include "sip/message/SipPropertyId.h"

#include <spdlog/spdlog.h>

#include <new>
#include <tuple>
#include <utility>

using namespace SipProperty;

namespace
{
/// What is mixed must be spoken here: no party can bring a codec that is only relayed.
void ADD_CODECS(CC_PropertyContainer& own)
{
    VoipCodecListSet spoken;
    for (MG_Rtp::ECodec::Type const codec : {MG_Rtp::ECodec::PCMA, MG_Rtp::ECodec::PCMU, MG_Rtp::ECodec::G722,
                                             MG_Rtp::ECodec::OPUS, MG_Rtp::ECodec::L16_MONO})
        std::ignore = spoken.getList(VoipCodecListSet::SEND_RECEIVE).append(VoipCodec(codec, 20));
    ADD(own, CC_PropertyCodecs(CC_PropertyId::SUPPORTED_CODECS, spoken));
}
} // namespace

SipFocus::SipFocus(SipInterface& interface)
    : CC_Provider(interface.getName(), "conference")
    , CC_Endpoint(nullptr, nullptr)
    , m_interface(interface)
    , m_name(STRING(interface.getConfiguration().name + "/conference"))
    , m_timer(*CallControl::GET_CC_EVENT_LOOP(), EventPrio::NORMAL, ON_TIMER, this)
{
    std::ignore = CallControl::ADD_PROVIDER(interface.getEnvironment().host.contextName, m_name, *this);
}

SipFocus::~SipFocus()
{
    m_timer.stop();
    CallControl::REMOVE_PROVIDER(m_interface.getEnvironment().host.contextName, m_name);
}

InfoContainer& SipFocus::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                                 unsigned int detail, String const& prefix) const
{
    String text;
    text.format("%s, %u parties", m_name.c_str(), getNumberOfParties());
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Conference", text);
    return info;
}

SipFocus::Leg SipFocus::makeLeg()
{
    Leg leg = std::make_unique<CC_CallAdapterE164>();
    return leg->setup(m_name, *this, this).isOk() ? std::move(leg) : nullptr;
}

// --- who calls -------------------------------------------------------------------------------------------------------

XCode SipFocus::dial(CC_Call& call, String const&, String const& destination,
                     CC_PropertyContainer const& offerProperties)
{
    return offer(call, destination, offerProperties);
}

/// Who has offered the call still holds it: it is joined with the others in the loop's next turn.
XCode SipFocus::handleOffer(CC_Call& call, String const& name, CC_PropertyContainer const&)
try
{
    m_doors.reserve(m_doors.size() + 1);
    Leg leg = makeLeg();
    if (leg == nullptr)
        return XCode::FAILURE;
    SipParty const self = SipParty::OF_USER(TEXT_OF(name));
    if (XCode const accepted = leg->accept(call, STRING(self.number), self.type, self.plan, self.presentation,
                                           self.screening, String("Conference"));
        !accepted.isOk())
        return accepted;
    CC_PropertyContainer own;
    ADD_CODECS(own);
    ADD(own, CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, true));
    ADD(own, CC_PropertyCallLegState(CC_PropertyId::STATE, CC_PropertyCallLegState::CONNECTED));
    std::ignore = leg->setCallProperty(CC_PropertyBoolean(SipPropertyId::CONFERENCE, true));
    if (XCode const written = leg->setOwnProperties(own); !written.isOk())
        return written;
    m_doors.push_back(std::move(leg));
    m_timer.start(0);
    return XCode::OK;
}
catch (std::bad_alloc const&)
{
    return XCode::FAILURE;
}

void SipFocus::ON_TIMER(void* focus) { static_cast<SipFocus*>(focus)->takeIn(); }

void SipFocus::takeIn()
{
    if (m_room != nullptr && isEmpty() && m_called == nullptr)
    {
        m_room->drop(QCause::NORMAL_CALL_CLEARING, 0);
        m_room.reset();
    }
    for (Leg& door : std::exchange(m_doors, {}))
        if (m_room == nullptr)
            m_room = std::move(door);
        else
            door->drop(join(*door) ? QCause::NORMAL_CALL_CLEARING : QCause::NO_CIRCUIT_CHANNEL_AVAILABLE, 0);
}

/// The parties of that leg's call come in; the leg itself stays where it is.
bool SipFocus::join(CC_CallAdapterE164& from)
{
    bool const hasRoom = getNumberOfParties() < MOST_PARTIES;
    bool const isJoined = hasRoom && m_room->transfer(from, false).isOk();
    spdlog::info("conference {}: {}, {} parties", m_name.view(), isJoined ? "one more" : "there is no room",
                 getNumberOfParties());
    return isJoined;
}

/// The peer is the most active of the others.
bool SipFocus::isEmpty() const
{
    auto const* const state = CC_PropertyCallLegState::FROM(m_room->getPeerProperty(CC_PropertyId::STATE));
    return state == nullptr || state->getState() == CC_PropertyCallLegState::RELEASED;
}

/// Besides our own leg.
unsigned int SipFocus::getNumberOfParties() const
{
    CC_Call* const call = m_room != nullptr ? m_room->getCall() : nullptr;
    unsigned int parties = 0;
    while (call != nullptr && call->getOtherCallLeg(parties, *m_room->getOwnCallLeg()) != nullptr)
        ++parties;
    return parties;
}

void SipFocus::notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const&)
{
    if (&adapter == m_called.get())
        followCalled();
    else if (&adapter == m_room.get() && isEmpty())
        m_timer.start(0);
}

// --- who is called in ------------------------------------------------------------------------------------------------

void SipFocus::notifyPeerSynchronousService(CC_CallAdapter& adapter, CC_Service& service)
{
    if (&adapter == m_room.get() && service.isOfType(CC_ServiceConferenceRefer::TYPE()))
        callIn(static_cast<CC_ServiceConferenceRefer&>(service).getReferTo());
}

void SipFocus::callIn(String const& number)
try
{
    SipEnvironment& environment = m_interface.getEnvironment();
    SipConfiguration const& configuration = m_interface.getConfiguration();
    RouteHunt const routes = environment.host.findRoutes(configuration.name, TEXT_OF(number), configuration.conference,
                                                         environment.host.lastCallNumber + 1);
    if (routes.isEmpty() || environment.host.isEnding)
        return tell(QCause::NO_ROUTE_TO_DESTINATION);
    if (m_called != nullptr)
        return tell(QCause::TEMPORARY_FAILURE); // one after the other
    m_called = makeLeg();
    m_hasRung = false;
    SipParty const called = SipParty::OF_USER(routes.getNumber());
    SipParty const self = SipParty::OF_USER(configuration.conference);
    CC_PropertyContainer own;
    ADD_CODECS(own);
    CC_PropertyContainer call;
    ADD(call, CC_PropertyUnsigned(SipPropertyId::CALL_NUMBER, ++environment.host.lastCallNumber));
    if (m_called != nullptr &&
        m_called
            ->dial(environment.host.contextName, routes.getProvider().c_str(), STRING(called.getUser()),
                   STRING(self.number), self.type, self.plan, self.presentation, self.screening, String("Conference"),
                   STRING(called.number), called.type, called.plan, String(), true,
                   QInformationTransferCapability::SPEECH, nullptr, &own, nullptr, &call)
            .isOk())
        return;
    m_called.reset();
    tell(QCause::NETWORK_OUT_OF_ORDER);
}
catch (std::bad_alloc const&)
{
    m_called.reset();
}

void SipFocus::followCalled()
{
    auto const* const state = CC_PropertyCallLegState::FROM(m_called->getPeerProperty(CC_PropertyId::STATE));
    bool const wasThere = std::exchange(m_hasRung, state != nullptr);
    bool const isUp = state != nullptr && state->getState() >= CC_PropertyCallLegState::HELD;
    if (!isUp && (state != nullptr ? state->getState() != CC_PropertyCallLegState::RELEASED : !wasThere))
        return;
    QCause cause =
        isUp ? QCause::NONE : SipCause::FROM_PROPERTY(CC_PropertyCause::FROM(m_called->getPeerCauseProperty())).cause;
    if (isUp && (m_room == nullptr || !join(*m_called)))
        cause = QCause::NO_CIRCUIT_CHANNEL_AVAILABLE;
    Leg const called = std::move(m_called); // the adapter tells us, and goes on until it is dropped
    called->drop(QCause::NORMAL_CALL_CLEARING, 0);
    tell(cause);
    m_timer.start(0); // who has asked may have left meanwhile
}

/// Who has asked by REFER.
void SipFocus::tell(QCause cause)
{
    CC_ServiceBlindTransferStatus status(cause);
    if (m_room != nullptr)
        m_room->invokeSynchronousService(status);
}
