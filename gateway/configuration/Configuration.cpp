#include "configuration/Configuration.h"

#include "media/context/MediaDescription.h"
#include "platform/base/IpAddress.h"
#include "sip/message/SipCodec.h"

#include <toml++/toml.h>

#include <algorithm>
#include <charconv>
#include <fstream>
#include <initializer_list>
#include <limits>

#include <system_error>

namespace
{
bool IS_CONTROL(char c) { return static_cast<unsigned char>(c) < 0x20 || c == 0x7f; }

/// Everything on one line, whatever a parser's message or a file's name holds.
std::string ONE_LINE(std::string text)
{
    std::replace_if(text.begin(), text.end(), IS_CONTROL, ' ');
    return text;
}

bool IS_ADDRESS(std::string const& host, bool isVersion6)
{
    IpAddress address;
    if (!address.setIpAddrAsString(host.c_str()).isOk() || address.isNetType())
        return false;
    return isVersion6 == (address.getVersion() == 6);
}

/// Reads the keys of one table and, at the end, refuses those that nobody asked for.
class Section
{
public:
    Section(std::string const& file, std::string prefix, toml::table const& table)
        : m_file(file), m_prefix(std::move(prefix)), m_table(table)
    {
    }

    [[noreturn]] void refuse(std::string const& key, std::string const& reason) const
    {
        throw ConfigurationError(m_file, m_prefix + key, reason);
    }

    bool has(char const* key) const { return m_table.contains(key); }

    std::string text(char const* key, std::string const& fallback) const
    {
        toml::node const* const node = m_table.get(key);
        if (node == nullptr)
            return fallback;
        if (!node->is_string())
            refuse(key, "expected a text");
        std::string value = node->as_string()->get();
        if (std::any_of(value.begin(), value.end(), IS_CONTROL))
            refuse(key, "has a line break or another control character");
        return value;
    }

    std::string neededText(char const* key) const
    {
        if (!has(key))
            refuse(key, "is missing");
        std::string value = text(key, {});
        if (value.empty())
            refuse(key, "must not be empty");
        return value;
    }

    unsigned int number(char const* key, unsigned int fallback, unsigned int least, unsigned int most) const
    {
        toml::node const* const node = m_table.get(key);
        if (node == nullptr)
            return fallback;
        if (!node->is_integer())
            refuse(key, "expected a whole number");
        std::int64_t const value = node->as_integer()->get();
        if (value < least || value > most)
            refuse(key, "must be from " + std::to_string(least) + " to " + std::to_string(most));
        return static_cast<unsigned int>(value);
    }

    /// False where it is not.
    bool flag(char const* key) const
    {
        toml::node const* const node = m_table.get(key);
        if (node != nullptr && !node->is_boolean())
            refuse(key, "expected true or false");
        return node != nullptr && node->as_boolean()->get();
    }

    std::string oneOf(char const* key, char const* fallback, std::initializer_list<char const*> allowed) const
    {
        std::string value = text(key, fallback);
        std::string list;
        for (char const* const candidate : allowed)
        {
            if (value == candidate)
                return value;
            list += list.empty() ? candidate : std::string(", ") + candidate;
        }
        refuse(key, "must be one of " + list);
    }

    SocketAddress address(char const* key) const
    {
        try
        {
            return SocketAddress::PARSE(neededText(key));
        }
        catch (std::invalid_argument const& error)
        {
            refuse(key, error.what());
        }
    }

    /// The texts of a list that, where it is, has one at least.
    std::vector<std::string> texts(char const* key, std::vector<std::string> fallback) const
    {
        toml::node const* const node = m_table.get(key);
        if (node == nullptr)
            return fallback;
        toml::array const* const list = node->as_array();
        if (list == nullptr || list->empty())
            refuse(key, "expected a list of texts");
        std::vector<std::string> result;
        for (toml::node const& element : *list)
        {
            if (!element.is_string())
                refuse(key, "expected a list of texts");
            result.push_back(element.as_string()->get());
        }
        return result;
    }

    std::vector<AddressRange> ranges(char const* key) const
    {
        std::vector<AddressRange> result;
        try
        {
            for (std::string const& range : texts(key, {}))
                result.push_back(AddressRange::PARSE(range));
        }
        catch (std::invalid_argument const& error)
        {
            refuse(key, error.what());
        }
        return result;
    }

    void allow(std::initializer_list<char const*> keys) const
    {
        for (auto const& entry : m_table)
        {
            std::string const name(entry.first.str());
            if (std::none_of(keys.begin(), keys.end(), [&](char const* known) { return name == known; }))
                refuse(name, "is not a key");
        }
    }

private:
    std::string const& m_file;
    std::string m_prefix;
    toml::table const& m_table;
};

constexpr unsigned int LEAST_RECORDED = 4096; // octets
constexpr unsigned int MOST_RECORDED = 1024 * 1024 * 1024;
constexpr unsigned int UNLIMITED = std::numeric_limits<int>::max();

constexpr unsigned int LEAST_MESSAGE = 1024;   // octets
constexpr unsigned int MOST_MESSAGE = 1 << 20; // of a stream; a datagram ends at 65535

/// Without `transports` an interface listens on what it speaks to its peer.
void READ_TRANSPORTS(Section const& section, Configuration::Interface& interface)
{
    std::string const towardsPeer = section.oneOf("transport", "udp", {"udp", "tcp"});
    interface.usesTcp = towardsPeer == "tcp";
    interface.listensOnUdp = interface.listensOnTcp = false;
    for (std::string const& transport : section.texts("transports", {towardsPeer}))
        if (transport == "udp")
            interface.listensOnUdp = true;
        else if (transport == "tcp")
            interface.listensOnTcp = true;
        else
            section.refuse("transports", "must be some of udp, tcp");
    if (!(interface.usesTcp ? interface.listensOnTcp : interface.listensOnUdp))
        section.refuse("transports", "must have '" + towardsPeer + "', which is the peer's");
}

/// Where others find it: no address that is everybody's, or many's.
SocketAddress READ_REACHABLE(Section const& section, char const* key)
{
    SocketAddress address = section.address(key);
    if (address.isUnspecified())
        section.refuse(key, "'" + address.host + "' is nobody's address");
    if (address.isMulticast())
        section.refuse(key, "'" + address.host + "' is a multicast address");
    return address;
}

void READ_ADDRESSES(Section const& section, Configuration::Interface& interface)
{
    interface.listen = section.address("listen");
    if (section.has("advertise"))
        interface.advertise = READ_REACHABLE(section, "advertise");
    else if (interface.listen.isUnspecified())
        section.refuse("listen", "'" + interface.listen.host + "' cannot be told to peers: advertise is needed");
    if (interface.listen.isMulticast())
        section.refuse("listen", "'" + interface.listen.host + "' is a multicast address");
    interface.peer = READ_REACHABLE(section, "peer");
    if (interface.peer.isVersion6() != interface.listen.isVersion6())
        section.refuse("peer", "is not of the version of the internet protocol that listen is of");
    if (interface.advertise.port != 0 && interface.advertise.isVersion6() != interface.listen.isVersion6())
        section.refuse("advertise", "is not of the version of the internet protocol that listen is of");
    if (interface.peer == interface.listen || interface.peer == interface.advertise)
        section.refuse("peer", "is the interface itself");
}

/// By the names that session descriptions have for them.
void READ_CODECS(Section const& section, Configuration::Interface& interface)
{
    if (!section.has("codecs"))
        return;
    interface.codecs.clear();
    for (std::string const& name : section.texts("codecs", {}))
    {
        MG_Rtp::ECodec::Type const codec = SipCodec::NAMED(name);
        if (codec == MG_Rtp::ECodec::NONE)
            section.refuse("codecs", "'" + name + "' is no codec");
        if (std::find(interface.codecs.begin(), interface.codecs.end(), codec) != interface.codecs.end())
            section.refuse("codecs", "'" + name + "' is in it twice");
        interface.codecs.push_back(codec);
    }
    if (interface.codecs.size() > MediaFormats::MOST)
        section.refuse("codecs", "may have " + std::to_string(MediaFormats::MOST) + " of them");
}

Configuration::Interface READ_INTERFACE(Section const& section)
{
    section.allow({"name",
                   "listen",
                   "advertise",
                   "peer",
                   "transport",
                   "transports",
                   "allow",
                   "max-message-size",
                   "max-header-size",
                   "max-connections-per-source",
                   "tcp-idle",
                   "t1",
                   "t1x64",
                   "answer-timeout",
                   "codecs",
                   "detect-digits",
                   "srtp",
                   "ringback",
                   "conference",
                   "transfer",
                   "media-address",
                   "session-expires",
                   "min-se",
                   "max-call-duration"});
    Configuration::Interface interface;
    interface.name = section.neededText("name");
    READ_ADDRESSES(section, interface);
    READ_TRANSPORTS(section, interface);
    interface.allow = section.ranges("allow");
    interface.maxMessageSize =
        section.number("max-message-size", interface.maxMessageSize, LEAST_MESSAGE, MOST_MESSAGE);
    interface.maxHeaderSize = section.number("max-header-size", interface.maxHeaderSize, LEAST_MESSAGE, MOST_MESSAGE);
    interface.maxConnectionsPerSource =
        section.number("max-connections-per-source", interface.maxConnectionsPerSource, 1, UNLIMITED);
    interface.tcpIdle = section.number("tcp-idle", interface.tcpIdle, 1, 86400);
    interface.t1 = section.number("t1", interface.t1, 10, 10000);
    interface.t1x64 = section.number("t1x64", 64 * interface.t1, interface.t1, 640000);
    interface.transfersOnWire = section.oneOf("transfer", "dial", {"dial", "refer"}) == "refer";
    READ_CODECS(section, interface);
    std::string const srtp = section.oneOf("srtp", "off", {"off", "optional", "required"});
    interface.security = srtp == "off"        ? SipStream::PLAIN
                         : srtp == "optional" ? SipStream::OPTIONAL
                                              : SipStream::SECURED;
    interface.conference = section.text("conference", {});
    interface.ringsBack = section.flag("ringback");
    interface.detectsDigits = section.flag("detect-digits");
    interface.mediaAddress = section.text("media-address", interface.listen.host);
    interface.leastExpires = section.number("min-se", interface.leastExpires, 1, 86400);
    interface.sessionExpires = section.number("session-expires", interface.sessionExpires, 0, 86400);
    interface.longestCall = section.number("max-call-duration", interface.longestCall, 0, 86400);
    interface.answerTimeout = section.number("answer-timeout", interface.answerTimeout, 1, 3600);
    return interface;
}

Configuration::Route READ_ROUTE(Section const& section)
{
    section.allow({"from", "prefix", "to"});
    return {section.neededText("from"), section.text("prefix", {}), section.neededText("to")};
}

/// Calls `handle(section)` for each table of an array of tables.
template <class Handle>
void FOR_EACH_TABLE(Section const& root, toml::table const& table, std::string const& file, char const* key,
                    Handle&& handle)
{
    toml::node const* const node = table.get(key);
    if (node == nullptr)
        return;
    if (!node->is_array_of_tables())
        root.refuse(key, std::string("expected tables, [[") + key + "]]");
    toml::array const& tables = *node->as_array();
    for (std::size_t i = 0; i < tables.size(); ++i)
        handle(Section(file, std::string(key) + "[" + std::to_string(i) + "].", *tables[i].as_table()));
}

void READ_GATEWAY(Section const& section, Configuration& configuration)
{
    section.allow({"context", "log-level", "log-file", "call-control-log-level", "max-hops", "max-calls",
                   "max-calls-per-second", "max-calls-per-source", "clear-after", "recording", "recording-size"});
    configuration.context = section.text("context", {});
    configuration.logLevel = section.oneOf("log-level", "info", {"trace", "debug", "info", "warning", "error", "off"});
    configuration.logFile = section.text("log-file", {});
    configuration.callControlLogLevel = section.number("call-control-log-level", 1, 0, 5);
    configuration.maxHops = section.number("max-hops", 0, 0, 255);
    configuration.maxCalls = section.number("max-calls", configuration.maxCalls, 0, UNLIMITED);
    configuration.maxCallsPerSecond =
        section.number("max-calls-per-second", configuration.maxCallsPerSecond, 0, UNLIMITED);
    configuration.maxCallsPerSource =
        section.number("max-calls-per-source", configuration.maxCallsPerSource, 0, UNLIMITED);
    configuration.clearAfter = section.number("clear-after", configuration.clearAfter, 0, 86400);
    configuration.recording = section.text("recording", {});
    configuration.recordingSize = section.number("recording-size", configuration.recordingSize, 0, MOST_RECORDED);
    if (configuration.recordingSize != 0 && configuration.recordingSize < LEAST_RECORDED)
        section.refuse("recording-size", "expected 0, or at least " + std::to_string(LEAST_RECORDED));
}

void READ_MEDIA(Section const& section, Configuration& configuration)
{
    section.allow({"mode", "first-port", "last-port", "threads", "silence", "dscp"});
    MediaOptions& media = configuration.media;
    configuration.relaysMedia = section.oneOf("mode", "direct", {"direct", "relay"}) == "relay";
    media.firstPort = static_cast<unsigned short>(section.number("first-port", media.firstPort, 1024, 65534));
    media.lastPort = static_cast<unsigned short>(section.number("last-port", media.lastPort, 1025, 65535));
    if (media.lastPort <= media.firstPort)
        section.refuse("last-port", "must be above first-port");
    media.threads = section.number("threads", media.threads, 1, 64);
    media.silence = section.number("silence", 0, 0, 86400);
    media.differentiation = section.number("dscp", media.differentiation, 0, 63);
}

void CHECK_MEDIA_ADDRESS(Section const& section, Configuration::Interface const& interface)
{
    try
    {
        if (SocketAddress::PARSE(SocketAddress{interface.mediaAddress, 1}.text()).isUnspecified())
            section.refuse("media-address", "'" + interface.mediaAddress + "' cannot be told to peers");
    }
    catch (std::invalid_argument const& error)
    {
        section.refuse("media-address", error.what());
    }
}

Configuration READ_TABLE(toml::table const& table, std::string const& file)
{
    Configuration configuration;
    configuration.file = file;
    configuration.media.silence = 0;
    Section const root(file, {}, table);
    root.allow({"gateway", "media", "interface", "route"});
    if (toml::node const* const node = table.get("gateway"))
    {
        if (!node->is_table())
            root.refuse("gateway", "expected a table, [gateway]");
        READ_GATEWAY(Section(file, "gateway.", *node->as_table()), configuration);
    }
    if (toml::node const* const node = table.get("media"))
    {
        if (!node->is_table())
            root.refuse("media", "expected a table, [media]");
        READ_MEDIA(Section(file, "media.", *node->as_table()), configuration);
    }
    FOR_EACH_TABLE(root, table, file, "interface",
                   [&](Section const& section)
                   {
                       Configuration::Interface const interface = READ_INTERFACE(section);
                       if (configuration.findInterface(interface.name) != nullptr)
                           section.refuse("name", "'" + interface.name + "' is taken by another interface");
                       if (configuration.relaysMedia)
                           CHECK_MEDIA_ADDRESS(section, interface);
                       else if (!interface.conference.empty())
                           section.refuse("conference", "needs media.mode \"relay\"");
                       configuration.interfaces.push_back(interface);
                   });
    if (configuration.interfaces.empty())
        root.refuse("interface", "is missing: at least one [[interface]] is needed");
    FOR_EACH_TABLE(root, table, file, "route",
                   [&](Section const& section)
                   {
                       Configuration::Route const route = READ_ROUTE(section);
                       if (configuration.findInterface(route.from) == nullptr)
                           section.refuse("from", "there is no interface '" + route.from + "'");
                       if (configuration.findInterface(route.to) == nullptr)
                           section.refuse("to", "there is no interface '" + route.to + "'");
                       configuration.routes.push_back(route);
                   });
    return configuration;
}
} // namespace

ConfigurationError::ConfigurationError(std::string const& file, std::string const& key, std::string const& reason)
    : std::runtime_error(ONE_LINE(file + ": " + key + ": " + reason))
{
}

bool SocketAddress::isUnspecified() const
{
    return AddressRange::PARSE("0.0.0.0").contains(AddressRange::PARSE(host).getFirst()) ||
           AddressRange::PARSE("::").contains(AddressRange::PARSE(host).getFirst());
}

bool SocketAddress::isMulticast() const
{
    return AddressRange::PARSE("224.0.0.0/4").contains(AddressRange::PARSE(host).getFirst()) ||
           AddressRange::PARSE("ff00::/8").contains(AddressRange::PARSE(host).getFirst());
}

std::string SocketAddress::text() const
{
    return (isVersion6() ? "[" + host + "]" : host) + ":" + std::to_string(port);
}

SocketAddress SocketAddress::PARSE(std::string const& text)
{
    std::size_t const colon = text.rfind(':');
    if (colon == std::string::npos)
        throw std::invalid_argument("expected an address and a port, as in \"192.0.2.1:5060\"");
    SocketAddress result;
    result.host = text.substr(0, colon);
    bool const isBracketed = result.host.size() > 2 && result.host.front() == '[' && result.host.back() == ']';
    if (isBracketed)
        result.host = result.host.substr(1, result.host.size() - 2);
    if (!IS_ADDRESS(result.host, isBracketed))
        throw std::invalid_argument("'" + text.substr(0, colon) + "' is not an address");
    char const* const begin = text.data() + colon + 1;
    char const* const end = text.data() + text.size();
    auto const [stop, error] = std::from_chars(begin, end, result.port);
    if (error != std::errc() || stop != end || result.port == 0)
        throw std::invalid_argument("'" + text.substr(colon + 1) + "' is not a port");
    return result;
}

Configuration Configuration::READ(std::string const& file)
{
    std::ifstream stream(file);
    std::string text;
    char piece[4096];
    while (stream.read(piece, sizeof piece) || stream.gcount() > 0)
        text.append(piece, static_cast<std::size_t>(stream.gcount()));
    if (!stream.is_open() || stream.bad())
        throw ConfigurationError(file, "file", "cannot be read");
    return PARSE(text, file);
}

Configuration Configuration::PARSE(std::string_view text, std::string const& file)
{
    try
    {
        return READ_TABLE(toml::parse(text, file), file);
    }
    catch (toml::parse_error const& error)
    {
        throw ConfigurationError(file, "line " + std::to_string(error.source().begin.line),
                                 std::string(error.description()));
    }
}

Configuration::Interface const* Configuration::findInterface(std::string_view name) const
{
    auto const found = std::find_if(interfaces.begin(), interfaces.end(),
                                    [&](Interface const& interface) { return interface.name == name; });
    return found != interfaces.end() ? &*found : nullptr;
}
