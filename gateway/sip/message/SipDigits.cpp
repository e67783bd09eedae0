#include "sip/message/SipDigits.h"

#include "sip/message/SipText.h"

#include <cctype>

namespace
{
constexpr char const* EVENTS = "0123456789*#ABCD!"; // RFC 4733, 3.2: by their codes
constexpr unsigned int LONGEST = 60000;             // milliseconds
constexpr unsigned int SHORT = 250;                 // milliseconds
constexpr std::size_t MOST = 32;                    // digits in one body

/// Empty for what is no digit.
std::string DIGIT_OF(std::string_view signal)
{
    if (signal.size() == 2 && SipText::NUMBER(signal, 10, 16) != 0)
        return std::string(1, EVENTS[SipText::NUMBER(signal, 10, 16)]);
    if (signal.size() != 1)
        return {};
    char const digit = static_cast<char>(std::toupper(static_cast<unsigned char>(signal.front())));
    return digit != '\0' && std::string_view(EVENTS).find(digit) != std::string_view::npos ? std::string(1, digit)
                                                                                           : std::string();
}

SipDigits READ_RELAY(std::string_view body)
{
    return {DIGIT_OF(SipText::FIND_PARAMETER(body, '\n', "signal")),
            SipText::NUMBER(SipText::FIND_PARAMETER(body, '\n', "duration"), 1, LONGEST)};
}

SipDigits READ_PLAIN(std::string_view body)
{
    SipDigits read;
    std::string_view const text = SipText::TRIM(body);
    for (std::size_t i = 0; i < text.size() && i < MOST; ++i)
        if (std::string const digit = DIGIT_OF(text.substr(i, 1)); digit.empty())
            return {};
        else
            read.digits += digit;
    return read;
}
} // namespace

bool SipDigits::IS_TYPE(std::string_view contentType)
{
    return SipText::IS_ONE_OF(contentType, {"application/dtmf-relay", "application/dtmf"});
}

std::optional<SipDigits> SipDigits::READ(std::string_view contentType, std::string_view body)
{
    if (!IS_TYPE(contentType))
        return std::nullopt;
    SipDigits read =
        SipText::EQUALS_IGNORING_CASE(contentType, "application/dtmf") ? READ_PLAIN(body) : READ_RELAY(body);
    return read.digits.empty() ? std::nullopt : std::optional<SipDigits>(std::move(read));
}

std::string SipDigits::WRITE(char digit, unsigned int duration)
{
    return std::string("Signal=") + digit + "\r\nDuration=" + std::to_string(duration != 0 ? duration : SHORT) + "\r\n";
}
