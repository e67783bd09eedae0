// Reads any octets as what a SIP peer says: the headers from which properties are made, bodies, digits, charges and
// session descriptions; and what goes out of it to another peer is a header line each, and a description that reads
// back the same. The first octet says where they go.
#include "sip/dialog/SipDescription.h"
#include "sip/dialog/SipStream.h"
#include "sip/message/SipBody.h"
#include "sip/message/SipCause.h"
#include "sip/message/SipCharge.h"
#include "sip/message/SipDigits.h"
#include "sip/message/SipDiversion.h"
#include "sip/message/SipIdentity.h"
#include "sip/message/SipTariff.h"
#include "sip/message/SipText.h"
#include "sip/stack/Sofia.h"

#include <spdlog/spdlog.h>

#include <cstdint>
#include <cstdlib>
#include <optional>
#include <string>
#include <string_view>

namespace
{
SocketAddress const OWN{"192.0.2.1", 5060};

/// One value, which no peer may end in order to begin a line of its own.
void CHECK_VALUE(std::string const& value)
{
    for (char const c : value)
        if (SipText::IS_CONTROL(c))
            std::abort();
}

/// Whole lines, each of one of the headers that are ours.
void CHECK_LINES(std::string_view lines)
{
    while (!lines.empty())
    {
        std::size_t const end = lines.find("\r\n");
        if (end == std::string_view::npos)
            std::abort();
        std::string_view const line = lines.substr(0, end);
        bool isOurs = false;
        for (char const* const name : {"P-Asserted-Identity: ", "Privacy: ", "Diversion: ", "History-Info: "})
            isOurs = isOurs || line.starts_with(name);
        if (!isOurs)
            std::abort();
        CHECK_VALUE(std::string(line));
        lines.remove_prefix(end + 2);
    }
}

void READ_MESSAGE(std::string const& text)
{
    msg_t* const message = msg_make(sip_default_mclass(), 0, text.data(), static_cast<ssize_t>(text.size()));
    sip_t const* const sip = sip_object(message);
    // without these the stack hands nothing on
    if (sip != nullptr && sip->sip_request != nullptr && sip->sip_from != nullptr && sip->sip_to != nullptr)
    {
        SipIdentity const caller = SipIdentity::READ_CALLER(sip);
        CHECK_VALUE(caller.getFrom(OWN));
        CHECK_LINES(SipIdentity::GET_ASSERTED(caller.party, OWN));
        CHECK_LINES(SipIdentity::GET_ASSERTED(SipIdentity::READ_CALLED(sip), OWN));
        CHECK_LINES(SipDiversion::READ(sip).getHeaders(OWN, "sip:4989@192.0.2.2"));
        SipBody::READ(sip, true);
    }
    msg_destroy(message);
}

void READ_DESCRIPTION(std::string const& text)
{
    SipDescription::IS_HOLD(text);
    std::string const refusal = SipDescription::REFUSING(text);
    if (!refusal.empty() && !SipDescription::IS_READABLE(refusal))
        std::abort();
    std::optional<SipStream> const far = SipStream::READ(text);
    if (!far)
        return;
    SipStream ours = far->getReply();
    ours.rtp = MediaAddress::OF("192.0.2.1", 4000);
    ours.formats = far->formats;
    ours.events = far->events;
    std::optional<SipStream> const again = SipStream::READ(ours.write({7, 1}));
    if (!ours.formats.empty() && (!again || again->formats != ours.formats))
        std::abort();
    if (SipStream::AGREED(ours, *far).formats.getSize() > MediaFormats::MOST)
        std::abort();
}

void READ_REASON(std::string const& text)
{
    SipCause const cause = SipCause::FROM_REQUEST(text);
    CHECK_VALUE(cause.getReasonHeader(true));
    if (unsigned int const status = cause.getFinalStatus(); status < 400 || status > 699)
        std::abort();
}

void READ_INPUT(std::string const& text)
{
    for (char const* const type : {"application/dtmf-relay", "application/dtmf"})
        if (std::optional<SipDigits> const digits = SipDigits::READ(type, text);
            digits && digits->digits.find_first_not_of("0123456789*#ABCD!") != std::string::npos)
            std::abort();
}

void READ_BODY(std::string const& text)
{
    SipBody::READ(text, "multipart/mixed;boundary=b", {}, {}, true);
    std::size_t const end = text.find('\n');
    if (end != std::string::npos)
        SipBody::READ(std::string_view(text).substr(end + 1), std::string_view(text).substr(0, end), {}, {}, true);
}

void READ_CHARGE(std::string const& text)
{
    std::optional<SipCharge::Charge> const charge = SipCharge::READ(text);
    std::string const written = charge ? SipCharge::WRITE(*charge) : std::string();
    std::optional<SipCharge::Charge> const again = charge ? SipCharge::READ(written) : std::nullopt;
    if (charge && (!again || SipCharge::WRITE(*again) != written))
        std::abort();
    std::optional<SipTariff::Tariff> const tariff = SipTariff::READ(text);
    std::string const rates = tariff ? SipTariff::WRITE(*tariff) : std::string();
    std::optional<SipTariff::Tariff> const rated = tariff ? SipTariff::READ(rates) : std::nullopt;
    if (tariff && (!rated || SipTariff::WRITE(*rated) != rates))
        std::abort();
}
} // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***)
{
    spdlog::set_level(spdlog::level::off);
    su_init();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* octets, std::size_t size)
{
    if (size == 0)
        return -1;
    static constexpr void (*READERS[])(std::string const&) = {READ_MESSAGE, READ_DESCRIPTION, READ_REASON,
                                                              READ_INPUT,   READ_BODY,        READ_CHARGE};
    READERS[octets[0] % std::size(READERS)](std::string(octets + 1, octets + size));
    return 0;
}
