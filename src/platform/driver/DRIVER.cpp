#include "platform/driver/DRIVER.h"

#include "platform/driver/IRebootMgmt.h"

#include <new>

IDriverInterface::~IDriverInterface() = default;
IRebootMgmt::~IRebootMgmt() = default;

DRIVER& DRIVER::INSTANCE()
{
    static DRIVER s_driver;
    return s_driver;
}

XCode DRIVER::addDriverInterface(IDriverInterface* interface, TY::UUID const& identity, String const& name)
{
    if (interface == nullptr)
        return XCode::REFUSED;
    try
    {
        return m_registrations.append(Registration{TYPtr<IDriverInterface>(interface), identity, name});
    }
    catch (std::bad_alloc const&)
    {
        return XCode::NO_ELEMENT;
    }
}

void DRIVER::removeDriverInterface(IDriverInterface const* interface)
{
    TYPtr<IDriverInterface> removed; // given up at the end: its destructor may come back here
    for (std::size_t i = m_registrations.getSize(); i-- > 0;)
        if (m_registrations[i].interface.get() == interface)
        {
            removed = m_registrations[i].interface;
            m_registrations.remove(i);
        }
}

bool DRIVER::Registration::answers(TY::UUID const& wantedIdentity, String const& wantedName) const
{
    return (!wantedIdentity.isValid() || wantedIdentity == identity) && (wantedName.isEmpty() || wantedName == name);
}
