#include "properties/CC_Factory.h"

#include "properties/CC_PropertyKind.h"
#include "properties/CC_PropertyTable.h"

#include <tuple>

CC_PropertyFactory::~CC_PropertyFactory() = default;

CC_Factory::CC_Factory() = default;

CC_Factory::~CC_Factory() = default;

void CC_Factory::getPropertyIds(TYVector<unsigned int>& ids) const
{
    CC_PropertyKind::ASSIGN_TYPE_IDS(); // registering asks for the ids, once and before several threads are at work
    if (!ids.reserve(ids.getSize() + CC_PropertyTable::NUMBER_OF_LISTED_IDS).isOk())
        return;
    for (unsigned int i = 0; i < CC_PropertyTable::NUMBER_OF_LISTED_IDS; ++i)
        std::ignore = ids.append(CC_PropertyTable::GET_LISTED_ID(i)); // there is room
}

CC_Property* CC_Factory::createProperty(unsigned int id)
{
    CC_PropertyTable::Row const* const row = CC_PropertyTable::FIND(id);
    return row != nullptr && row->create != nullptr ? row->create(id) : nullptr;
}
