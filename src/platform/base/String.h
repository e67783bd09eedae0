#pragma once

#include "platform/base/Export.h"
#include "platform/base/XCode.h"

#include <compare>
#include <cstddef>
#include <string>
#include <string_view>
#include <type_traits>

/// A text, held by value.
///
/// It may contain NUL bytes, and two strings are equal when their lengths and bytes are. What keeps texts keeps them
/// whole: names, properties, the dump that InfoContainer renders. What reads a C string ends at the first NUL: the
/// constructor from a pointer, `c_str()` with whatever it is given to, "%s" in `format`, `concatf` and the log.
/// `view()` has the whole text.
///
/// Memory that runs out throws std::bad_alloc; the library's operations catch it at their boundary. A String that is
/// made from a literal to be passed on is made before that boundary, on the caller's own line: one of up to 15 bytes is
/// held inside the object and needs no memory, a longer one may throw there, whatever the operation promises. Make
/// those beforehand, where that can be dealt with. The operations of CallControl on names take the literal itself.
///
///     String line;
///     line.format("%u calls", calls).concatf(", %s", name.c_str());
class CC_EXPORT String
{
public:
    String() = default;
    /// Here and below a null pointer stands for the empty text.
    String(char const* text) : m_text(TEXT_OF(text)) {}
    /// So many bytes, NUL among them. REQUIRES: `text` points to as many.
    String(char const* text, std::size_t length) : m_text(text, length) {}
    explicit String(std::string_view text) : m_text(text) {} ///< explicit, for it may need memory; the way back is not

    /// `c_str` and `view` hold until the String changes or ends; the length is in bytes. @{
    char const* c_str() const { return m_text.c_str(); }
    std::size_t length() const { return m_text.size(); }
    bool isEmpty() const { return m_text.empty(); }
    std::string_view view() const { return m_text; }
    /// @}
    /// For whatever takes any text. The view must not outlive the String, nor a change of it.
    operator std::string_view() const { return m_text; }

    /// Appends. Throws std::bad_alloc, and nothing has changed then. @{
    String& operator+=(String const& other)
    {
        m_text += other.m_text;
        return *this;
    }
    String& operator+=(char const* text)
    {
        m_text += TEXT_OF(text);
        return *this;
    }
    String& operator+=(std::string_view text)
    {
        m_text += text;
        return *this;
    }
    /// @}
    /// Makes it empty; needs no memory.
    void clear() { m_text.clear(); }
    /// Makes it that text without throwing: OK; NO_ELEMENT when memory is out, and it stays as it was.
    XCode assign(std::string_view text);

    /// Replaces the content by the printf-style text.
    String& format(char const* format, ...) __attribute__((format(printf, 2, 3)));
    /// Appends the printf-style text.
    String& concatf(char const* format, ...) __attribute__((format(printf, 2, 3)));

    /// Whether the string begins with `prefix`; every string begins with the empty one.
    bool startsWith(String const& prefix) const { return m_text.starts_with(prefix.m_text); }
    /// Deletes up to `count` bytes from `position` on; a position past the end deletes nothing.
    void deleteRegion(std::size_t position, std::size_t count);
    /// Equality that takes the letters A to Z and a to z for the same.
    bool equalsIgnoreCase(String const& other) const;

    /// Byte for byte, and the same length. @{
    friend bool operator==(String const& left, String const& right) { return left.m_text == right.m_text; }
    friend bool operator==(String const& left, char const* right) { return left.m_text == TEXT_OF(right); }
    friend bool operator==(String const& left, std::string_view right) { return left.m_text == right; }
    /// @}
    /// By the bytes, as numbers from 0 to 255; of two that begin alike the shorter comes first. @{
    friend auto operator<=>(String const& left, String const& right) { return left.m_text <=> right.m_text; }
    friend auto operator<=>(String const& left, char const* right) { return left.view() <=> VIEW_OF(right); }
    friend auto operator<=>(String const& left, std::string_view right) { return left.view() <=> right; }
    /// @}
    /// The two, one behind the other. Throws std::bad_alloc.
    friend String operator+(String left, String const& right) { return left += right; }

    static String stringOf(bool value); ///< "true" or "false"
    /// In decimals, "-" in front of a negative one. @{
    static String stringOf(int value);
    static String stringOf(unsigned int value);
    static String stringOf(long value);
    static String stringOf(unsigned long value);
    static String stringOf(long long value);
    static String stringOf(unsigned long long value);
    /// @}
    /// A pointer would silently become a bool; `addressOf` prints one.
    template <class T>
    static String stringOf(T*) = delete;
    /// The address as "%p" prints it.
    static String addressOf(void const* object);

    /// A literal, or another text that TYText takes, as it stands. @{
    static std::string_view VIEW_OF(char const* text) { return TEXT_OF(text); }
    static std::string_view VIEW_OF(std::string_view text) { return text; }
    /// @}

    /// The empty string, for getters that return a reference. Ready before any other static initialiser runs.
    static String const s_empty;

private:
    static char const* TEXT_OF(char const* text) { return text == nullptr ? "" : text; }

    std::string m_text;
};

/// What operations on names take beside a String, without making one: a literal, a pointer to a text (null: the empty
/// one), a std::string_view, a std::string.
template <class Text>
concept TYText = std::is_convertible_v<Text const&, std::string_view>;

/// "true" or "false".
CC_EXPORT char const* TRUE_FALSE(bool value);
