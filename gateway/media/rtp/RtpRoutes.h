#pragma once

#include "media/context/MediaDescription.h"

#include <array>

/// What becomes of a received packet by its payload type, looked up once a packet: what it is to its own leg, and under
/// which payload type the other leg takes it as it is.
class RtpRoutes
{
public:
    enum Kind : unsigned char
    {
        UNKNOWN, ///< not agreed
        VOICE,
        EVENT,
        NOISE ///< comfort noise
    };
    struct Route
    {
        Kind kind = UNKNOWN;
        unsigned char format = 0;                          ///< VOICE: which of the description's
        unsigned char relayType = MediaPayloadTypes::NONE; ///< NONE: the other leg does not take it
        unsigned int clockRate = 8000;                     ///< Hz
    };

    RtpRoutes() = default;
    /// From a leg so described towards one so described; null: towards none.
    RtpRoutes(MediaDescription const& from, MediaDescription const* to);

    /// REQUIRES: type < 128.
    Route const& get(unsigned char type) const { return m_routes[type]; }
    /// Whether all that the leg so described may say is taken as it is.
    bool areAllRelayed(MediaDescription const& from) const;
    /// Of the codec that is spoken towards the leg's own far side, in Hz.
    unsigned int getClockRate() const { return m_clockRate; }

    /// The rate at which a codec's timestamps count (RFC 3551; G.722 counts half its samples), in Hz.
    static unsigned int CLOCK_RATE(MG_Rtp::ECodec::Type codec);

private:
    void add(MediaPayloadTypes const& types, Route const& route);

    std::array<Route, 128> m_routes{};
    unsigned int m_clockRate = 8000;
};
