#pragma once

#include "platform/asn1/AsnComposite.h"

/// The base of a CHOICE type: alternatives, of which one is selected, or none as yet. Without a selection there is
/// nothing to encode, and only another choice without one is equal.
///
/// The alternatives are members, which the class declares in its constructor as AsnSequence shows.
///
///     CC_QoS::MediaInfo media;
///     media.select(media.m_rtp).m_codecChanges = 2;
///     if (media.isSelected(media.m_rtp))
///         ...
class CC_EXPORT ASN_CHOICE : public AsnComposite
{
public:
    Kind getKind() const override { return Kind::CHOICE; }
    AsnTag getTag() const override { return AsnTag(); }
    bool isUsed(unsigned int index) const override { return index == m_selected; }
    void use(unsigned int index) override;

    /// False: the value has no encoding.
    bool hasSelection() const { return m_selected != NONE; }
    /// REQUIRES, as below: `alternative` is a declared member of this object.
    bool isSelected(AsnSyntax const& alternative) const { return isUsed(indexOf(alternative)); }
    /// Selects the alternative, whose value stays, and resets another that was selected before. Returns it.
    template <class Alternative>
    Alternative& select(Alternative& alternative)
    {
        use(indexOf(alternative));
        return alternative;
    }
    /// Selects nothing and resets what was selected.
    void selectNothing();

    bool encodeAs(AsnEncoder& encoder, AsnTag tag) const override;
    bool canBeginWith(AsnTag tag) const override { return alternativeWith(tag) != NONE; }
    bool decodeAs(AsnDecoder& decoder, AsnElement const& element, bool isTagged) override;

protected:
    /// Copied as the whole that it is part of: another class has other components. @{
    ASN_CHOICE() = default;
    ASN_CHOICE(ASN_CHOICE const&) = default;
    ASN_CHOICE(ASN_CHOICE&&) = default;
    ASN_CHOICE& operator=(ASN_CHOICE const&) = default;
    ASN_CHOICE& operator=(ASN_CHOICE&&) = default;
    /// @}

    bool hasSameValue(AsnSyntax const& same) const override;
    bool encodeContents(AsnEncoder& encoder) const override;
    bool decodeContents(AsnDecoder& decoder, AsnElement const& element) override;

private:
    /// The number of the alternative that an element with that tag is, or NONE.
    unsigned int alternativeWith(AsnTag tag) const;

    unsigned int m_selected = NONE;
};
