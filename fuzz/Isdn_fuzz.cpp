// Reads any octets as what comes from an ISDN line: the first message of a connection, the blocks of a B channel, and
// the elements that the stack hands on, in its structures. The first octet says which.
#include "isdn/element/IsdnBearer.h"
#include "isdn/element/IsdnCause.h"
#include "isdn/element/IsdnCharge.h"
#include "isdn/element/IsdnProgress.h"
#include "isdn/element/IsdnRedirection.h"
#include "isdn/element/IsdnText.h"
#include "isdn/element/IsdnUserUser.h"
#include "isdn/line/IsdnBlock.h"
#include "isdn/line/IsdnWires.h"
#include "properties/CC_PropertyContainer.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <span>
#include <string_view>
#include <sys/socket.h>
#include <tuple>

namespace
{
using Octets = std::span<unsigned char const>;

void EXPECT(bool isSo)
{
    if (!isSo)
        std::abort();
}

/// A structure of the stack's as if these octets were in it, and noughts behind them.
template <class Structure>
Structure FILL(Octets octets)
{
    Structure structure = {};
    std::memcpy(&structure, octets.data(), std::min(octets.size(), sizeof structure));
    return structure;
}

/// The stack ends its texts with a nought.
template <std::size_t SIZE>
void END(char (&text)[SIZE])
{
    text[SIZE - 1] = '\0';
}
void END(pri_party_id& id)
{
    END(id.number.str);
    END(id.name.str);
}

std::string_view TEXT_OF(Octets octets) { return {reinterpret_cast<char const*>(octets.data()), octets.size()}; }

/// Another peer's end of the line sends it, alone and with descriptors.
void READ_GREETING(Octets octets)
{
    int ends[2];
    EXPECT(socketpair(AF_UNIX, SOCK_SEQPACKET | SOCK_NONBLOCK, 0, ends) == 0);
    IsdnDescriptor const sender(ends[0]);
    IsdnDescriptor receiver(ends[1]);
    int const rights[] = {ends[0], ends[0], ends[0]};
    alignas(cmsghdr) char control[CMSG_SPACE(sizeof rights)] = {};
    iovec part = {const_cast<unsigned char*>(octets.data()), octets.size()};
    msghdr message = {};
    message.msg_iov = &part;
    message.msg_iovlen = 1;
    message.msg_control = control;
    message.msg_controllen = CMSG_SPACE(sizeof(int) * (octets.size() % 4));
    if (octets.size() % 4 != 0)
    {
        cmsghdr* const header = CMSG_FIRSTHDR(&message);
        header->cmsg_level = SOL_SOCKET;
        header->cmsg_type = SCM_RIGHTS;
        header->cmsg_len = CMSG_LEN(sizeof(int) * (octets.size() % 4));
        std::memcpy(CMSG_DATA(header), rights, sizeof(int) * (octets.size() % 4));
    }
    else
        message.msg_control = nullptr;
    sendmsg(sender.get(), &message, MSG_NOSIGNAL);
    bool isEarly = false;
    EXPECT(!IsdnWires::TAKE(receiver, isEarly).has_value()); // of a line there are 30
}

void READ_BLOCKS(Octets octets)
{
    int ends[2];
    EXPECT(socketpair(AF_UNIX, SOCK_SEQPACKET | SOCK_NONBLOCK, 0, ends) == 0);
    IsdnDescriptor const sender(ends[0]);
    IsdnDescriptor const receiver(ends[1]);
    std::size_t const length = octets.empty() ? 0 : octets.front() + 1u; // of each message
    unsigned int whole = 0;
    unsigned int got = 0;
    for (; length != 0 && !octets.empty(); octets = octets.subspan(std::min(length, octets.size())))
    {
        std::size_t const size = std::min(length, octets.size());
        bool const isSent = send(sender.get(), octets.data(), size, MSG_NOSIGNAL) == static_cast<ssize_t>(size);
        whole += isSent && size == IsdnBlock::LENGTH ? 1 : 0;
    }
    for (IsdnBlock block; block.receive(receiver.get()); ++got)
        std::ignore = block.send(receiver.get());
    EXPECT(got == whole);
}

void READ_PARTY(Octets octets)
{
    auto id = FILL<pri_party_id>(octets);
    END(id);
    IsdnParty const party = IsdnParty::OF(id);
    CC_PropertyContainer properties;
    party.addTo(properties);
    EXPECT(party.getDigits().size() <= IsdnParty::LONGEST_NUMBER);
    pri_party_id const again = party.getId();
    EXPECT(std::memchr(again.number.str, 0, sizeof again.number.str) != nullptr);
    EXPECT(std::memchr(again.name.str, 0, sizeof again.name.str) != nullptr);
    EXPECT(again.number.valid == 0 || (again.number.plan & ~0x7f) == 0);
    EXPECT((again.number.presentation & ~0x63) == 0);
    IsdnParty::OF_TEXT(party.getText());
    IsdnParty::OF_CALLED(id.number.str, id.number.plan);
}

void READ_REDIRECTION(Octets octets)
{
    auto redirecting = FILL<pri_party_redirecting>(octets);
    for (pri_party_id* const id : {&redirecting.from, &redirecting.to, &redirecting.orig_called})
        END(*id);
    IsdnRedirection const redirection = IsdnRedirection::OF(redirecting);
    EXPECT(redirection.count >= 0 && redirection.count <= IsdnRedirection::MOST);
    CC_PropertyContainer properties;
    redirection.addTo(properties);
    std::ignore = redirection.getRedirecting();
}

void READ_CHARGES(Octets octets)
{
    auto during = FILL<pri_subcmd_aoc_d>(octets);
    END(during.recorded.money.currency);
    auto const charge = IsdnCharge::OF_D(during);
    std::ignore = CC_PropertyCharge(CC_PropertyId::CHARGE, charge);
    auto const again = IsdnCharge::OF_D(IsdnCharge::TO_D(charge));
    EXPECT(IsdnCharge::IS_TOTAL(again) == IsdnCharge::IS_TOTAL(charge));
    auto final = FILL<pri_subcmd_aoc_e>(octets);
    END(final.recorded.money.currency);
    std::ignore = IsdnCharge::TO_E(IsdnCharge::OF_E(final));
}

void READ_TARIFF(Octets octets)
{
    auto advice = FILL<pri_subcmd_aoc_s>(octets);
    for (pri_aoc_s_element& element : advice.item)
    {
        END(element.rate.duration.currency);
        END(element.rate.flat.currency);
        END(element.rate.volume.currency);
    }
    auto const tariff = IsdnCharge::OF_S(advice);
    std::ignore = CC_PropertyTariff(CC_PropertyId::TARIFF, tariff);
    pri_subcmd_aoc_s const again = IsdnCharge::TO_S(tariff);
    EXPECT(again.num_items >= 0 && static_cast<std::size_t>(again.num_items) <= std::size(again.item));
}

void READ_TEXT(Octets octets)
{
    std::string_view const text = TEXT_OF(octets);
    std::string const shown = IsdnText::FROM_WIRE(text);
    EXPECT(std::none_of(shown.begin(), shown.end(), [](char c) { return c >= 0 && c < ' '; }));
    EXPECT(IsdnText::TO_WIRE(shown, IsdnParty::LONGEST_NAME).size() <= IsdnParty::LONGEST_NAME);
    std::string_view const untilNought = text.substr(0, text.find('\0'));
    std::string const back = IsdnUserUser::TO_WIRE(IsdnUserUser::FROM_WIRE(untilNought));
    bool const isIa5 = std::all_of(untilNought.begin(), untilNought.end(), [](char c) { return c > 0; });
    EXPECT(!isIa5 || back == untilNought.substr(0, IsdnUserUser::LONGEST));
    CC_PropertyParametrizedString::ParametrizedString const any{String(text)};
    EXPECT(IsdnUserUser::TO_WIRE(any).size() <= IsdnUserUser::LONGEST);
}

void READ_NUMBERS(Octets octets)
{
    int const value = FILL<int>(octets);
    int const cause = IsdnCause::TO_WIRE(IsdnCause::FROM_WIRE(value));
    EXPECT(cause >= 1 && cause <= 127);
    IsdnBearer const bearer = IsdnBearer::OF(value);
    EXPECT(bearer.isSpeech() == (bearer.getLayer1() >= 0));
    IsdnProgress::OF(value);
    IsdnRedirection::CODE_OF(IsdnRedirection::REASON_OF(value));
}

constexpr void (*READERS[])(Octets) = {READ_GREETING, READ_BLOCKS, READ_PARTY, READ_REDIRECTION,
                                       READ_CHARGES,  READ_TARIFF, READ_TEXT,  READ_NUMBERS};
} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* octets, std::size_t size)
{
    if (size == 0)
        return -1;
    READERS[octets[0] % std::size(READERS)](Octets(octets, size).subspan(1));
    return 0;
}
