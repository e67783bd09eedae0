#pragma once

#include "platform/asn1/AsnSyntax.h"

#include <cstddef>
#include <string_view>

/// Marks a component that bears a context-specific tag in place of its type's own. A choice has no tag that could be
/// replaced: there the tag is wrapped around it, as X.680 demands.
struct AsnImplicit
{
    /// The number in the brackets: [3]. At most AsnTag::MAX_NUMBER. @{
    explicit constexpr AsnImplicit(unsigned int tagNumber) : number(tagNumber) {}
    unsigned int number;
    /// @}
};

/// Marks a component of a sequence that may be absent.
struct AsnOptional
{
};

/// The declaration of one component of a sequence or one alternative of a choice: its name, its tag, where it lives.
///
/// Constant data, one table for each class, which its objects share: declaring costs no memory.
///
///     static constexpr AsnField FIELDS[] = {
///         AsnField::OF<&Stat::m_rxPackets>("rxPackets", AsnImplicit(1)),
///         AsnField::OF<&Stat::m_comment>("comment", AsnImplicit(2), AsnOptional()),
///     };
///     static_assert(AsnField::ARE_DISTINCT(FIELDS));
struct CC_EXPORT AsnField
{
    /// In static memory; what error texts and the notation call it.
    char const* name;
    AsnTag tag; ///< none: the type's own
    /// Whether it may be absent, which only a sequence allows, and how it is reached in the object that it is part of.
    /// @{
    bool isOptional;
    AsnSyntax const& (*get)(AsnSyntax const& owner);
    /// @}

    /// For the member `MEMBER`, a pointer to member: under its type's own tag or a context-specific one, and whether it
    /// may be absent. @{
    template <auto MEMBER>
    static constexpr AsnField OF(char const* name)
    {
        return {name, AsnTag(), false, GET<MEMBER>};
    }
    template <auto MEMBER>
    static constexpr AsnField OF(char const* name, AsnOptional)
    {
        return {name, AsnTag(), true, GET<MEMBER>};
    }
    template <auto MEMBER>
    static constexpr AsnField OF(char const* name, AsnImplicit tag)
    {
        return {name, AsnTag(AsnTag::CONTEXT, tag.number), false, GET<MEMBER>};
    }
    template <auto MEMBER>
    static constexpr AsnField OF(char const* name, AsnImplicit tag, AsnOptional)
    {
        return {name, AsnTag(AsnTag::CONTEXT, tag.number), true, GET<MEMBER>};
    }
    /// @}

    /// Whether no name and no context-specific tag occurs twice. Own tags are the types' and not seen here.
    template <std::size_t SIZE>
    static constexpr bool ARE_DISTINCT(AsnField const (&fields)[SIZE])
    {
        for (std::size_t i = 0; i < SIZE; ++i)
            for (std::size_t j = 0; j < i; ++j)
                if (std::string_view(fields[i].name) == fields[j].name ||
                    (!fields[i].tag.isNone() && fields[i].tag == fields[j].tag))
                    return false;
        return true;
    }

private:
    template <class Owner, class Member>
    static Owner const& DOWN(AsnSyntax const& owner, Member Owner::*)
    {
        return static_cast<Owner const&>(owner);
    }
    template <auto MEMBER>
    static AsnSyntax const& GET(AsnSyntax const& owner)
    {
        return DOWN(owner, MEMBER).*MEMBER;
    }
};
