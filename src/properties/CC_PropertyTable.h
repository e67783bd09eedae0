#pragma once

#include "platform/base/Export.h"

class CC_Property;

/// The one table of property ids: names, classes, initial values and the order in which the built-in factory lists
/// them. Constant data; any thread.
///
///     CC_PropertyTable::Row const* const row = CC_PropertyTable::FIND(CC_PropertyId::HOPS);
///     std::puts(row->shortName); // hops
class CC_EXPORT CC_PropertyTable
{
public:
    struct Row
    {
        unsigned int id;
        char const* longName;  ///< null: the id has no name
        char const* shortName; ///< null: the id has no name
        /// Makes the class of the id with its initial value, owned by the caller, null when memory is out. Null: the
        /// built-in factory does not create the id.
        CC_Property* (*create)(unsigned int id);
        unsigned int listPosition; ///< 1 to NUMBER_OF_LISTED_IDS; 0: the factory does not list the id
    };

    static constexpr unsigned int NUMBER_OF_IDS = 60;
    static constexpr unsigned int NUMBER_OF_LISTED_IDS = 57;

    /// The row of the id, or null.
    static Row const* FIND(unsigned int id);
    /// The rows in ascending order of their ids. REQUIRES: index < NUMBER_OF_IDS
    static Row const& GET_ROW(unsigned int index);
    /// The ids in list order. REQUIRES: index < NUMBER_OF_LISTED_IDS
    static unsigned int GET_LISTED_ID(unsigned int index);
};
