#pragma once

#include "isdn/link/IsdnTimers.h"

#include <bitset>
#include <string>

class ConfigurationSection;

/// A primary-rate line, [[isdn]] in the configuration. A plain value; README.md lists the keys.
struct IsdnConfiguration
{
    /// How a digit that is keyed in during a call reaches the far side.
    enum class Digits
    {
        KEYPAD, ///< element Keypad facility of INFORMATION (Q.931, 4.5.18)
        SOUND   ///< in the B channel; needs media
    };

    std::string name;               ///< of the provider, and in routes
    std::string line;               ///< the path of the local socket
    bool isNetwork = false;         ///< `side = "network"`; else "user"
    bool isOverlapSending = true;   ///< numbers may go out digit by digit; else a number is waited for until T302
    bool isOverlapReceiving = true; ///< numbers may come in digit by digit
    bool collects = true; ///< digits are collected until T302, '#' or sending complete; else each is handed on
    Digits digits = Digits::KEYPAD;
    unsigned int failureTone = 0;         ///< seconds for which a caller hears why his call fails; 0: he does not
    std::bitset<32> channels{0xfffefffe}; ///< B channels in service, by timeslot
    IsdnTimers timers{};

    /// Checked and with defaults filled in. Throws ConfigurationError.
    static IsdnConfiguration READ(ConfigurationSection const& section);
};
