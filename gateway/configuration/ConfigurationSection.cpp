#include "configuration/ConfigurationSection.h"

#include <toml++/toml.h>

#include <algorithm>

namespace
{
bool IS_CONTROL(char c) { return static_cast<unsigned char>(c) < 0x20 || c == 0x7f; }

/// Everything on one line, whatever a parser's message or a file's name holds.
std::string ONE_LINE(std::string text)
{
    std::replace_if(text.begin(), text.end(), IS_CONTROL, ' ');
    return text;
}

toml::table const NO_KEYS;

/// Of the table's keys that one, if it is there.
toml::table ONLY(toml::table const& table, std::string const& key)
{
    toml::table only;
    if (toml::node const* const node = table.get(key))
        only.insert(key, *node);
    return only;
}
} // namespace

/// One table of the tree that it keeps alive.
struct ConfigurationSection::Table
{
    std::shared_ptr<toml::table const> tree;
    toml::table const& keys;
};

ConfigurationError::ConfigurationError(std::string const& file, std::string const& key, std::string const& reason)
    : std::runtime_error(ONE_LINE(file + ": " + key + ": " + reason))
{
}

ConfigurationSection::ConfigurationSection(std::string file, std::string prefix, std::shared_ptr<Table const> table)
    : m_file(std::move(file)), m_prefix(std::move(prefix)), m_table(std::move(table))
{
}

ConfigurationSection ConfigurationSection::PARSE(std::string_view text, std::string const& file)
{
    try
    {
        auto const tree = std::make_shared<toml::table const>(toml::parse(text, file));
        return {file, {}, std::make_shared<Table const>(Table{tree, *tree})};
    }
    catch (toml::parse_error const& error)
    {
        throw ConfigurationError(file, "line " + std::to_string(error.source().begin.line),
                                 std::string(error.description()));
    }
}

void ConfigurationSection::refuse(std::string const& key, std::string const& reason) const
{
    throw ConfigurationError(m_file, m_prefix + key, reason);
}

void ConfigurationSection::allow(std::initializer_list<char const*> keys) const
{
    for (std::string const& key : getKeys())
        if (std::none_of(keys.begin(), keys.end(), [&](char const* known) { return key == known; }))
            refuse(key, "is not a key");
}

bool ConfigurationSection::has(char const* key) const { return m_table->keys.contains(key); }

bool ConfigurationSection::hasSameValues(ConfigurationSection const& other) const
{
    return m_table->keys == other.m_table->keys;
}

std::string ConfigurationSection::findChange(ConfigurationSection const& other,
                                             std::span<std::string_view const> but) const
{
    for (ConfigurationSection const* const one : {this, &other})
        for (std::string const& key : one->getKeys())
            if (std::find(but.begin(), but.end(), key) == but.end() &&
                ONLY(m_table->keys, key) != ONLY(other.m_table->keys, key))
                return key;
    return {};
}

std::vector<std::string> ConfigurationSection::getKeys() const
{
    std::vector<std::string> keys;
    for (auto const& entry : m_table->keys)
        keys.emplace_back(entry.first.str());
    return keys;
}

std::string ConfigurationSection::text(char const* key, std::string const& fallback) const
{
    toml::node const* const node = m_table->keys.get(key);
    if (node == nullptr)
        return fallback;
    if (!node->is_string())
        refuse(key, "expected a text");
    std::string value = node->as_string()->get();
    if (std::any_of(value.begin(), value.end(), IS_CONTROL))
        refuse(key, "has a line break or another control character");
    return value;
}

std::string ConfigurationSection::neededText(char const* key) const
{
    if (!has(key))
        refuse(key, "is missing");
    std::string value = text(key, {});
    if (value.empty())
        refuse(key, "must not be empty");
    return value;
}

unsigned int ConfigurationSection::number(char const* key, unsigned int fallback, unsigned int least,
                                          unsigned int most) const
{
    toml::node const* const node = m_table->keys.get(key);
    if (node == nullptr)
        return fallback;
    if (!node->is_integer())
        refuse(key, "expected a whole number");
    std::int64_t const value = node->as_integer()->get();
    if (value < least || value > most)
        refuse(key, "must be from " + std::to_string(least) + " to " + std::to_string(most));
    return static_cast<unsigned int>(value);
}

bool ConfigurationSection::flag(char const* key) const
{
    toml::node const* const node = m_table->keys.get(key);
    if (node != nullptr && !node->is_boolean())
        refuse(key, "expected true or false");
    return node != nullptr && node->as_boolean()->get();
}

std::string ConfigurationSection::oneOf(char const* key, char const* fallback,
                                        std::initializer_list<char const*> allowed) const
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

std::vector<std::string> ConfigurationSection::texts(char const* key, std::vector<std::string> fallback) const
{
    toml::node const* const node = m_table->keys.get(key);
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

std::vector<unsigned int> ConfigurationSection::numbers(char const* key, unsigned int least, unsigned int most) const
{
    toml::node const* const node = m_table->keys.get(key);
    if (node == nullptr)
        return {};
    std::string const expected =
        "expected a list of whole numbers from " + std::to_string(least) + " to " + std::to_string(most);
    toml::array const* const list = node->as_array();
    if (list == nullptr)
        refuse(key, expected);
    std::vector<unsigned int> result;
    for (toml::node const& element : *list)
    {
        std::int64_t const value = element.value_exact<std::int64_t>().value_or(-1);
        if (value < least || value > most)
            refuse(key, expected);
        result.push_back(static_cast<unsigned int>(value));
    }
    return result;
}

SocketAddress ConfigurationSection::address(char const* key) const
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

SocketAddress ConfigurationSection::addressOrName(char const* key) const
{
    try
    {
        return SocketAddress::PARSE_NAMED(neededText(key));
    }
    catch (std::invalid_argument const& error)
    {
        refuse(key, error.what());
    }
}

std::vector<AddressRange> ConfigurationSection::ranges(char const* key) const
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

ConfigurationSection ConfigurationSection::section(char const* key) const
{
    toml::node const* const node = m_table->keys.get(key);
    if (node != nullptr && !node->is_table())
        refuse(key, std::string("expected a table, [") + key + "]");
    toml::table const& keys = node != nullptr ? *node->as_table() : NO_KEYS;
    return {m_file, m_prefix + key + ".", std::make_shared<Table const>(Table{m_table->tree, keys})};
}

std::vector<ConfigurationSection> ConfigurationSection::sections(std::string const& key) const
{
    toml::node const* const node = m_table->keys.get(key);
    if (node == nullptr)
        return {};
    if (!node->is_array_of_tables())
        refuse(key, "expected tables, [[" + key + "]]");
    std::vector<ConfigurationSection> result;
    toml::array const& tables = *node->as_array();
    for (std::size_t i = 0; i < tables.size(); ++i)
        result.push_back({m_file, m_prefix + key + "[" + std::to_string(i) + "].",
                          std::make_shared<Table const>(Table{m_table->tree, *tables[i].as_table()})});
    return result;
}
