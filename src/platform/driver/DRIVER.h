#pragma once

#include "platform/base/Export.h"
#include "platform/base/String.h"
#include "platform/base/TYPtr.h"
#include "platform/base/TYUUID.h"
#include "platform/base/TYVector.h"
#include "platform/base/XCode.h"
#include "platform/driver/IDriverInterface.h"

/// The repository of the interfaces that the platform's drivers offer, in the order of their registration.
/// It holds a reference on each. One thread: the one that initialises the application.
///
///     TYVector<TYPtr<IRebootMgmt>> found;
///     std::ignore = DRIVER::INSTANCE().getDriverInterfaces(found, TY::UUID::INVALID(), String::s_empty);
class CC_EXPORT DRIVER
{
public:
    /// The one of the process, made when it is first asked for.
    static DRIVER& INSTANCE();

    /// OK; REFUSED for a null interface; NO_ELEMENT when memory is out. The caller keeps a reference of its own
    /// meanwhile: a refused interface on which nobody else holds one is deleted.
    XCode addDriverInterface(IDriverInterface* interface, TY::UUID const& identity, String const& name);
    /// An unknown interface is ignored.
    void removeDriverInterface(IDriverInterface const* interface);

    /// Appends every interface of class T with that identity and name; the invalid identity and the empty name stand
    /// for any. OK, or NO_ELEMENT when memory is out.
    template <class T>
    XCode getDriverInterfaces(TYVector<TYPtr<T>>& interfaces, TY::UUID const& identity, String const& name) const
    {
        for (Registration const& registration : m_registrations)
            if (T* const interface = dynamic_cast<T*>(registration.interface.get());
                interface != nullptr && registration.answers(identity, name))
                if (XCode const result = interfaces.append(TYPtr<T>(interface)); !result.isOk())
                    return result;
        return XCode::OK;
    }

private:
    struct CC_EXPORT Registration
    {
        TYPtr<IDriverInterface> interface;
        TY::UUID identity;
        String name;
        bool answers(TY::UUID const& wantedIdentity, String const& wantedName) const;
    };

    TYVector<Registration> m_registrations;
};
