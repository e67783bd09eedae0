#pragma once

#include "platform/asn1/AsnSyntax.h"

#include <new>
#include <utility>

/// What all classes of ASN.1 types have in common, written once: `Derived` is the class itself, `Base` the kind of type
/// that it is. A type that has a name in its module states it, and a constraint if it has one:
///
///     class CC_EXPORT TypeOfUnit : public AsnClass<TypeOfUnit, AsnInteger>
///     {
///     public:
///         static constexpr char const* TYPE_NAME = "TypeOfUnit";
///         static constexpr char const* CONSTRAINT = "(1..16)";
///         using AsnInteger::operator=; // from a number
///     };
template <class Derived, class Base>
class CC_EXPORT AsnClass : public Base
{
public:
    using Base::Base;

    /// A `Derived`, owned by the caller; null when memory is out.
    AsnSyntax* clone() const override
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
    /// The same with its initial value.
    AsnSyntax* createNew() const override { return new (std::nothrow) Derived(); }
    /// Back to what a new `Derived` holds.
    void reset() noexcept override { self() = Derived(); }
    /// Moves the value of `same` here. REQUIRES: it is a `Derived`
    void take(AsnSyntax& same) noexcept override { self() = std::move(static_cast<Derived&>(same)); }
    /// `Derived::TYPE_NAME`; null when it states none.
    char const* getTypeName() const override
    {
        if constexpr (requires { Derived::TYPE_NAME; })
            return Derived::TYPE_NAME;
        else
            return nullptr;
    }
    /// `Derived::CONSTRAINT`; empty when it states none.
    char const* getConstraint() const override
    {
        if constexpr (requires { Derived::CONSTRAINT; })
            return Derived::CONSTRAINT;
        else
            return "";
    }

private:
    Derived& self() { return static_cast<Derived&>(*this); }
};
