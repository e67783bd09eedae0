#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

/// What there is to tell of a call once it is over. A plain value: it knows nothing that is alive.
struct CallRecord
{
    /// How far a leg's party may be shown.
    enum class Presentation
    {
        ALLOWED,
        RESTRICTED,
        NOT_AVAILABLE ///< there is no number
    };

    /// What was measured of the media that came from and went to a leg's party.
    struct Quality
    {
        std::string codec;          ///< with its packet period
        double opinion = 0;         ///< mean opinion score, 1 to 5; 0: it was not measured
        bool isMeasured = false;    ///< otherwise the peers exchange their media themselves
        std::uint32_t received = 0; ///< packets
        std::uint32_t receivedOctets = 0;
        std::uint32_t sent = 0;
        std::uint32_t sentOctets = 0;
        std::uint32_t lost = 0;
        std::uint32_t jitter = 0;    ///< milliseconds
        std::uint32_t roundTrip = 0; ///< milliseconds
    };

    struct Leg
    {
        unsigned long long serial = 0;
        std::string interface;
        bool isCalling = false;
        double joined = 0;   ///< seconds since the start
        std::string dialled; ///< the party's number as the leg was made
        std::string number;  ///< the last that was known of it
        std::string name;
        Presentation presentation = Presentation::ALLOWED;
        std::string redirecting; ///< the number of the last redirection; empty: none
        std::string redirectingReason;
        bool isRedirectingRestricted = false;
        std::string id;             ///< of the call on the wire, where that has one
        std::string charge;         ///< as its text; empty: none
        int cause = 0;              ///< of Q.850; 0: none
        unsigned int sipStatus = 0; ///< 0: none
        std::string causeText;      ///< in the peer's words
        std::optional<Quality> quality;
    };

    unsigned long long serial = 0;
    std::int64_t start = 0; ///< nanoseconds since 1970, when the call was made
    /// Seconds since the start, by a clock that nobody sets. @{
    std::optional<double> ringing;
    std::optional<double> answered;
    double ended = 0;
    /// @}
    std::vector<Leg> legs;            ///< in the order of their joining
    unsigned long long clearedBy = 0; ///< the leg that was released first; 0: none was
    bool isEmergency = false;
    bool isClearedByGateway = false; ///< by an operator, or at its end

    /// Null when there is none. @{
    Leg const* getCaller() const;
    Leg const* getCalled() const; ///< the first one
    Leg const* getClearing() const;
    /// @}
};
