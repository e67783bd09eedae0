#include "operation/capture/HepPacket.h"

#include <netinet/in.h>

namespace
{
enum Chunk : unsigned int
{
    FAMILY = 1,
    TRANSPORT = 2,
    FROM_VERSION_4 = 3,
    TO_VERSION_4 = 4,
    FROM_VERSION_6 = 5,
    TO_VERSION_6 = 6,
    FROM_PORT = 7,
    TO_PORT = 8,
    SECONDS = 9,
    MICROSECONDS = 10,
    PROTOCOL = 11,
    AGENT = 12,
    PASSWORD = 14,
    PAYLOAD = 15,
    CORRELATION = 17
};
constexpr std::string_view BEGINNING_OF_PACKET = "HEP3";
constexpr std::size_t HEAD_LENGTH = 6; // of the packet, and of each chunk
constexpr unsigned int GENERIC = 0;    // the vendor of all these chunks
constexpr unsigned char VERSION_4 = 2;
constexpr unsigned char VERSION_6 = 10;

void ADD_NUMBER(std::string& octets, std::uint32_t value, unsigned int length)
{
    for (unsigned int i = length; i-- > 0;)
        octets += static_cast<char>(value >> (8 * i) & 0xff);
}

void ADD_HEAD(std::string& octets, Chunk chunk, std::size_t length)
{
    ADD_NUMBER(octets, GENERIC, 2);
    ADD_NUMBER(octets, chunk, 2);
    ADD_NUMBER(octets, static_cast<std::uint32_t>(HEAD_LENGTH + length), 2);
}

void ADD(std::string& octets, Chunk chunk, std::string_view value)
{
    ADD_HEAD(octets, chunk, value.size());
    octets += value;
}

void ADD(std::string& octets, Chunk chunk, std::uint32_t value, unsigned int length)
{
    ADD_HEAD(octets, chunk, length);
    ADD_NUMBER(octets, value, length);
}

std::string_view HOST_OF(sockaddr const& address)
{
    if (address.sa_family == AF_INET)
        return {reinterpret_cast<char const*>(&reinterpret_cast<sockaddr_in const&>(address).sin_addr),
                sizeof(in_addr)};
    return {reinterpret_cast<char const*>(&reinterpret_cast<sockaddr_in6 const&>(address).sin6_addr), sizeof(in6_addr)};
}

/// At the same place in both versions.
std::uint32_t PORT_OF(sockaddr const& address) { return ntohs(reinterpret_cast<sockaddr_in const&>(address).sin_port); }
} // namespace

void HepPacket::ENCODE(std::string& octets, CapturedMessage const& message, std::uint32_t agent,
                       std::string_view password)
{
    bool const isVersion4 = message.from.sa_family == AF_INET;
    auto const now = std::chrono::duration_cast<std::chrono::microseconds>(message.time.time_since_epoch()).count();
    octets = BEGINNING_OF_PACKET;
    octets.reserve(256 + password.size() + message.correlation.size() + message.payload.size());
    octets.append(2, '\0'); // the length
    ADD(octets, FAMILY, isVersion4 ? VERSION_4 : VERSION_6, 1);
    ADD(octets, TRANSPORT, message.transport, 1);
    ADD(octets, isVersion4 ? FROM_VERSION_4 : FROM_VERSION_6, HOST_OF(message.from));
    ADD(octets, isVersion4 ? TO_VERSION_4 : TO_VERSION_6, HOST_OF(message.to));
    ADD(octets, FROM_PORT, PORT_OF(message.from), 2);
    ADD(octets, TO_PORT, PORT_OF(message.to), 2);
    ADD(octets, SECONDS, static_cast<std::uint32_t>(now / 1000000), 4);
    ADD(octets, MICROSECONDS, static_cast<std::uint32_t>(now % 1000000), 4);
    ADD(octets, PROTOCOL, message.protocol, 1);
    ADD(octets, AGENT, agent, 4);
    if (!password.empty())
        ADD(octets, PASSWORD, password);
    if (!message.correlation.empty())
        ADD(octets, CORRELATION, message.correlation);
    if (octets.size() + HEAD_LENGTH + message.payload.size() > LONGEST)
    {
        octets.clear();
        return;
    }
    ADD(octets, PAYLOAD, message.payload);
    std::string length;
    ADD_NUMBER(length, static_cast<std::uint32_t>(octets.size()), 2);
    octets.replace(BEGINNING_OF_PACKET.size(), length.size(), length);
}
