#pragma once

#include "services/CC_Service.h"

#include <new>

/// Gives a service class its `type` and `isOfType`; the class defines `TYPE()` in its .cpp, so that its number exists
/// once in the process.
///
///     class CC_EXPORT CC_ServiceHook : public CC_ServiceClass<CC_ServiceHook>
///     {
///     public:
///         static unsigned int TYPE();
///         ...
///     };
///
///     unsigned int CC_ServiceHook::TYPE()
///     {
///         static unsigned int s_type = INVALID_TYPE();
///         return KEEP_TYPE(s_type);
///     }
template <class Derived>
class CC_EXPORT CC_ServiceClass : public CC_Service
{
public:
    /// `Derived::TYPE()`
    unsigned int type() const override { return Derived::TYPE(); }
    /// True for `Derived::TYPE()` and CC_Service::TYPE().
    bool isOfType(unsigned int type) const override { return type == Derived::TYPE() || type == CC_Service::TYPE(); }

protected:
    /// What `text` builds, or `otherwise` when memory is out, which must be short enough for a String that allocates
    /// nothing.
    template <class Builder>
    static String BUILD(Builder const& text, char const* otherwise = "")
    {
        try
        {
            return text();
        }
        catch (std::bad_alloc const&)
        {
            return otherwise;
        }
    }
    /// Stands in a dump for a value that lacked memory.
    static constexpr char const* NO_MEMORY = "(out of memory)";
};
