#pragma once

#include <string>

/// How the media layer does its work. What is out of range is brought into it.
struct MediaOptions
{
    unsigned int threads = 1;           ///< 1 to 64: datapath loops, each with a thread; a context belongs to one
    unsigned short firstPort = 16384;   ///< of the range from which legs take ports: RTP the even ones,
    unsigned short lastPort = 32767;    ///< RTCP the odd ones above them
    unsigned int differentiation = 46;  ///< 0 to 63: the code point of what is sent (RFC 2474); 46 expedites
    unsigned int learningTime = 2000;   ///< milliseconds after the first packet in which the far address may settle
    unsigned int silence = 20;          ///< seconds without a packet until signalling is told; 0: it never is
    unsigned int reportInterval = 5000; ///< milliseconds between two RTCP reports
    bool tellsReports = false;          ///< each RTCP packet to the leg's observer
    std::string country = "de";         ///< whose tones are played
    std::string recordings;             ///< the folder for what is said in every call; empty: that is not kept
    std::string tones;                  ///< where they are written (ToneTable); empty: the built-in ten countries

    friend bool operator==(MediaOptions const&, MediaOptions const&) = default;
};
