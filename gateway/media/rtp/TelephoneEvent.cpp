#include "media/rtp/TelephoneEvent.h"

#include <string_view>

namespace
{
constexpr std::string_view DIGITS = "0123456789*#ABCDF"; // RFC 4733, table 3; the last is the flash, event 16
}

bool TelephoneEvent::read(std::span<unsigned char const> payload)
{
    if (payload.size() < LENGTH)
        return false;
    event = payload[0];
    isEnd = (payload[1] & 0x80) != 0;
    volume = payload[1] & 0x3f;
    duration = READ_16(&payload[2]);
    return true;
}

void TelephoneEvent::write(unsigned char* out) const
{
    out[0] = event;
    out[1] = static_cast<unsigned char>((isEnd ? 0x80 : 0) | (volume & 0x3f));
    WRITE_16(out + 2, duration);
}

char TelephoneEvent::DIGIT_OF(unsigned char event) { return event < DIGITS.size() ? DIGITS[event] : '\0'; }

unsigned char TelephoneEvent::EVENT_OF(char digit)
{
    std::size_t const at = DIGITS.find(digit);
    return at < FLASH ? static_cast<unsigned char>(at) : 255;
}
