#include "configuration/Configuration.h"

#include "platform/base/IpAddress.h"

#include <toml++/toml.h>

#include <algorithm>
#include <charconv>
#include <fstream>
#include <initializer_list>
#include <limits>
#include <sstream>
#include <system_error>

namespace
{
/// Everything on one line, whatever a parser's message or a file's name holds.
std::string ONE_LINE(std::string text)
{
    std::replace_if(
        text.begin(), text.end(), [](char c) { return static_cast<unsigned char>(c) < 0x20; }, ' ');
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
        return node->as_string()->get();
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

Configuration::Interface READ_INTERFACE(Section const& section)
{
    section.allow({"name", "listen", "peer", "transport", "t1", "t1x64", "answer-timeout", "transfer",
                   "session-expires", "min-se", "max-call-duration"});
    Configuration::Interface interface;
    interface.name = section.neededText("name");
    interface.listen = section.address("listen");
    interface.peer = section.address("peer");
    interface.usesTcp = section.oneOf("transport", "udp", {"udp", "tcp"}) == "tcp";
    interface.t1 = section.number("t1", interface.t1, 10, 10000);
    interface.t1x64 = section.number("t1x64", 64 * interface.t1, interface.t1, 640000);
    interface.transfersOnWire = section.oneOf("transfer", "dial", {"dial", "refer"}) == "refer";
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
    section.allow({"context", "log-level", "call-control-log-level", "max-hops", "max-calls", "max-calls-per-second",
                   "clear-after", "recording", "recording-size"});
    configuration.context = section.text("context", {});
    configuration.logLevel = section.oneOf("log-level", "info", {"trace", "debug", "info", "warning", "error", "off"});
    configuration.callControlLogLevel = section.number("call-control-log-level", 1, 0, 5);
    configuration.maxHops = section.number("max-hops", 0, 0, 255);
    configuration.maxCalls = section.number("max-calls", 0, 0, UNLIMITED);
    configuration.maxCallsPerSecond = section.number("max-calls-per-second", 0, 0, UNLIMITED);
    configuration.clearAfter = section.number("clear-after", configuration.clearAfter, 0, 86400);
    configuration.recording = section.text("recording", {});
    configuration.recordingSize = section.number("recording-size", configuration.recordingSize, 0, MOST_RECORDED);
    if (configuration.recordingSize != 0 && configuration.recordingSize < LEAST_RECORDED)
        section.refuse("recording-size", "expected 0, or at least " + std::to_string(LEAST_RECORDED));
}

Configuration READ_TABLE(toml::table const& table, std::string const& file)
{
    Configuration configuration;
    configuration.file = file;
    Section const root(file, {}, table);
    root.allow({"gateway", "interface", "route"});
    if (toml::node const* const node = table.get("gateway"))
    {
        if (!node->is_table())
            root.refuse("gateway", "expected a table, [gateway]");
        READ_GATEWAY(Section(file, "gateway.", *node->as_table()), configuration);
    }
    FOR_EACH_TABLE(root, table, file, "interface",
                   [&](Section const& section)
                   {
                       Configuration::Interface const interface = READ_INTERFACE(section);
                       if (configuration.findInterface(interface.name) != nullptr)
                           section.refuse("name", "'" + interface.name + "' is taken by another interface");
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
    std::ostringstream text;
    if (!stream || !(text << stream.rdbuf()) || stream.bad())
        throw ConfigurationError(file, "file", "cannot be read");
    return PARSE(text.str(), file);
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
