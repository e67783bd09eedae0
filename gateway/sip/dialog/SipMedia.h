#pragma once

#include "media/context/LegMedia.h"
#include "media/context/MediaObserver.h"

#include <functional>
#include <memory>
#include <new>
#include <string>

class MG_IContext;

/// An endpoint's part in the media of its call, when they go through the gateway: its peer is told an address of ours
/// instead of the other peer's, and what the two agreed on goes to the media layer. Off, descriptions pass as they are.
///
///     SipMedia media([this](unsigned int seconds) { ... }); // nothing came for so long
///     media.turnOn(local);
///     media.note(false, fromPeer);
///     std::string const toPeer = media.toPeer(fromOtherSide, adapter.getDatapathContext());
///     media.note(true, toPeer);
///     media.settle(); // offer and answer have crossed
///
/// A member of its endpoint, on the signalling thread.
class SipMedia : private MediaObserver
{
public:
    /// No pair of ports is free. What lacks memory is cleared in the same way: cause 47.
    class NoPort : public std::bad_alloc
    {
    };
    /// Told from the event loop; may do anything, also end this.
    using OnSilence = std::function<void(unsigned int seconds)>;

    explicit SipMedia(OnSilence onSilence) : m_onSilence(std::move(onSilence)) {}

    /// Before the first description: ports are taken on this address.
    void turnOn(IpAddress const& local);
    /// Takes ports in the media context of the call, unless it has some. Whether there were any.
    bool open(MG_IContext* context);
    /// A description of the other side's as the peer is to read it; `context`: the call's. Throws NoPort.
    std::string toPeer(std::string const& description, MG_IContext* context);
    /// A description that went to the peer (`isOurs`) or came from it.
    void note(bool isOurs, std::string const& description);
    /// The last of either have become the session, or are its preview.
    void settle();
    /// The leg may be in another call.
    void follow(MG_IContext* context);
    /// The last known; null without media.
    MediaQuality const* getQuality() const { return m_leg != nullptr ? &m_leg->getQuality() : nullptr; }
    /// Gives the ports up.
    void end() { m_leg.reset(); }

private:
    // --- MediaObserver
    void onSilence(unsigned int seconds) override;

    OnSilence m_onSilence;
    bool m_isOn = false;
    IpAddress m_local;
    std::unique_ptr<LegMedia> m_leg;
    std::string m_source;  // what was rewritten last,
    std::string m_written; // and how
    unsigned int m_version = 0;
    std::string m_ours;
    std::string m_far;
};
