#pragma once

#include "media/context/LegMedia.h"
#include "platform/media/MG_IContext.h"

#include <atomic>
#include <memory>
#include <string>

class CC_CallAdapter;
class CallRecording;

/// The media of one call: what its legs say and hear meets here. Two legs hear each other, of more each hears all the
/// others. It is the context to which the property Context (0x400400) binds a call, and lives as long as that or one of
/// its legs.
///
///     CallMedia* const call = CallMedia::OF(adapter.getDatapathContext());
///     std::unique_ptr<LegMedia> media = call->addLeg(interfaceAddress, observer, CallMedia::PART_OF(adapter));
///     if (media == nullptr)
///         ... // no port is free: release with cause 47
///     ... // our session description: media->getLocalRtp()
///
///     media->describe(description);                  // offer and answer are through
///     media->setMode(VoipCodecAndMode::SEND_ONLY);   // the far side put us on hold: it hears the others' music
///     media->moveTo(*CallMedia::OF(other));          // transferred
///     media.reset();                                 // released
///
/// On the signalling thread.
class CallMedia : public MG_IContext
{
public:
    /// The context as one of this media layer; null for null, and for one of another making.
    static CallMedia* OF(MG_IContext* context) { return dynamic_cast<CallMedia*>(context); }

    ~CallMedia() override;
    /// The lower 32 bits of its number, which is never used again.
    unsigned int getId() const override { return static_cast<unsigned int>(m_number); }
    unsigned long long getNumber() const { return m_number; }

    /// A leg's part in the call: who called is heard in the left channel of a recording, all others in the right one.
    enum class Part
    {
        CALLER,
        CALLED
    };
    /// That of the adapter's own leg: of two the older one called.
    static Part PART_OF(CC_CallAdapter const& adapter);

    /// A termination for one more leg, on ports of the address `local`, which must be one of this machine: silent in
    /// both directions until it is described. The observer must outlive it. Null when no pair of ports is free, the
    /// address is not ours, memory is out or the media layer has ended.
    std::unique_ptr<LegMedia> addLeg(IpAddress const& local, MediaObserver& observer, Part part = Part::CALLED);

    /// The same for a leg on a 64 kbit/s channel of a line, whose descriptor the termination takes over
    /// (ChannelTermination): it speaks A-law both ways from now on, and has no ports. Null as above.
    std::unique_ptr<LegMedia> addChannel(int channel, MediaObserver& observer, Part part = Part::CALLED);

    /// The file that keeps what is said in it (CallRecording); empty: none does. It is there from the first word on,
    /// and whole when the last leg has ended.
    std::string getRecording() const;

    /// By which way the digit came of which an observer of this call is being told: inside of that the other legs'
    /// modules can see what the media layer has done about it already. An EVENT has gone to the other leg of two as an
    /// event, or as a sound where there are none; a SOUND as what it is.
    enum DigitWay
    {
        NONE, ///< nobody is told of one
        EVENT,
        SOUND
    };
    DigitWay getDigitTold() const { return m_digitTold; }

    /// The number of contexts alive.
    static std::atomic<unsigned int> s_numberOfInstances;

private:
    friend class LegMedia;
    friend class MediaCore;
    CallMedia(MediaCore& core, unsigned long long number, unsigned int loop);
    /// Throws std::bad_alloc.
    void record(std::shared_ptr<CallRecording> const& recording);

    TYPtr<MediaCore> m_core;
    unsigned long long m_number;
    unsigned int m_loop;
    DigitWay m_digitTold = NONE;
    std::shared_ptr<CallRecording> m_recording;
};
