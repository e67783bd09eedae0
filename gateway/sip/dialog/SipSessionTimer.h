#pragma once

#include <string>
#include <utility>

/// What the two ends of a dialog agree on so that neither waits for ever for one that has vanished (RFC 4028): within
/// which time the session is to be refreshed, and by whom. A plain value; the endpoint has the clock.
///
///     SipSessionTimer timer(1800, 90);
///     if (!timer.takeRequest({.interval = 60, .isSupported = true}))
///         ...; // 422 with Min-SE
class SipSessionTimer
{
public:
    enum Refresher
    {
        NOBODY,
        UAC, ///< who has sent the request that it is agreed on with
        UAS
    };
    /// What a message of the peer's says of it.
    struct Seen
    {
        unsigned int interval = 0; ///< of Session-Expires, seconds; 0: none
        Refresher refresher = NOBODY;
        unsigned int least = 0;   ///< of Min-SE; 0: none
        bool isSupported = false; ///< by the sender
    };

    /// Seconds: what we ask for, 0: nothing, and the least that we take.
    SipSessionTimer(unsigned int wanted, unsigned int least) : m_wanted(wanted), m_least(least) {}

    /// A request of the peer's. False: it is refused with 422, and nothing changes.
    bool takeRequest(Seen const& seen);
    /// A 2xx to ours. One that says nothing: we refresh, if we have asked.
    void takeResponse(Seen const& seen);
    /// A refresh of ours reached nobody. Whether that was the second one in a row: the session has expired.
    bool miss() { return std::exchange(m_isMissed, true); }
    /// A 422 to ours. False when it asks for nothing that we have not offered already.
    bool raise(unsigned int least);

    /// Header lines, each with its line break; may be empty. @{
    std::string getRequestHeaders() const;
    std::string getResponseHeaders() const;
    std::string getMinimum() const; ///< for a 422
    /// @}

    unsigned int getInterval() const { return m_interval; } ///< seconds; 0: the session does not expire
    bool isOurs() const { return m_isOurs; }                ///< to refresh
    /// Milliseconds from a refresh until the next (half of the interval), or until the session counts as lost (a third
    /// of it, at most 32 s, before its end).
    unsigned int getDelay() const;

private:
    unsigned int m_wanted;
    unsigned int m_least;
    unsigned int m_leastOfPeer = 0;
    unsigned int m_interval = 0;
    bool m_isOurs = false;
    bool m_isMissed = false;
};
