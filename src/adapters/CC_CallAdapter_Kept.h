#pragma once

#include "adapters/CC_CallAdapter.h"
#include "platform/base/TYRecycled.h"
#include "properties/CC_PropertyContainer.h"

#include <array>
#include <memory>

/// The containers that filters have worked on, kept for the next time: the values of a dozen properties are taken over
/// where they stand for a fifth of the instructions that it takes to make and delete them.
struct CC_CallAdapter::Kept : TYRecycled
{
    struct Container : TYRecycled
    {
        CC_PropertyContainer properties;
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
};
