#pragma once

#include "Fault.h"

#include <string>
#include <vector>

/// What the exchange is to do, as its file says it (README.md lists the keys). A plain value.
struct Plan
{
    /// One of its subscribers.
    struct Subscriber
    {
        std::string number;
        std::string does = "answer"; ///< answer, busy, ring, reject, silent
        int cause = 21;              ///< of a reject
        unsigned int rings = 20;     ///< milliseconds until it rings
        unsigned int answers = 100;  ///< milliseconds until it answers
        unsigned int releases = 0;   ///< milliseconds from then until it releases; 0: it does not
        int releaseCause = 16;
        std::string speaks = "silence"; ///< silence, echo, tone, file
        std::string file;               ///< raw A-law
        std::string record;             ///< where what it hears is kept, raw A-law
        std::string connected;          ///< the number that answers, if another
        unsigned int connectedType = 2; ///< 0 to 7
        unsigned int connectedPresentation = 0;
        unsigned int connectedScreening = 3;
        std::string connectedSubaddress; ///< IA5; empty: none
        std::string becomes; ///< who has the call soon after it was answered; empty: it stays with who has answered
        std::string name;
        std::string userUser;
        bool isInBand = false;  ///< its ringing tone comes in the channel
        bool isForeign = false; ///< it is no ISDN telephone
        bool holds = false;     ///< it says that its user holds the call that is up, and takes it back, again and again
        unsigned int parks = 0; ///< milliseconds for which it holds the call itself, giving its channel back; 0: never
        unsigned int units = 0; ///< charged each interval; 0: nothing is
        unsigned int interval = 100; ///< milliseconds
        std::string currency;        ///< in hundredths of it; empty: units
        unsigned int tariff = 0;     ///< hundredths of the currency a minute, told before it rings; 0: nothing is
        unsigned int drops = 0;      ///< milliseconds from its answer until the line is lost; 0: it is not
        std::vector<Fault> faults;   ///< of the exchange's messages
    };
    /// Calls of its own.
    struct Call
    {
        std::string to;
        unsigned int toType = 0; ///< of the called number, 0 to 7
        unsigned int toPlan = 1; ///< 0 to 15
        std::string from;
        unsigned int type = 0; ///< of the calling number, 0 to 7
        unsigned int plan = 1;
        unsigned int presentation = 0;
        unsigned int screening = 0;
        std::string name;
        std::string subaddress;       ///< of who calls, IA5; empty: none
        std::string calledSubaddress; ///< of whom it calls
        std::string redirecting;
        unsigned int redirectingType = 2;
        unsigned int redirectingPresentation = 0;
        unsigned int reason = 0;
        unsigned int redirections = 1;
        std::string userUser;
        std::string bearer = "speech"; ///< speech, audio, digital
        bool isOverlap = false;
        bool isExclusive = false;
        std::string transfersTo; ///< whom it calls when it is answered, and then connects with who has answered
        bool holds = false;      ///< as of a subscriber
        unsigned int parks = 0;
        unsigned int count = 1;
        unsigned int after = 500;    ///< milliseconds until the first
        unsigned int interval = 100; ///< milliseconds between two
        unsigned int length = 500;   ///< milliseconds that an answered one lasts
        int cause = 16;              ///< with which it ends then
        std::string keys;            ///< keyed in once it is answered
        std::string speaks = "silence";
        std::string file;
        std::string record;
        std::vector<Fault> faults;
    };

    std::string line;            ///< the path where lines come in
    bool isUser = false;         ///< the user's side of the lines; else the network's
    std::string capture;         ///< a file of packets for the D channel; empty: none
    unsigned int seconds = 0;    ///< until it ends by itself; 0: it does not
    bool endsAfterCalls = false; ///< when its own are over
    unsigned int atOnce = 0;     ///< calls of its own; those that are too many wait. 0: no limit
    unsigned int lost = 0;       ///< frames of the D channel, per cent
    unsigned int repeated = 0;   ///< the same
    unsigned int t200 = 0;       ///< milliseconds until a frame is sent again (Q.921); 0: as the stack has it
    std::vector<Subscriber> subscribers;
    std::vector<Call> calls;

    /// Throws std::runtime_error with one line.
    static Plan READ(std::string const& file);
};
