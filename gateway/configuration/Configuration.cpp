#include "configuration/Configuration.h"

#include "media/tone/ToneTable.h"
#include "operation/record/Libpq.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <cerrno>
#include <charconv>
#include <cstring>
#include <fstream>
#include <limits>
#include <memory>
#include <unistd.h>

namespace
{
constexpr unsigned int LEAST_RECORDED = 4096; // octets
constexpr unsigned int MOST_RECORDED = 1024 * 1024 * 1024;
constexpr unsigned int UNLIMITED = std::numeric_limits<int>::max();

void READ_GATEWAY(ConfigurationSection const& section, Configuration& configuration)
{
    section.allow({"context", "log-level", "log-file", "call-control-log-level", "max-hops", "max-calls",
                   "max-calls-per-second", "max-calls-per-source", "clear-after", "recording", "recording-size",
                   "international-prefix", "national-prefix", "country-code"});
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
    configuration.dialPlan = DialPlan::READ(section);
    configuration.recording = section.text("recording", {});
    configuration.recordingSize = section.number("recording-size", configuration.recordingSize, 0, MOST_RECORDED);
    if (configuration.recordingSize != 0 && configuration.recordingSize < LEAST_RECORDED)
        section.refuse("recording-size", "expected 0, or at least " + std::to_string(LEAST_RECORDED));
}

void READ_MEDIA(ConfigurationSection const& section, Configuration& configuration)
{
    section.allow({"mode", "first-port", "last-port", "threads", "silence", "dscp", "country", "recordings"});
    MediaOptions& media = configuration.media;
    configuration.relaysMedia = section.oneOf("mode", "direct", {"direct", "relay"}) == "relay";
    media.firstPort = static_cast<unsigned short>(section.number("first-port", media.firstPort, 1024, 65534));
    media.lastPort = static_cast<unsigned short>(section.number("last-port", media.lastPort, 1025, 65535));
    if (media.lastPort <= media.firstPort)
        section.refuse("last-port", "must be above first-port");
    media.threads = section.number("threads", media.threads, 1, 64);
    media.silence = section.number("silence", 0, 0, 86400);
    media.differentiation = section.number("dscp", media.differentiation, 0, 63);
    media.country = section.text("country", media.country);
    media.recordings = section.text("recordings", {});
    if (!media.recordings.empty() && access(media.recordings.c_str(), W_OK | X_OK) != 0)
        section.refuse("recordings", std::string("not a folder to write into: ") + std::strerror(errno));
    if (!media.recordings.empty() && !configuration.relaysMedia)
        section.refuse("recordings", "what is said can be kept in mode \"relay\" alone");
    std::string reason;
    if (!ToneTable().read(ToneTable::BUILT_IN(), media.country, reason))
        section.refuse("country", reason);
}

/// Octal, as chmod has it.
mode_t READ_MODE(ConfigurationSection const& section, mode_t fallback)
{
    std::string const text = section.text("mode", {});
    if (text.empty())
        return fallback;
    unsigned int mode = 0;
    auto const [stop, error] = std::from_chars(text.data(), text.data() + text.size(), mode, 8);
    if (error != std::errc() || stop != text.data() + text.size() || mode > 0777)
        section.refuse("mode", "must be an octal number from 000 to 777, as a text: \"0660\"");
    return static_cast<mode_t>(mode);
}

void READ_CONTROL(ConfigurationSection const& section, ControlOptions& control)
{
    section.allow({"socket", "mode", "group", "max-clients", "idle"});
    control.path = section.text("socket", {});
    control.mode = READ_MODE(section, control.mode);
    control.group = section.text("group", {});
    control.maxClients = section.number("max-clients", control.maxClients, 1, 1000);
    control.idle = section.number("idle", control.idle, 1, 86400);
    if (control.path.empty() && !section.getKeys().empty())
        section.refuse("socket", "is missing");
}

/// What is wrong with it is not told, since a piece of a password may be.
std::string READ_CONNECTION(ConfigurationSection const& section, char const* key)
{
    std::string text = section.text(key, {});
    if (text.empty())
        return text;
    Libpq const* const pq = Libpq::GET();
    if (pq == nullptr)
        section.refuse(key, "needs libpq.so.5, which is not installed");
    std::unique_ptr<PQconninfoOption, decltype(&PQconninfoFree)> const parsed(pq->conninfoParse(text.c_str(), nullptr),
                                                                              pq->conninfoFree);
    if (parsed == nullptr)
        section.refuse(key, "is no connection string");
    return text;
}

void READ_RECORDS(ConfigurationSection const& section, RecordOptions& records)
{
    section.allow({"file", "sqlite", "postgresql", "spool", "numbers", "kept", "when-full"});
    records.file = section.text("file", {});
    records.sqlite = section.text("sqlite", {});
    records.postgresql = READ_CONNECTION(section, "postgresql");
    records.spool = section.text("spool", {});
    records.isWhole = section.oneOf("numbers", "withheld", {"withheld", "whole"}) == "whole";
    records.kept = section.number("kept", records.kept, 1, 1000000);
    records.refusesUnrecorded = section.oneOf("when-full", "lose", {"lose", "refuse"}) == "refuse";
    if (!records.isOn() && !section.getKeys().empty())
        section.refuse("file", "is missing");
    if (records.spool.empty() && !(records.sqlite.empty() && records.postgresql.empty()))
        section.refuse("spool", "is missing: a database may not be there");
}

/// Long enough that nobody guesses it, and of what a header takes as it is (RFC 6750, 2.1).
bool IS_TOKEN(std::string_view text)
{
    return text.size() >= 16 && text.size() <= 256 &&
           std::all_of(text.begin(), text.end(),
                       [](unsigned char c)
                       { return std::isalnum(c) != 0 || c == '-' || c == '.' || c == '_' || c == '~'; });
}

/// Whoever connects is told all: a figure is no secret on the host, and beyond it is what somebody else shows.
void READ_METRICS(ConfigurationSection const& section, MetricOptions& metrics)
{
    section.allow({"listen", "page", "token"});
    if (section.getKeys().empty())
        return;
    metrics.hasPage = section.flag("page");
    metrics.token = section.text("token", {});
    if (!metrics.token.empty() && !IS_TOKEN(metrics.token))
        section.refuse("token", "must be of 16 to 256 letters, digits, \"-\", \".\", \"_\" and \"~\"");
    metrics.listen = section.address("listen");
    if (!AddressRange::CONTAINS({AddressRange::PARSE("127.0.0.0/8"), AddressRange::PARSE("::1")},
                                AddressRange::PARSE(metrics.listen.host).getFirst()))
        section.refuse("listen", "must be a loopback address");
}

void READ_CAPTURE(ConfigurationSection const& section, CaptureOptions& capture)
{
    section.allow({"server", "id", "password"});
    if (section.getKeys().empty())
        return;
    capture.server = section.address("server");
    capture.id = section.number("id", capture.id, 1, 4294967295);
    capture.password = section.text("password", {});
}

constexpr std::array OWN_TABLES{"gateway", "media", "route", "control", "records", "metrics", "capture"};

/// Every table that is not the gateway's own is a module's.
void READ_MODULES(ConfigurationSection const& root, Configuration& configuration)
{
    for (std::string const& key : root.getKeys())
    {
        if (std::find(OWN_TABLES.begin(), OWN_TABLES.end(), key) != OWN_TABLES.end())
            continue;
        std::vector<ConfigurationSection>& interfaces = configuration.modules[key] = root.sections(key);
        for (ConfigurationSection const& interface : interfaces)
        {
            std::string const name = interface.neededText("name");
            if (!configuration.interfaces.insert(name).second)
                interface.refuse("name", "'" + name + "' is taken by another interface");
            configuration.moduleOf[name] = key;
        }
    }
    if (configuration.interfaces.empty())
        throw ConfigurationError(configuration.file, "interfaces", "are missing: [[sip]] for one that speaks SIP");
}
} // namespace

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
    ConfigurationSection const root = ConfigurationSection::PARSE(text, file);
    Configuration configuration;
    configuration.file = file;
    READ_GATEWAY(root.section("gateway"), configuration);
    READ_MEDIA(root.section("media"), configuration);
    READ_CONTROL(root.section("control"), configuration.control);
    READ_RECORDS(root.section("records"), configuration.records);
    READ_METRICS(root.section("metrics"), configuration.metrics);
    READ_CAPTURE(root.section("capture"), configuration.capture);
    configuration.media.tellsReports = configuration.capture.isOn();
    READ_MODULES(root, configuration);
    for (ConfigurationSection const& route : root.sections("route"))
        configuration.routes.push_back(Route::READ(route, configuration.interfaces));
    return configuration;
}
