#pragma once

#include "media/context/MediaDescription.h"
#include "media/context/MediaReport.h"
#include "media/file/RecordedSound.h"
#include "media/quality/MediaQuality.h"
#include "platform/media/MG_Tones.h"

#include <memory>
#include <variant>

class CallRecording;
class MediaLoop;
class RtpTermination;

/// What signalling tells the datapath. Calls and legs are named by their numbers, which are never used again, so that
/// what comes too late finds nobody.
namespace MediaOrder
{
/// A new leg of a call, which begins with its first and ends with its last one.
struct Make
{
    unsigned long long call;
    std::unique_ptr<RtpTermination> leg;
};
struct Describe
{
    unsigned long long leg;
    MediaDescription description;
};
struct Connect ///< to the legs of another call of the same loop
{
    unsigned long long leg;
    unsigned long long call;
};
struct Expect ///< what concerns this leg waits until another loop has handed it over
{
    unsigned long long leg;
};
struct HandOver ///< to another loop, as a leg of that call
{
    unsigned long long leg;
    unsigned long long call;
    MediaLoop* loop;
};
struct Tone
{
    unsigned long long leg;
    MG_Tones::ECallProgressTone::Type tone;
};
struct Play
{
    unsigned long long leg;
    SharedSound sound; ///< null: ends what is played
    bool isEndless;
};
struct Detect ///< digits in speech
{
    unsigned long long leg;
    bool isWanted;
};
struct Digit
{
    unsigned long long leg;
    char digit;
    unsigned int milliseconds;
};
struct Aside ///< digits of the others
{
    unsigned long long leg;
    bool isAside;
};
struct Ask ///< for the quality
{
    unsigned long long leg;
};
struct End
{
    unsigned long long leg;
};
struct Record ///< what is said in the call
{
    unsigned long long call;
    std::shared_ptr<CallRecording> recording; ///< null: ends it
};
struct Stop ///< the loop's running
{
};
using Any =
    std::variant<Make, Describe, Connect, Expect, HandOver, Tone, Play, Detect, Digit, Aside, Ask, End, Record, Stop>;

/// Which leg it is about; 0: none.
unsigned long long LEG_OF(Any const& order);
} // namespace MediaOrder

/// What the datapath tells signalling of a leg.
struct MediaNews
{
    enum Kind
    {
        DIGIT,
        SILENCE,
        SPEECH,
        QUALITY,
        REPORT
    };
    unsigned long long leg;
    Kind kind;
    char digit = '\0';
    unsigned int amount = 0; ///< milliseconds of a digit, seconds of silence
    MediaQuality quality{};
    bool isSound = false; ///< of a digit: heard in speech
    MediaReport report{};
};
