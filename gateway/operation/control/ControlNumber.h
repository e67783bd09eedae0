#pragma once

#include <charconv>
#include <optional>
#include <string>

/// The text as a number up to `most`; nothing when it is anything else.
inline std::optional<unsigned long long> CONTROL_NUMBER(std::string const& text, unsigned long long most = ~0ull)
{
    unsigned long long number = 0;
    auto const [stop, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    if (error != std::errc() || stop != text.data() + text.size() || number > most)
        return std::nullopt;
    return number;
}
