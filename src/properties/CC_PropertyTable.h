#pragma once

#include "platform/base/Export.h"
#include "platform/base/XCode.h"

class CC_Property;

/// The one table of property ids: names, classes, initial values and the order in which the built-in factory lists
/// them; and the names that modules declare for ids of their own. Any thread.
///
///     CC_PropertyTable::Row const* const row = CC_PropertyTable::FIND(CC_PropertyId::HOPS);
///     std::puts(row->shortName); // hops
class CC_EXPORT CC_PropertyTable
{
public:
    /// All that belongs to one id.
    struct Row
    {
        /// One of CC_PropertyId, or a module's own.
        unsigned int id;
        char const* longName;  ///< null: the id has no name
        char const* shortName; ///< null: the id has no name
        /// Makes the class of the id with its initial value, owned by the caller, null when memory is out. Null: the
        /// built-in factory does not create the id.
        CC_Property* (*create)(unsigned int id);
        unsigned int listPosition; ///< 1 to NUMBER_OF_LISTED_IDS; 0: the factory does not list the id
    };

    /// The library's ids, and those of them that the built-in factory creates and lists. @{
    static constexpr unsigned int NUMBER_OF_IDS = 60;
    static constexpr unsigned int NUMBER_OF_LISTED_IDS = 57;
    /// @}

    /// The row of the id, of a declared one as well, or null. Lives for ever.
    static Row const* FIND(unsigned int id);
    /// Gives a module's id its names, which are copied, for as long as the process lives; at start-up, before
    /// properties of it are about. OK; REFUSED for an id that is not set apart for modules or has names, be they the
    /// same, and for names that are empty or another id's; NO_ELEMENT when memory is out. What may come to it twice, as
    /// each object of a module or each test does, asks FIND first.
    ///
    ///     CC_PropertyTable::DECLARE(CC_PropertyId::FIRST_OF_MODULES + 7, "Trunk-Group", "trunk-group");
    static XCode DECLARE(unsigned int id, char const* longName, char const* shortName);
    /// The library's rows in ascending order of their ids. REQUIRES: index < NUMBER_OF_IDS
    static Row const& GET_ROW(unsigned int index);
    /// The ids in list order. REQUIRES: index < NUMBER_OF_LISTED_IDS
    static unsigned int GET_LISTED_ID(unsigned int index);
};
