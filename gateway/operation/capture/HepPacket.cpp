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

/// Writes into room that suffices.
class Writer
{
public:
    explicit Writer(char* place) : m_place(place) {}

    void addNumber(std::uint32_t value, unsigned int length)
    {
        for (unsigned int i = length; i-- > 0;)
            *m_place++ = static_cast<char>(value >> (8 * i) & 0xff);
    }
    void add(std::string_view text)
    {
        text.copy(m_place, text.size());
        m_place += text.size();
    }
    void add(Chunk chunk, std::string_view value)
    {
        addHead(chunk, value.size());
        add(value);
    }
    void add(Chunk chunk, std::uint32_t value, unsigned int length)
    {
        addHead(chunk, length);
        addNumber(value, length);
    }

private:
    void addHead(Chunk chunk, std::size_t length)
    {
        addNumber(GENERIC, 2);
        addNumber(chunk, 2);
        addNumber(static_cast<std::uint32_t>(HEAD_LENGTH + length), 2);
    }

    char* m_place;
};

std::string_view HOST_OF(sockaddr const& address)
{
    if (address.sa_family == AF_INET)
        return {reinterpret_cast<char const*>(&reinterpret_cast<sockaddr_in const&>(address).sin_addr),
                sizeof(in_addr)};
    return {reinterpret_cast<char const*>(&reinterpret_cast<sockaddr_in6 const&>(address).sin6_addr), sizeof(in6_addr)};
}

/// At the same place in both versions.
std::uint32_t PORT_OF(sockaddr const& address) { return ntohs(reinterpret_cast<sockaddr_in const&>(address).sin_port); }

std::size_t SIZE_OF(std::string_view text) { return text.empty() ? 0 : HEAD_LENGTH + text.size(); }

/// Of everything; the chunks of numbers have 1 + 1 + 2 + 2 + 4 + 4 + 1 + 4 octets.
std::size_t SIZE_OF(CapturedMessage const& message, std::string_view password)
{
    std::size_t const numbers = 8 * HEAD_LENGTH + 19;
    std::size_t const hosts = 2 * (HEAD_LENGTH + HOST_OF(message.from).size());
    return HEAD_LENGTH + numbers + hosts + SIZE_OF(password) + SIZE_OF(message.correlation) + HEAD_LENGTH +
           message.payload.size();
}
} // namespace

void HepPacket::ENCODE(std::string& octets, CapturedMessage const& message, std::uint32_t agent,
                       std::string_view password)
{
    bool const isVersion4 = message.from.sa_family == AF_INET;
    auto const now = std::chrono::duration_cast<std::chrono::microseconds>(message.time.time_since_epoch()).count();
    std::size_t const size = SIZE_OF(message, password);
    octets.resize(size <= LONGEST ? size : 0);
    if (octets.empty())
        return;
    Writer writer(octets.data());
    writer.add(BEGINNING_OF_PACKET);
    writer.addNumber(static_cast<std::uint32_t>(size), 2);
    writer.add(FAMILY, isVersion4 ? VERSION_4 : VERSION_6, 1);
    writer.add(TRANSPORT, message.transport, 1);
    writer.add(isVersion4 ? FROM_VERSION_4 : FROM_VERSION_6, HOST_OF(message.from));
    writer.add(isVersion4 ? TO_VERSION_4 : TO_VERSION_6, HOST_OF(message.to));
    writer.add(FROM_PORT, PORT_OF(message.from), 2);
    writer.add(TO_PORT, PORT_OF(message.to), 2);
    writer.add(SECONDS, static_cast<std::uint32_t>(now / 1000000), 4);
    writer.add(MICROSECONDS, static_cast<std::uint32_t>(now % 1000000), 4);
    writer.add(PROTOCOL, message.protocol, 1);
    writer.add(AGENT, agent, 4);
    if (!password.empty())
        writer.add(PASSWORD, password);
    if (!message.correlation.empty())
        writer.add(CORRELATION, message.correlation);
    writer.add(PAYLOAD, message.payload);
}
