#include "properties/CC_PropertyKind.h"

#include "properties/CC_PropertyClasses.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <tuple>
#include <type_traits>
#include <typeinfo>

template <class Property>
CC_PropertyKind const CC_PropertyKind::THE = {
    [](CC_Property const& property, CC_Property const& other) { return IS_EQUAL<Property>(property, other); },
    [](CC_Property& property, CC_Property const& other) { return ASSIGN<Property>(property, other); },
    !std::is_same_v<Property, CC_PropertyContextId>, CC_PropertyClasses::PLACE_OF<Property>()};

/// The kinds by the addresses of their type information, which the linker makes the same for all shared objects. Where
/// it did not, a class would be of no kind: slower, nothing else.
class CC_PropertyKinds
{
public:
    CC_PropertyKinds()
    {
        CC_PropertyClasses::FOR_EACH([]<class Property>()
                                     { std::ignore = ADD(typeid(Property), CC_PropertyKind::THE<Property>); });
    }

    static XCode ADD(std::type_info const& type, CC_PropertyKind const& kind)
    {
        std::size_t slot = SLOT_OF(type);
        while (s_entries[slot].type != nullptr && s_entries[slot].type != &type)
            slot = (slot + 1) % s_entries.size();
        if (s_entries[slot].type == &type)
            return XCode::OK;
        if (s_numberOfEntries == MOST)
            return XCode::REFUSED;
        ++s_numberOfEntries;
        s_entries[slot] = {&type, &kind};
        return XCode::OK;
    }

    static CC_PropertyKind const* FIND(std::type_info const& type)
    {
        std::size_t slot = SLOT_OF(type);
        while (s_entries[slot].type != &type && s_entries[slot].type != nullptr)
            slot = (slot + 1) % s_entries.size();
        return s_entries[slot].kind;
    }

private:
    struct Entry
    {
        std::type_info const* type;
        CC_PropertyKind const* kind;
    };
    static std::array<Entry, 128> s_entries; // few of them taken, so that nearly every look-up ends at the first
    static constexpr unsigned int MOST = CC_PropertyClasses::SIZE + 50;
    static unsigned int s_numberOfEntries;

    static std::size_t SLOT_OF(std::type_info const& type)
    {
        return reinterpret_cast<std::uintptr_t>(&type) / sizeof(void*) % s_entries.size();
    }
};
constinit std::array<CC_PropertyKinds::Entry, 128> CC_PropertyKinds::s_entries{};
constinit unsigned int CC_PropertyKinds::s_numberOfEntries = 0;

namespace
{
CC_PropertyKinds const s_kinds; // until it is made, no class is of any kind
} // namespace

CC_PropertyKind const* CC_PropertyKind::OF(CC_Property const& property)
{
    return CC_PropertyKinds::FIND(typeid(property));
}

CC_PropertyKind const* CC_PropertyKind::OF_BOTH(CC_Property const& property, CC_Property const& other)
{
    return &typeid(property) == &typeid(other) ? OF(property) : nullptr;
}

XCode CC_PropertyKind::ADD(std::type_info const& type, CC_PropertyKind const& kind)
{
    return CC_PropertyKinds::ADD(type, kind);
}

void CC_PropertyKind::ASSIGN_TYPE_IDS()
{
    std::ignore = CC_Property::TYPE_ID();
    CC_PropertyClasses::FOR_EACH([]<class Property>() { std::ignore = Property::TYPE_ID(); });
}
