#pragma once

#include "adapters/CC_CallAdapter.h"
#include "platform/base/TYRecycled.h"
#include "properties/CC_PropertyWorkingCopy.h"

#include <array>
#include <memory>

/// The containers that filters have worked on, kept for the next time: the values of a dozen properties are taken over
/// where they stand for a fifth of the instructions that it takes to make and delete them.
struct CC_CallAdapter::Kept : TYRecycled
{
    struct Container : TYRecycled, CC_PropertyWorkingCopy
    {
        CC_PropertyContainer const* source = nullptr; // of which it was a copy before the filters worked on it last
        unsigned int sourceNumber = 0;                // the last notification of the leg whose properties these are
        unsigned int targetNumber = 0;                // and of the leg that it was written to last
        unsigned long long sourceSerial = 0;          // these legs; 0: none
        unsigned long long targetSerial = 0;
    };
    /// One for each use, since the properties of one use are much the same from time to time.
    enum Use
    {
        OWN_INPUT,
        OTHER_INPUT,
        OWN_OUTPUT,
        PEER_OUTPUT,
        CALL_OUTPUT,
        NUMBER_OF_USES
    };
    std::array<std::unique_ptr<Container>, NUMBER_OF_USES> containers; // null: not used yet, or in use
    std::array<Container const*, NUMBER_OF_USES> latest{}; // made a copy last; compared only, it may be gone
};
