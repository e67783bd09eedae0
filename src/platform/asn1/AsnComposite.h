#pragma once

#include "platform/asn1/AsnClass.h"
#include "platform/asn1/AsnField.h"

#include <span>

/// A value with declared components, which are members of the class: the base of AsnSequence and ASN_CHOICE.
class CC_EXPORT AsnComposite : public AsnSyntax
{
public:
    /// The declared components in their order.
    std::span<AsnField const> getFields() const { return {m_fields, m_numberOfFields}; }
    /// At most 32.
    unsigned int getNumberOfFields() const { return m_numberOfFields; }
    /// REQUIRES, in both: index < getNumberOfFields() @{
    AsnSyntax const& getComponent(unsigned int index) const { return m_fields[index].get(*this); }
    AsnSyntax& getComponent(unsigned int index)
    {
        return const_cast<AsnSyntax&>(m_fields[index].get(*this)); // ours, and we are not const
    }
    /// @}
    /// Whether the component has a part in the value: present, or selected.
    virtual bool isUsed(unsigned int index) const = 0;
    /// Gives the component a part in the value, as `AsnSequence::setPresent` and `ASN_CHOICE::select` do.
    virtual void use(unsigned int index) = 0;

protected:
    /// The number of no component.
    static constexpr unsigned int NONE = ~0U;

    /// Called by each constructor of a concrete class with the class's one table.
    template <std::size_t SIZE>
    void declare(AsnField const (&fields)[SIZE])
    {
        static_assert(SIZE <= 32, "presence is kept in as many bits");
        m_fields = fields;
        m_numberOfFields = SIZE;
    }
    /// The number of the component that is this very object. REQUIRES: it is one of ours
    unsigned int indexOf(AsnSyntax const& component) const;
    /// One component for encoder and decoder, under its own tag or its type's. False: the error text is set, which
    /// names it. REQUIRES: index < getNumberOfFields() @{
    bool canFieldBeginWith(unsigned int index, AsnTag tag) const;
    bool encodeField(AsnEncoder& encoder, unsigned int index) const;
    bool decodeField(AsnDecoder& decoder, AsnElement const& element, unsigned int index);
    /// @}

private:
    AsnField const* m_fields = nullptr;
    unsigned int m_numberOfFields = 0;
};
