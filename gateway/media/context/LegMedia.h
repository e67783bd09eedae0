#pragma once

#include "media/context/MediaDescription.h"
#include "media/context/MediaObserver.h"
#include "media/file/RecordedSound.h"
#include "platform/base/TYPtr.h"
#include "platform/media/MG_Tones.h"

class CallMedia;
class MediaCore;

/// The media of one leg: a pair of ports of ours (one port under rtcp-mux) and what is known of the far side. Made by
/// `CallMedia::addLeg()`, owned by the leg's signalling module, on the signalling thread; its end gives the ports up
/// and tells the far side (RTCP BYE).
///
/// The ports stay the same through hold, resume, transfer and conference; so do the synchronisation source and the
/// numbering of what the far side hears.
///
/// Nothing here waits for the datapath: what is asked for is posted to it in order.
class LegMedia
{
public:
    ~LegMedia();
    LegMedia(LegMedia const&) = delete;
    LegMedia& operator=(LegMedia const&) = delete;

    /// Where we listen, for our session description, at once. @{
    MediaAddress const& getLocalRtp() const { return m_rtp; }
    MediaAddress const& getLocalRtcp() const { return m_rtcp; }
    /// @}
    /// Never used again by another leg of this process.
    unsigned long long getNumber() const { return m_number; }
    /// The call's, whose other legs hear this one.
    CallMedia& getCall() const { return *m_call; }

    /// What offer and answer made of the stream; each time they are through, and again when the direction changes. The
    /// far side's address is learned anew only if it is another one than before.
    void describe(MediaDescription const& description);
    /// The last description with another direction: hold and resume.
    void setMode(VoipCodecAndMode::Mode mode);
    /// What was described last. @{
    MediaDescription const& getDescription() const { return m_description; }
    /// @}

    /// Into another call, as when that is transferred or joined: ports, description and numbering stay.
    void moveTo(CallMedia& call);

    /// Plays a tone to the far side instead of what the others say; NONE ends it. A tone that the country does not have
    /// is silence.
    void playTone(MG_Tones::ECallProgressTone::Type tone);
    /// Plays a sound to the far side instead of what the others say, once or again and again (music on hold); null ends
    /// it. It and a tone take each other's place. WaveReader reads one from a file.
    void playSound(SharedSound const& sound, bool isEndless = false);
    /// Keys a digit in towards the far side: '0' to '9', '*', '#', 'A' to 'D' for 40 to 5000 milliseconds. Further ones
    /// wait their turn, up to 32. As a telephone event where that was agreed, else as a sound, where the codec is one
    /// that we can speak.
    void sendDigit(char digit, unsigned int milliseconds = 100);

    /// Digits that the other leg's far side tells are not keyed in here, neither as events nor as sounds, since
    /// signalling tells them. Of use where no telephone events were agreed on.
    void setDigitsAside(bool isAside);

    /// Whether digits are also heard in what the far side says: for those that send no telephone events. What is said
    /// is decoded for it, so it costs.
    void detectDigits(bool isWanted);

    /// What the datapath told last; all 0 and absent before. At most five seconds old.
    MediaQuality const& getQuality() const { return m_quality; }
    /// Has the observer told of the quality at once, a turn of each loop later.
    void askQuality();

private:
    friend class CallMedia;
    friend class MediaCore;
    LegMedia(CallMedia& call, MediaObserver& observer, unsigned long long number);

    unsigned long long m_number;
    TYPtr<CallMedia> m_call;
    MediaObserver& m_observer;
    MediaAddress m_rtp;
    MediaAddress m_rtcp;
    MediaDescription m_description;
    MediaQuality m_quality;
};
