#pragma once

#include "platform/base/Export.h"
#include "platform/base/String.h"

#include <new>
#include <typeinfo>

class CC_Call;
class CC_CallLeg;

/// Something that happened to a call or a call leg (Source), told to its observers.
///
/// Built on the sender's stack and alive only for the delivery: an observer that keeps one clones it. Nothing that an
/// event points to is owned by it. Observers receive this base and cast it by reference to the class that belongs to
/// the operation; any other event there is a programming error and throws std::bad_cast.
///
///     void onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event) override
///     {
///         auto const& changed = CC_EvCallLegPropertyChanged::FROM(event);
///         if (changed.getFlags().get(CC_PropertyId::STATE))
///             ...
///     }
template <class Source>
class CC_EXPORT CC_Event
{
public:
    virtual ~CC_Event() = default;
    /// A copy of the same class, owned by the caller; null when memory is out.
    virtual CC_Event* clone() const = 0;
    /// Appends the event's class name to `out` and returns it.
    virtual String& getInfo(String& out) const = 0;

    /// The call or leg that sends the event; never null.
    Source* getSource() const { return m_source; }

protected:
    /// REQUIRES: the source outlives the delivery.
    explicit CC_Event(Source& source) : m_source(&source) {}
    /// For `clone`.
    CC_Event(CC_Event const&) = default;
    CC_Event& operator=(CC_Event const&) = delete;

private:
    Source* m_source;
};

extern template class CC_EXPORT CC_Event<CC_Call>;
extern template class CC_EXPORT CC_Event<CC_CallLeg>;

/// Gives an event class its `clone`, `getInfo` and `FROM`; the class states its name as `CLASS_NAME`.
template <class Derived, class Source>
class CC_EventClass : public CC_Event<Source>
{
public:
    /// The event as one of this class; any other throws std::bad_cast.
    static Derived const& FROM(CC_Event<Source> const& event)
    {
        if (typeid(event) == typeid(Derived)) // always but for a programming error, and much cheaper than the cast
            return static_cast<Derived const&>(event);
        return dynamic_cast<Derived const&>(event);
    }

    /// A `Derived`, owned by the caller; null when memory is out.
    CC_Event<Source>* clone() const override
    {
        try
        {
            return new Derived(static_cast<Derived const&>(*this));
        }
        catch (std::bad_alloc const&)
        {
            return nullptr;
        }
    }
    /// Appends `CLASS_NAME`.
    String& getInfo(String& out) const override { return out += Derived::CLASS_NAME; }

protected:
    using CC_Event<Source>::CC_Event;
};
