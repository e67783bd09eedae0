#pragma once

#include "platform/base/Export.h"

#include <string>
#include <string_view>

/// One JSON object (RFC 8259) on one line, member by member. Texts may be anything: what is no UTF-8 becomes U+FFFD.
/// Throws std::bad_alloc when memory is out.
///
///     CC_JsonLine line;
///     line.add("call", 7ULL).add("name", leg.getName());
///     std::puts(line.get().c_str()); // {"call":7,"name":"trunk/9"}
class CC_EXPORT CC_JsonLine
{
public:
    /// Adds a member and returns this.
    CC_JsonLine& add(std::string_view name, std::string_view text);
    /// The same with a number.
    CC_JsonLine& add(std::string_view name, unsigned long long number);
    /// `json`: a value as it is to stand there, such as another line or an array.
    CC_JsonLine& addJson(std::string_view name, std::string_view json);

    /// The whole line, without a line break.
    std::string get() const { return m_text + '}'; }

    /// The text in quotation marks.
    static std::string QUOTED(std::string_view text);

private:
    std::string m_text = "{";
};
