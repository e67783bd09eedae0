#include "properties/CC_Property.h"

#include "properties/CC_PropertyKind.h"
#include "properties/CC_PropertyTable.h"

#include <new>

unsigned int CC_Property::s_numberOfInstances = 0;
CC_PropertyTypeId<CC_Property> CC_Property::s_typeId;
unsigned int CC_Property::s_nextFreeTypeId = 0;

namespace
{
constexpr char const* UNKNOWN_NAME = "(unknown)";
constexpr char const* NO_VALUE = "(none)";
constexpr char const* NO_MEMORY = "(out of memory)"; // short enough for a String that allocates nothing

char const* NAME_OR_UNKNOWN(char const* name) { return name != nullptr ? name : UNKNOWN_NAME; }

/// An assignment whose outcome is awaited. A module's `assign` may begin others, so they nest, and each hears only of
/// its own object.
class Awaited
{
public:
    explicit Awaited(CC_Property const& target) : m_target(&target), m_outer(t_innermost) { t_innermost = this; }
    ~Awaited() { t_innermost = m_outer; }
    Awaited(Awaited const&) = delete;
    Awaited& operator=(Awaited const&) = delete;

    static void FAIL(CC_Property const& target)
    {
        Awaited* awaited = t_innermost;
        while (awaited != nullptr && awaited->m_target != &target)
            awaited = awaited->m_outer;
        if (awaited != nullptr)
            awaited->m_hasFailed = true;
    }
    bool hasFailed() const { return m_hasFailed; }

private:
    static thread_local Awaited* t_innermost __attribute__((tls_model("initial-exec")));

    CC_Property const* m_target; // compared only: it may end in its own assign
    Awaited* m_outer;
    bool m_hasFailed = false;
};
thread_local Awaited* Awaited::t_innermost = nullptr;
} // namespace

unsigned int CC_PropertyTypeNumber::assign() { return m_number = CC_Property::s_nextFreeTypeId++; }

unsigned int CC_Property::getTypeId() const { return TYPE_ID(); }

char const* CC_Property::getTypeName() const { return "Property"; }

bool CC_Property::ASK_IS_OF_TYPE(CC_Property const& property, unsigned int typeId) { return property.isOfType(typeId); }

XCode CC_Property::setValueString(String& error, String const&) { return REFUSE(error, "Invalid value"); }

InfoContainer& CC_Property::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                    unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    if (level > maxLevel || detail > maxDetail)
        return info;                            // before anything is formatted
    char const* const name = getPropertyName(); // both first: a value's text may remove the property
    char const* const type = getTypeName();
    try
    {
        String text;
        if (getValueString(text).isEmpty())
            text = NO_VALUE;
        if (detail < maxDetail)
            text.format("%s (%s)", text.c_str(), type);
        info.addWithin(maxLevel, level, maxDetail, detail, prefix, name, text);
    }
    catch (std::bad_alloc const&)
    {
        info.addWithin(maxLevel, level, maxDetail, detail, prefix, name, NO_MEMORY);
    }
    return info;
}

char const* CC_Property::getPropertyName() const
{
    CC_PropertyTable::Row const* const row = CC_PropertyTable::FIND(m_id);
    return NAME_OR_UNKNOWN(row != nullptr ? row->longName : nullptr);
}

char const* CC_Property::getPropertyShortName() const
{
    CC_PropertyTable::Row const* const row = CC_PropertyTable::FIND(m_id);
    return NAME_OR_UNKNOWN(row != nullptr ? row->shortName : nullptr);
}

XCode CC_Property::ASSIGN(CC_Property& property, CC_Property const& other)
{
    if (CC_PropertyKind const* const kind = CC_PropertyKind::OF_BOTH(property, other))
        return kind->assign(property, other) ? XCode::OK : XCode::NO_ELEMENT;
    Awaited const awaited(property);
    property.assign(other);
    return awaited.hasFailed() ? XCode::NO_ELEMENT : XCode::OK;
}

void CC_Property::reportFailedAssignment() const noexcept { Awaited::FAIL(*this); }

XCode CC_Property::REFUSE(String& error, char const* message)
{
    try
    {
        error = message;
    }
    catch (std::bad_alloc const&)
    {
        // the result tells the failure without a message
    }
    return XCode::FAILURE;
}
