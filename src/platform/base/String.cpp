#include "platform/base/String.h"

#include <algorithm>
#include <charconv>
#include <cstdarg>
#include <cstdint>
#include <cstdio>
#include <iterator>
#include <new>

// ready before the static initialisers of every other file, which may use it
__attribute__((init_priority(101))) String const String::s_empty;

namespace
{
void APPEND(std::string& text, char const* format, va_list arguments)
{
    char buffer[256];
    va_list again;
    va_copy(again, arguments);
    int const length = std::vsnprintf(buffer, sizeof buffer, format, arguments);
    if (length > 0 && static_cast<std::size_t>(length) < sizeof buffer)
        text.append(buffer, static_cast<std::size_t>(length));
    else if (length > 0)
    {
        std::size_t const start = text.size();
        text.resize(start + static_cast<std::size_t>(length) + 1); // vsnprintf writes a NUL as well
        std::vsnprintf(text.data() + start, static_cast<std::size_t>(length) + 1, format, again);
        text.pop_back();
    }
    va_end(again);
}

char LOWER(char letter) { return letter >= 'A' && letter <= 'Z' ? static_cast<char>(letter - 'A' + 'a') : letter; }
} // namespace

String& String::format(char const* format, ...)
{
    std::string replaced; // an argument may point into our own text
    va_list arguments;
    va_start(arguments, format);
    APPEND(replaced, format, arguments);
    va_end(arguments);
    m_text = std::move(replaced);
    return *this;
}

String& String::concatf(char const* format, ...)
{
    std::string appended;
    va_list arguments;
    va_start(arguments, format);
    APPEND(appended, format, arguments);
    va_end(arguments);
    m_text += appended;
    return *this;
}

XCode String::assign(std::string_view text)
{
    try
    {
        m_text.assign(text);
        return XCode::OK;
    }
    catch (std::bad_alloc const&)
    {
        return XCode::NO_ELEMENT;
    }
}

void String::deleteRegion(std::size_t position, std::size_t count)
{
    if (position < m_text.size())
        m_text.erase(position, count);
}

bool String::equalsIgnoreCase(String const& other) const
{
    return std::equal(m_text.begin(), m_text.end(), other.m_text.begin(), other.m_text.end(),
                      [](char left, char right) { return LOWER(left) == LOWER(right); });
}

String String::stringOf(bool value) { return TRUE_FALSE(value); }
String String::stringOf(int value) { return stringOf(static_cast<long long>(value)); }
String String::stringOf(unsigned int value) { return stringOf(static_cast<unsigned long long>(value)); }
String String::stringOf(long value) { return stringOf(static_cast<long long>(value)); }
String String::stringOf(unsigned long value) { return stringOf(static_cast<unsigned long long>(value)); }
String String::stringOf(long long value) { return String().format("%lld", value); }
String String::stringOf(unsigned long long value) { return String().format("%llu", value); }

// every call has its address for its first name, and printf takes five times as long
String String::addressOf(void const* object)
{
    if (object == nullptr)
        return "(nil)";
    char text[2 + 2 * sizeof object] = {'0', 'x'};
    auto const written = std::to_chars(text + 2, std::end(text), reinterpret_cast<std::uintptr_t>(object), 16);
    return String(std::string_view(text, static_cast<std::size_t>(written.ptr - text)));
}

char const* TRUE_FALSE(bool value) { return value ? "true" : "false"; }
