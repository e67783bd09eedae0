// Header lines of one peer that the other one gets, as properties of our side's leg.
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "sip/endpoint/SipEndpoint.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/message/SipBody.h"
#include "sip/message/SipProperty.h"
#include "sip/message/SipPropertyId.h"
#include "sip/message/SipUserToUser.h"

#include <optional>
#include <tuple>
#include <utility>

namespace
{
SipCarriedHeaders::Rules CARRYING_RULES_OF(SipInterface const& interface)
{
    return {interface.getConfiguration().headers, interface.getConfiguration().isTrusted};
}
} // namespace

/// What was in an earlier message and is not in this one is taken back: it was that message's.
void SipEndpoint::addCarried(CC_PropertyContainer& own, sip_t const* message)
{
    std::string lines = SipCarriedHeaders::READ(message, CARRYING_RULES_OF(m_interface));
    if (lines != m_carried)
    {
        SipProperty::ADD_TEXT(own, SipPropertyId::CARRIED_HEADERS, lines);
        m_carried = std::move(lines);
    }
    addUserToUser(own, message);
    addIsup(own, message);
}

void SipEndpoint::addIsup(CC_PropertyContainer& own, sip_t const* message)
{
    if (!m_interface.getConfiguration().carriesIsup)
        return;
    if (SipIsup const isup = SipBody::READ(message, true).isup; !isup.isEmpty())
    {
        CC_PropertyParametrizedString::ParametrizedString const content(SipProperty::STRING(isup.getText()));
        CC_PropertyParametrizedString property(SipPropertyId::ISUP);
        property.setContent(m_isups++, content); // the same once more is news
        SipProperty::ADD(own, property);
    }
}

/// What came last from the other side, where our peer is to have it.
SipIsup SipEndpoint::getIsup()
{
    auto const* const property = m_interface.getConfiguration().carriesIsup
                                     ? getPeer<CC_PropertyParametrizedString>(SipPropertyId::ISUP)
                                     : nullptr;
    if (property == nullptr)
        return {};
    m_isupTold = property->getUpdateCounter();
    return SipIsup::OF_TEXT(property->getContent().content.view());
}

/// The same, once.
SipIsup SipEndpoint::getNewIsup()
{
    auto const* const property = getPeer<CC_PropertyParametrizedString>(SipPropertyId::ISUP);
    return property != nullptr && m_isupTold != property->getUpdateCounter() ? getIsup() : SipIsup{};
}

void SipEndpoint::addUserToUser(CC_PropertyContainer& own, sip_t const* message)
{
    if (std::optional const content = SipUserToUser::READ(message))
    {
        CC_PropertyParametrizedString property(CC_PropertyId::USER_TO_USER_INFORMATION);
        property.setContent(m_userToUsers++, *content); // the same once more is news
        SipProperty::ADD(own, property);
    }
}

/// For a message that ends the call.
void SipEndpoint::takeCarried(sip_t const* message)
{
    CC_PropertyContainer own;
    if (message->sip_request != nullptr)
    {
        addUserToUser(own, message);
        addIsup(own, message);
    }
    else
        addCarried(own, message);
    if (m_isInCall && !own.isEmpty())
        std::ignore = writeOwn(own); // what memory refuses the other side does not hear
}

/// The lines for a message to our peer.
std::string SipEndpoint::getCarried(SipCarriedHeaders::Message message)
{
    auto const* const property = getPeer<CC_PropertyString>(SipPropertyId::CARRIED_HEADERS);
    std::string told = getUserToUser();
    if (property == nullptr || property->getValue().isEmpty())
        return told;
    bool const isRestricted = SipParty::OF_PEER(m_adapter).isRestricted();
    return told + SipCarriedHeaders::FOR_PEER(property->getValue().view(), CARRYING_RULES_OF(m_interface), message,
                                              isRestricted);
}

/// A text of the user's may say who he is.
std::string SipEndpoint::getUserToUser()
{
    auto const* const property = getPeer<CC_PropertyParametrizedString>(CC_PropertyId::USER_TO_USER_INFORMATION);
    bool const isTold = property != nullptr &&
                        (m_interface.getConfiguration().isTrusted || !SipParty::OF_PEER(m_adapter).isRestricted());
    if (!isTold)
        return {};
    m_userToUserTold = property->getUpdateCounter();
    return SipUserToUser::GET_LINE(property->getContent());
}

/// What has come since: a BYE repeats nothing.
std::string SipEndpoint::getLastUserToUser()
{
    auto const* const property = getPeer<CC_PropertyParametrizedString>(CC_PropertyId::USER_TO_USER_INFORMATION);
    if (property == nullptr || m_userToUserTold == property->getUpdateCounter())
        return {};
    return getUserToUser();
}
