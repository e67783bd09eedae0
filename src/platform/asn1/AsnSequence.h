#pragma once

#include "platform/asn1/AsnComposite.h"

/// The base of a SEQUENCE type: components in a fixed order, each under its tag, some of them optional.
///
/// The components are members, which the class declares in its constructor. Optional ones are absent at first.
///
///     // Time.h
///     class Time : public AsnClass<Time, AsnSequence>
///     {
///     public:
///         static constexpr char const* TYPE_NAME = "Time";
///         Time() { declareTime(); }
///         LengthOfTimeUnit m_lengthOfTimeUnit;
///         AsnEnumerated<EScale> m_scale;
///
///     private:
///         void declareTime();
///     };
///
///     // Time.cpp
///     void Time::declareTime()
///     {
///         static constexpr AsnField FIELDS[] = {
///             AsnField::OF<&Time::m_lengthOfTimeUnit>("lengthOfTimeUnit", AsnImplicit(1)),
///             AsnField::OF<&Time::m_scale>("scale", AsnImplicit(2)),
///         };
///         static_assert(AsnField::ARE_DISTINCT(FIELDS));
///         declare(FIELDS);
///     }
class CC_EXPORT AsnSequence : public AsnComposite
{
public:
    Kind getKind() const override { return Kind::SEQUENCE; }
    AsnTag getTag() const override { return AsnTag(AsnTag::UNIVERSAL, AsnTag::SEQUENCE); }
    /// True for every component that is not optional.
    bool isUsed(unsigned int index) const override;
    void use(unsigned int index) override { m_present |= 1U << index; }

    /// True also for a component that is not optional. REQUIRES, as below: `component` is a declared member of this
    /// object.
    bool isPresent(AsnSyntax const& component) const { return isUsed(indexOf(component)); }
    /// Makes an optional component present; its value stays. Returns it.
    template <class Component>
    Component& setPresent(Component& component)
    {
        use(indexOf(component));
        return component;
    }
    /// Makes an optional component absent and resets it.
    void setAbsent(AsnSyntax& component);

protected:
    /// Copied as the whole that it is part of: another class has other components. @{
    AsnSequence() = default;
    AsnSequence(AsnSequence const&) = default;
    AsnSequence(AsnSequence&&) = default;
    AsnSequence& operator=(AsnSequence const&) = default;
    AsnSequence& operator=(AsnSequence&&) = default;
    /// @}

    bool hasSameValue(AsnSyntax const& same) const override;
    bool encodeContents(AsnEncoder& encoder) const override;
    bool decodeContents(AsnDecoder& decoder, AsnElement const& element) override;

private:
    unsigned int m_present = 0; ///< a bit for each optional component
};
