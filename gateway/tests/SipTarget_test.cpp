#include "sip/dialog/SipTarget.h"

#include "SipMessage.h"

#include <arpa/inet.h>
#include <gtest/gtest.h>

namespace
{
/// A message with an address that it came from.
class Received
{
public:
    Received(std::string const& headers, char const* host, unsigned short port)
    {
        std::string const text =
            "INVITE sip:4989@host SIP/2.0\r\nVia: SIP/2.0/UDP host;branch=z9hG4bK1\r\nCall-ID: 1\r\n"
            "CSeq: 1 INVITE\r\nTo: <sip:4989@host>\r\nFrom: <sip:4420@host>;tag=a\r\n" +
            headers + "\r\n";
        message.reset(msg_make(sip_default_mclass(), 0, text.data(), static_cast<ssize_t>(text.size())));
        su_sockaddr_t& address = *msg_addr(message.get());
        bool const isVersion6 = std::string_view(host).find(':') != std::string_view::npos;
        address.su_family = isVersion6 ? AF_INET6 : AF_INET;
        inet_pton(address.su_family, host, SU_ADDR(&address));
        address.su_port = htons(port);
    }
    std::string getTarget(bool isBehindNat = true) const
    {
        SipTarget const target(sip_object(message.get()), isBehindNat ? message.get() : nullptr);
        SipHome const home(su_home_create());
        return target.get() != nullptr ? url_as_string(home.get(), target.get()->m_url) : "none";
    }

    SipHeldMessage message;
};

char const* const CONTACT = "Contact: <sip:alice@10.0.0.2:5062;transport=udp;x=y>\r\n";
} // namespace

TEST(SipTarget, WhoIsBehindANatIsWhereHisMessagesComeFrom)
{
    EXPECT_EQ(Received(CONTACT, "203.0.113.9", 40000).getTarget(), "sip:alice@203.0.113.9:40000;transport=udp;x=y");
    EXPECT_EQ(Received(CONTACT, "2001:db8::9", 40000).getTarget(), "sip:alice@[2001:db8::9]:40000;transport=udp;x=y");
    EXPECT_EQ(Received("Contact: <sip:alice@10.0.0.2>\r\n", "203.0.113.9", 5060).getTarget(),
              "sip:alice@203.0.113.9:5060");
}

TEST(SipTarget, AnybodyElseIsWhereHeSays)
{
    EXPECT_EQ(Received(CONTACT, "203.0.113.9", 40000).getTarget(false), "sip:alice@10.0.0.2:5062;transport=udp;x=y");
}

TEST(SipTarget, AProxyOnTheWayKnowsBetter)
{
    EXPECT_EQ(
        Received(std::string("Record-Route: <sip:203.0.113.1;lr>\r\n") + CONTACT, "203.0.113.1", 5060).getTarget(),
        "sip:alice@10.0.0.2:5062;transport=udp;x=y");
}

TEST(SipTarget, AMessageWithoutAContactHasNone) { EXPECT_EQ(Received("", "203.0.113.9", 40000).getTarget(), "none"); }

TEST(SipTarget, ARegisteredContactIsCalledWhereItWasRegisteredFrom)
{
    Received const request(CONTACT, "203.0.113.9", 40000);
    EXPECT_EQ(SipTarget::AT_SOURCE(*sip_object(request.message.get())->sip_contact->m_url, request.message.get()),
              "sip:alice@203.0.113.9:40000;transport=udp;x=y");
}
