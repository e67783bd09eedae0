#pragma once

#include "platform/base/Export.h"
#include "platform/base/InfoContainer.h"
#include "platform/base/TYHashTable.h"
#include "platform/base/XCode.h"
#include "properties/CC_PropertyContainer.h"
#include "properties/CC_PropertyName.h"

/// The property containers of a call's sides, at most one per side, in the order in which they were added. It owns none
/// of them: whoever adds one keeps it alive until it is removed. Not copyable, not locked.
///
///     CC_PropertyContainerContainer sides;
///     if (sides.add(CC_PCT_CALLING, &callingProperties).isOk())
///         sides.getInfo(info, 9, 0, 9, 0, "");
class CC_EXPORT CC_PropertyContainerContainer
{
public:
    /// Throws std::bad_alloc when memory is out.
    CC_PropertyContainerContainer();

    /// OK; REFUSED for a null container or a side that is present; NO_ELEMENT when memory is out. Nothing changes
    /// unless OK.
    XCode add(CC_PropertyContainerType type, CC_PropertyContainer* container);
    /// Forgets the side's container, if there is one.
    void remove(CC_PropertyContainerType type);
    /// Forgets all containers.
    void clear() { m_containers.clear(); }

    /// The side's container, or null.
    CC_PropertyContainer* get(CC_PropertyContainerType type) const { return m_containers.get(type); }
    /// At most one for each side.
    unsigned int getNumberOfContainers() const { return m_containers.getCount(); }

    /// Adds the line "Property Containers" and, unless this dump is already part of such a one, the containers one
    /// level below it, each under its side's prefix. Returns `info`.
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const;

    /// A shared instance without containers. Throws std::bad_alloc when its first use finds no memory.
    static CC_PropertyContainerContainer const& EMPTY();

private:
    using Entry = TYInt32HashTable<CC_PropertyContainer*>::Entry;
    Entry const* getNextAfterCall(Entry const* visited, unsigned int& index) const;

    TYInt32HashTable<CC_PropertyContainer*> m_containers;
};
