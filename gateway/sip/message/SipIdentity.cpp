#include "sip/message/SipIdentity.h"

#include "sip/message/SipAddress.h"
#include "sip/message/SipPrivacy.h"

namespace
{
QPresentationIndicator PRESENTATION_OF(SipParty const& party, sip_t const* message, bool isAnonymous)
{
    if (SipPrivacy::RESTRICTS_SENDER(message) || (isAnonymous && !SipPrivacy::IS_NONE(message)))
        return QPresentationIndicator::RESTRICTED;
    return party.number.empty() ? QPresentationIndicator::NOT_AVAILABLE : QPresentationIndicator::ALLOWED;
}

/// Without indicators but the screening.
std::optional<SipParty> READ_ASSERTED(sip_t const* message, bool isTrusted)
{
    std::optional<SipParty> asserted;
    if (!isTrusted)
        return asserted;
    for (SipNameAddr const& address : SipNameAddr::READ(message, "P-Asserted-Identity"))
    {
        SipParty party = SipParty::OF(address);
        bool const isBetter =
            !asserted || (party.type == QTypeOfNumber::INTERNATIONAL && asserted->type != QTypeOfNumber::INTERNATIONAL);
        if (party.number.empty() || !isBetter)
            continue;
        if (asserted && party.name.empty())
            party.name = asserted->name;
        party.screening = QScreeningIndicator::NETWORK_PROVIDED;
        asserted = party;
    }
    return asserted;
}

void NORMALISE(SipParty& party, DialPlan const& plan)
{
    if (party.type != QTypeOfNumber::UNKNOWN)
        return;
    SipParty const whole = SipParty::OF_USER(plan.normalise(party.number));
    if (whole.type != QTypeOfNumber::INTERNATIONAL)
        return;
    party.number = whole.number;
    party.type = whole.type;
    party.plan = whole.plan;
}

SipNameAddr ADDRESS_OF(sip_addr_t const& header) { return SipNameAddr::OF(header.a_display, *header.a_url, nullptr); }
} // namespace

SipIdentity SipIdentity::READ_CALLER(sip_t const* invite, bool isTrusted)
{
    SipNameAddr const from = ADDRESS_OF(*invite->sip_from);
    SipIdentity identity;
    identity.party = SipParty::OF(from);
    if (std::optional<SipParty> const asserted = READ_ASSERTED(invite, isTrusted))
    {
        identity.second = identity.party;
        identity.party = *asserted;
        if (identity.party.name.empty())
            identity.party.name = identity.second.name;
        if (identity.second.getUser() == identity.party.getUser())
            identity.second = {};
    }
    identity.party.presentation = PRESENTATION_OF(identity.party, invite, IS_ANONYMOUS(from));
    identity.second.presentation = identity.party.presentation;
    return identity;
}

void SipIdentity::normalise(DialPlan const& plan)
{
    if (plan.isEmpty())
        return;
    NORMALISE(party, plan);
    NORMALISE(second, plan);
}

SipParty SipIdentity::READ_CALLED(sip_t const* invite)
{
    SipParty called = SipParty::OF_URI(*invite->sip_request->rq_url);
    called.name = READ_NAME_OF_TO(invite);
    return called;
}

std::optional<SipParty> SipIdentity::READ_CONNECTED(sip_t const* response, bool isTrusted)
{
    std::optional<SipParty> connected = READ_ASSERTED(response, isTrusted);
    if (!connected)
        return connected;
    if (connected->name.empty())
        connected->name = READ_NAME_OF_TO(response);
    connected->presentation = PRESENTATION_OF(*connected, response, false);
    return connected;
}

std::string SipIdentity::READ_NAME_OF_TO(sip_t const* message)
{
    return message->sip_to != nullptr ? SipParty::OF(ADDRESS_OF(*message->sip_to)).name : std::string();
}

std::string SipIdentity::getFrom(SocketAddress const& own) const
{
    if (party.isRestricted())
        return SipAddress::MAKE_NAME_ADDR(ANONYMOUS_NAME, ANONYMOUS_URI);
    SipParty const& shown = second.number.empty() || second.isRestricted() ? party : second;
    return SipAddress::MAKE_NAME_ADDR(
        party.name, shown.number.empty() ? UNAVAILABLE_URI : SipAddress::MAKE_URI(shown.getUser(), own, SipWay::UDP));
}

std::string SipIdentity::GET_ASSERTED(SipParty const& party, SocketAddress const& own, bool isTrusted)
{
    std::string lines;
    if (party.isAsserted() && !party.number.empty() && (isTrusted || !party.isRestricted()))
        lines += "P-Asserted-Identity: " +
                 SipAddress::MAKE_NAME_ADDR(party.name, SipAddress::MAKE_URI(party.getUser(), own, SipWay::UDP)) +
                 "\r\n";
    if (party.isRestricted())
        lines += "Privacy: id\r\n";
    return lines;
}
