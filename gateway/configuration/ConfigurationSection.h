#pragma once

#include "configuration/AddressRange.h"
#include "configuration/SocketAddress.h"

#include <initializer_list>
#include <memory>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

/// What cannot be served in a configuration: one line, "FILE: KEY: REASON".
class ConfigurationError : public std::runtime_error
{
public:
    ConfigurationError(std::string const& file, std::string const& key, std::string const& reason);
};

/// One table of a configuration file. Gives out the values of its keys, checked; what is wrong is refused with the
/// file's name and the key's. A cheap value, which keeps the text's contents alive.
///
///     section.allow({"name", "channels"}); // all others are refused
///     line.name = section.neededText("name");
///     line.channels = section.number("channels", 30, 1, 30);
///
/// Everything throws ConfigurationError for a value that does not fit.
class ConfigurationSection
{
public:
    /// The whole text, which must be TOML; `file` names it in errors.
    static ConfigurationSection PARSE(std::string_view text, std::string const& file);

    [[noreturn]] void refuse(std::string const& key, std::string const& reason) const;
    /// Refuses the first key that is none of these.
    void allow(std::initializer_list<char const*> keys) const;

    bool has(char const* key) const;
    /// Whether the two have the same keys with the same values.
    bool hasSameValues(ConfigurationSection const& other) const;
    /// The first key, but those, that only one of the two has, or with another value; empty: there is none.
    std::string findChange(ConfigurationSection const& other, std::span<std::string_view const> but) const;
    std::vector<std::string> getKeys() const;

    std::string text(char const* key, std::string const& fallback) const;
    std::string neededText(char const* key) const; ///< not empty
    unsigned int number(char const* key, unsigned int fallback, unsigned int least, unsigned int most) const;
    bool flag(char const* key) const; ///< false where it is not
    std::string oneOf(char const* key, char const* fallback, std::initializer_list<char const*> allowed) const;
    /// Of a list that, where it is, has one at least.
    std::vector<std::string> texts(char const* key, std::vector<std::string> fallback) const;
    /// Of a list of whole numbers; none where it is not.
    std::vector<unsigned int> numbers(char const* key, unsigned int least, unsigned int most) const;
    SocketAddress address(char const* key) const; ///< needed
    /// The same, or a name, with a port or without.
    SocketAddress addressOrName(char const* key) const;
    std::vector<AddressRange> ranges(char const* key) const;

    /// [key]; an empty one where there is none.
    ConfigurationSection section(char const* key) const;
    /// [[key]]; none where there is none.
    std::vector<ConfigurationSection> sections(std::string const& key) const;

private:
    struct Table; // of the file's parser

    ConfigurationSection(std::string file, std::string prefix, std::shared_ptr<Table const> table);

    std::string m_file;
    std::string m_prefix; // of its keys
    std::shared_ptr<Table const> m_table;
};
