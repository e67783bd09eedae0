#pragma once

#include "media/quality/MediaQuality.h"

struct MediaReport;

/// What a leg's media tell its signalling module, on the signalling thread, from the event loop. The observer may do
/// anything inside, also end the leg's media; nothing is told after that.
class MediaObserver
{
public:
    virtual ~MediaObserver() = default;
    /// The far side keyed a digit in, '0' to '9', '*', '#', 'A' to 'D', or 'F' for a flash of the hook: told once, at
    /// its end. `milliseconds`: how long it was held, as far as that came through; 0: not known.
    virtual void onDigit(char digit, unsigned int milliseconds);
    /// Nothing has come from the far side for so many seconds, although it should (the mode receives): told once until
    /// something comes again.
    virtual void onSilence(unsigned int seconds);
    /// Something comes again after `onSilence`.
    virtual void onSpeech();
    /// Asked for, and every five seconds besides.
    virtual void onQuality(MediaQuality const& quality);
    /// An RTCP packet came or went, where the media layer was told to tell of them (MediaOptions::tellsReports).
    virtual void onReport(MediaReport const& report);
};
