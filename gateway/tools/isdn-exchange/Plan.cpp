#include "Plan.h"

#include <toml++/toml.h>

#include <stdexcept>
#include <string_view>

namespace
{
/// The values of a table, each asked for once: what is left over is a key that nobody knows.
class Table
{
public:
    Table(std::string file, toml::table const& table) : m_file(std::move(file)), m_table(table) {}

    void read(char const* key, std::string& value) { readAs(key, value); }
    void read(char const* key, bool& value) { readAs(key, value); }
    template <class Number>
    void read(char const* key, Number& value)
    {
        auto number = static_cast<std::int64_t>(value);
        readAs(key, number);
        if (number < 0 || number > 1000000000)
            throw std::runtime_error(m_file + ": " + key + ": is out of range");
        value = static_cast<Number>(number);
    }
    void checkKeys() const
    {
        for (auto const& [key, node] : m_table)
            if (m_known.find(" " + std::string(key.str()) + " ") == std::string::npos && !node.is_array_of_tables())
                throw std::runtime_error(m_file + ": " + std::string(key.str()) + ": is no key");
    }

private:
    template <class Value>
    void readAs(char const* key, Value& value)
    {
        m_known += std::string(" ") + key + " ";
        toml::node const* const node = m_table.get(key);
        if (node == nullptr)
            return;
        std::optional<Value> const found = node->value_exact<Value>();
        if (!found)
            throw std::runtime_error(m_file + ": " + key + ": has the wrong type");
        value = *found;
    }

    std::string m_file;
    toml::table const& m_table;
    std::string m_known;
};

template <class Read>
void READ_EACH(toml::table const& toml, char const* key, Read const& read)
{
    if (toml::array const* const tables = toml.get_as<toml::array>(key))
        for (toml::node const& node : *tables)
            if (toml::table const* const table = node.as_table())
                read(*table);
}

std::vector<Fault> READ_FAULTS(std::string const& file, toml::table const& toml)
{
    std::vector<Fault> faults;
    READ_EACH(toml, "faults",
              [&](toml::table const& one)
              {
                  Fault fault;
                  std::string octets;
                  Table table(file, one);
                  table.read("message", fault.message);
                  table.read("octets", octets);
                  if (one.contains("element"))
                      table.read("element", fault.element = 0);
                  if (one.contains("length"))
                      table.read("length", fault.length = 0);
                  table.checkKeys();
                  fault.octets = Fault::OCTETS_OF(octets);
                  faults.push_back(fault);
              });
    return faults;
}

Plan::Subscriber READ_SUBSCRIBER(std::string const& file, toml::table const& toml)
{
    Plan::Subscriber one;
    Table table(file, toml);
    table.read("number", one.number);
    table.read("does", one.does);
    table.read("cause", one.cause);
    table.read("rings", one.rings);
    table.read("answers", one.answers);
    table.read("releases", one.releases);
    table.read("release-cause", one.releaseCause);
    table.read("speaks", one.speaks);
    table.read("file", one.file);
    table.read("record", one.record);
    table.read("connected", one.connected);
    table.read("connected-type", one.connectedType);
    table.read("connected-presentation", one.connectedPresentation);
    table.read("connected-screening", one.connectedScreening);
    table.read("connected-subaddress", one.connectedSubaddress);
    table.read("becomes", one.becomes);
    table.read("name", one.name);
    table.read("user-user", one.userUser);
    table.read("in-band", one.isInBand);
    table.read("foreign", one.isForeign);
    table.read("holds", one.holds);
    table.read("parks", one.parks);
    table.read("units", one.units);
    table.read("interval", one.interval);
    table.read("currency", one.currency);
    table.read("tariff", one.tariff);
    table.read("drops", one.drops);
    one.faults = READ_FAULTS(file, toml);
    table.checkKeys();
    return one;
}

Plan::Call READ_CALL(std::string const& file, toml::table const& toml)
{
    Plan::Call one;
    Table table(file, toml);
    table.read("transfers-to", one.transfersTo);
    table.read("to", one.to);
    table.read("to-type", one.toType);
    table.read("to-plan", one.toPlan);
    table.read("from", one.from);
    table.read("type", one.type);
    table.read("plan", one.plan);
    table.read("presentation", one.presentation);
    table.read("screening", one.screening);
    table.read("name", one.name);
    table.read("subaddress", one.subaddress);
    table.read("called-subaddress", one.calledSubaddress);
    table.read("redirecting", one.redirecting);
    table.read("redirecting-type", one.redirectingType);
    table.read("redirecting-presentation", one.redirectingPresentation);
    table.read("reason", one.reason);
    table.read("redirections", one.redirections);
    table.read("user-user", one.userUser);
    table.read("bearer", one.bearer);
    table.read("overlap", one.isOverlap);
    table.read("exclusive", one.isExclusive);
    table.read("holds", one.holds);
    table.read("parks", one.parks);
    table.read("count", one.count);
    table.read("after", one.after);
    table.read("interval", one.interval);
    table.read("length", one.length);
    table.read("cause", one.cause);
    table.read("keys", one.keys);
    table.read("speaks", one.speaks);
    table.read("file", one.file);
    table.read("record", one.record);
    one.faults = READ_FAULTS(file, toml);
    table.checkKeys();
    return one;
}
} // namespace

Plan Plan::READ(std::string const& file)
try
{
    toml::table const toml = toml::parse_file(file);
    Plan plan;
    Table table(file, toml);
    table.read("line", plan.line);
    table.read("user", plan.isUser);
    table.read("capture", plan.capture);
    table.read("seconds", plan.seconds);
    table.read("ends-after-calls", plan.endsAfterCalls);
    table.read("at-once", plan.atOnce);
    table.read("lost", plan.lost);
    table.read("repeated", plan.repeated);
    table.read("t200", plan.t200);
    table.checkKeys();
    READ_EACH(toml, "number", [&](toml::table const& one) { plan.subscribers.push_back(READ_SUBSCRIBER(file, one)); });
    READ_EACH(toml, "call", [&](toml::table const& one) { plan.calls.push_back(READ_CALL(file, one)); });
    return plan;
}
catch (toml::parse_error const& error)
{
    throw std::runtime_error(file + ": " + std::string(error.description()));
}
