#pragma once

#include "properties/CC_Property.h"
#include "properties/CC_PropertyId.h" // for who makes a value of a class

#include <new>
#include <type_traits>
#include <typeinfo>
#include <utility>

/// Whether the class declares a type number of its own. An inherited one would give it the number of its base.
template <class Derived>
inline constexpr bool HAS_OWN_TYPE_ID = std::is_same_v<decltype(Derived::s_typeId), CC_PropertyTypeId<Derived>>;

/// What all property classes have in common, written once: `Derived` is the class itself, `Base` the property class
/// that it extends.
///
/// A class states its name, its variable for the type number, its text and how to compare its value. The variable and
/// `getValueString` are defined in the class's .cpp: a variable in a template or an inline function would exist once
/// per shared object, and the objects of a call would disagree about the class.
///
///     // CC_PropertyPoint.h
///     class CC_EXPORT CC_PropertyPoint : public CC_PropertyClass<CC_PropertyPoint>
///     {
///     public:
///         static constexpr char const* TYPE_NAME = "Point";
///         static TypeId s_typeId;
///         using CC_PropertyClass::CC_PropertyClass;                      // from the id alone
///         CC_PropertyPoint(unsigned int id, int x, int y) : CC_PropertyClass(id), m_x(x), m_y(y) {}
///         String& getValueString(String& out) const override;
///         bool hasSameValue(CC_PropertyPoint const& other) const { return m_x == other.m_x && m_y == other.m_y; }
///
///     private:
///         int m_x = 0;
///         int m_y = 0;
///     };
///
///     // CC_PropertyPoint.cpp
///     CC_PropertyPoint::TypeId CC_PropertyPoint::s_typeId;
///     String& CC_PropertyPoint::getValueString(String& out) const { return out.format("%d/%d", m_x, m_y); }
template <class Derived, class Base = CC_Property>
class CC_EXPORT CC_PropertyClass : public Base
{
public:
    /// Of the class's variable for its type number.
    using TypeId = CC_PropertyTypeId<Derived>;

    using Base::Base;

    /// The number of the class in this process, which the first call assigns.
    static unsigned int TYPE_ID()
    {
        static_assert(HAS_OWN_TYPE_ID<Derived>, "the class needs a `static TypeId s_typeId;` of its own");
        return Derived::s_typeId.get();
    }

    /// The property as one of this class, or of one that derives from it; null when it is null or of another class.
    ///
    ///     if (auto const* number = CC_PropertyString::FROM(adapter.getPeerProperty(CC_PropertyId::E164_NUMBER)))
    ///         display(number->getValue());
    static Derived const* FROM(CC_Property const* property)
    {
        if (property != nullptr && typeid(*property) == typeid(Derived)) // nearly always, and cheaper than the cast
            return static_cast<Derived const*>(property);
        return dynamic_cast<Derived const*>(property);
    }
    /// The same, to be changed.
    static Derived* FROM(CC_Property* property)
    {
        return const_cast<Derived*>(FROM(static_cast<CC_Property const*>(property)));
    }

    /// Takes over id and value of a `Derived`; anything else, and memory that is out, changes nothing.
    CC_Property& assign(CC_Property const& other) override
    {
        Derived const* const same = SAME_CLASS(other);
        if (same != nullptr && same != &self() && !take(*same))
            this->reportFailedAssignment();
        return *this;
    }
    /// A `Derived`, owned by the caller; null when memory is out.
    CC_Property* clone() const override
    {
        try
        {
            return new Derived(self());
        }
        catch (std::bad_alloc const&)
        {
            return nullptr;
        }
    }
    /// `TYPE_ID()` of the class.
    unsigned int getTypeId() const override { return TYPE_ID(); }
    /// `Derived::TYPE_NAME`
    char const* getTypeName() const override { return Derived::TYPE_NAME; }
    /// True for the number of the class and those of its bases.
    bool isOfType(unsigned int typeId) const override { return typeId == TYPE_ID() || Base::isOfType(typeId); }
    /// Whether `other` is a `Derived`, too, and `hasSameValue`.
    bool isEqual(CC_Property const& other) const override
    {
        Derived const* const same = SAME_CLASS(other);
        return same != nullptr && self().hasSameValue(*same);
    }

private:
    friend class CC_PropertyKind;

    Derived& self() { return static_cast<Derived&>(*this); }
    Derived const& self() const { return static_cast<Derived const&>(*this); }

    /// `other` if it is of this class or derives from it, otherwise null.
    static Derived const* SAME_CLASS(CC_Property const& other)
    {
        if (typeid(other) == typeid(Derived)) // as above
            return static_cast<Derived const*>(&other);
        return CC_Property::ASK_IS_OF_TYPE(other, TYPE_ID()) ? dynamic_cast<Derived const*>(&other) : nullptr;
    }

    /// Whether memory sufficed. The whole object is copied, even when the values are the same: a class may hold more
    /// than it compares.
    bool take(Derived const& other)
    {
        if constexpr (std::is_nothrow_copy_assignable_v<Derived>)
            self() = other;
        else
        {
            try
            {
                self().takeWhole(other);
            }
            catch (std::bad_alloc const&)
            {
                return false;
            }
        }
        return true;
    }

protected:
    /// Takes id and value over, or throws std::bad_alloc and leaves both as they were. A class that can do so without a
    /// copy has one of its own.
    void takeWhole(Derived const& other)
    {
        Derived copy(other);
        self() = std::move(copy);
    }
};
