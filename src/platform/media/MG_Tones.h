#pragma once

#include "platform/base/Export.h"

/// The sounds by which a network tells a user what becomes of a call.
struct CC_EXPORT MG_Tones
{
    /// What a party hears of the progress of a call.
    struct CC_EXPORT ECallProgressTone
    {
        /// The tones of E.180 and E.182 and the line tones in national use. The numbers are this system's own; how a
        /// tone sounds is a matter of the country and of the media layer that plays it.
        enum Type : int
        {
            NONE = 0,                   ///< no tone
            DIAL = 1,                   ///< number may be dialled
            INTERNAL_DIAL = 2,          ///< an internal number may be dialled
            SPECIAL_DIAL = 3,           ///< dialling is possible, a feature is active on the line
            SECOND_DIAL = 4,            ///< further digits are expected after an access code
            RECALL_DIAL = 5,            ///< dialling is possible during a held call
            RINGING = 6,                ///< the called party is alerted
            SPECIAL_RINGING = 7,        ///< alerted, with a special condition
            BUSY = 8,                   ///< the called line is occupied
            CONGESTION = 9,             ///< no path or equipment
            SPECIAL_INFORMATION = 10,   ///< the call fails for another reason, an announcement follows
            INTERCEPT = 11,             ///< the call was diverted to an operator or an announcement
            NUMBER_UNOBTAINABLE = 12,   ///< the number is not in use
            WARNING = 13,               ///< the conversation is recorded
            RECORD = 14,                ///< an answering device: speak now
            PAYPHONE_RECOGNITION = 15,  ///< the other party uses a payphone
            CALL_WAITING = 16,          ///< another call waits for this user
            CALLER_WAITING = 17,        ///< the called user is busy but has call waiting
            CONFIRMATION = 18,          ///< the feature request was accepted
            POSITIVE_INDICATION = 19,   ///< the same, nationally
            NEGATIVE_INDICATION = 20,   ///< the feature request was refused
            REFUSAL = 21,               ///< the same, nationally
            ACCEPTANCE = 22,            ///< the request was taken: wait
            ANSWER = 23,                ///< the call was answered
            COMFORT = 24,               ///< the call is being set up: wait
            HOLD = 25,                  ///< the caller was put on hold
            PAY = 26,                   ///< insert coins
            INTRUSION = 27,             ///< a third party has entered the call
            OFFERING = 28,              ///< another call is offered during the conversation
            CONFERENCE = 29,            ///< a conference is in progress
            END_OF_THREE_PARTY = 30,    ///< one party has left
            OFF_HOOK_WARNING = 31,      ///< the handset is off-hook for too long
            PERMANENT_SIGNAL = 32,      ///< the line is permanently off-hook
            LINE_LOCK_OUT = 33,         ///< the line was taken out of use
            PREEMPTION = 34,            ///< the call is pre-empted
            QUEUE = 35,                 ///< the call waits in a queue
            ROUTE = 36,                 ///< national use
            VALID = 37,                 ///< national use
            WAITING = 38,               ///< national use
            FACILITIES = 39,            ///< national use
            CALLING_CARD = 40,          ///< the card number may be entered
            END_OF_PERIOD_WARNING = 41, ///< the paid period ends
            WARNING_PIP = 42,           ///< a reminder that the paid period runs
            CPE_ALERTING = 43           ///< data follow on the line
        };

        /// The tone's name ("ringing tone"); "no tone" for NONE, ERROR::INVALID for any other number.
        static char const* NAME(Type tone);
    };
};
