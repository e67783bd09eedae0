#pragma once

#include "platform/base/Export.h"
#include "platform/base/InfoContainer.h"
#include "platform/base/String.h"

/// A request that one side of a call makes of the other, beside the properties: a transfer, a refer, digits.
///
/// The requester builds it on its stack and hands it to a call leg; it is delivered to the other sides before that
/// operation returns and lives no longer. Receivers tell the kinds apart by type numbers, which the classes take when
/// they are first asked, on the call-control loop's thread; the numbers hold for this process alone and are never
/// stored or sent.
///
///     CC_ServicePushBack pushBack(callLegId);
///     leg.invokeSynchronousService(pushBack);
///
///     void Module::notifyPeerSynchronousService(CC_CallAdapter& adapter, CC_Service& service)
///     {
///         if (service.isOfType(CC_ServicePushBack::TYPE()))
///             stepBack(adapter, static_cast<CC_ServicePushBack&>(service).getCallLegId());
///     }
class CC_EXPORT CC_Service
{
public:
    CC_Service() = default;

    virtual ~CC_Service();
    /// The type number of the service's class (CC_ServiceUserInputUpdate says otherwise).
    virtual unsigned int type() const = 0;
    /// Whether the service is of the class with that type number; every service is of CC_Service::TYPE().
    virtual bool isOfType(unsigned int type) const = 0;
    /// The service in one line; empty when memory is out.
    virtual String getInfo() const = 0;
    /// Adds the service to a dump, what it carries one level below it, and returns `info`.
    virtual InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                   unsigned int maxDetail, unsigned int detail, String const& prefix) const = 0;

    static unsigned int TYPE();
    /// What a class's variable holds before it has a number.
    static unsigned int INVALID_TYPE() { return 0xffffffff; }
    /// A number that no class has, counted up from 0.
    static unsigned int ACQUIRE_TYPE();

protected:
    /// For derived classes. @{
    CC_Service(CC_Service const&) = default;
    CC_Service& operator=(CC_Service const&) = default;
    /// @}

    /// The number in `held`, a class's own variable, acquired while it is INVALID_TYPE().
    static unsigned int KEEP_TYPE(unsigned int& held)
    {
        if (held == INVALID_TYPE())
            held = ACQUIRE_TYPE();
        return held;
    }
};
