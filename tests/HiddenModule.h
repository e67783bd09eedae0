#pragma once

#include "callcontrol/provider/CC_Endpoint.h"
#include "callcontrol/provider/CC_Provider.h"
#include "properties/CC_PropertyId.h"

#include <memory>
#include <string>

/// A signalling module in a shared object of its own, as a gateway loads it: it accepts every call and shows what it
/// saw. Everything in it is hidden but the function that makes it.
class HiddenModule
{
public:
    virtual ~HiddenModule() = default;
    virtual CC_Provider& getProvider() = 0;
    /// What its observers were told, as the module's own casts and type numbers saw it.
    virtual std::string takeStory() = 0;
    /// The type number of a library class, as the module's code sees it.
    virtual unsigned int getTypeIdOfString() const = 0;
    virtual unsigned int getTypeIdOfState() const = 0;
    virtual unsigned int getTypeOfUserInput() const = 0;
    /// The type number of the module's own property class, and a property of it that the module has put on its leg.
    virtual unsigned int getTypeIdOfOwnClass() const = 0;
    static constexpr unsigned int OWN_ID = CC_PropertyId::FIRST_OF_MODULES;
    virtual void hangUp() = 0;
};

/// The one function that the shared object exports.
using MakeHiddenModule = HiddenModule* (*)();
