#pragma once

#include "platform/asn1/AsnClass.h"

#include <new>
#include <vector>

/// A value of any number of elements of one type: the base of AsnSequenceOf.
class CC_EXPORT AsnList : public AsnSyntax
{
public:
    Kind getKind() const override { return Kind::SEQUENCE_OF; }
    AsnTag getTag() const override { return AsnTag(AsnTag::UNIVERSAL, AsnTag::SEQUENCE); }
    /// The number of elements.
    virtual std::size_t getSize() const = 0;
    /// REQUIRES: index < getSize()
    virtual AsnSyntax const& getElement(std::size_t index) const = 0;
    /// Appends an element with its initial value. Null when memory is out; the list is then unchanged.
    virtual AsnSyntax* appendElement() = 0;
    /// An element of the list's type that is in no list, owned by the caller; null when memory is out.
    virtual AsnSyntax* createElement() const = 0;

protected:
    /// Back to no elements.
    virtual void clearElements() = 0;
    bool hasSameValue(AsnSyntax const& same) const override;
    bool encodeContents(AsnEncoder& encoder) const override;
    bool decodeContents(AsnDecoder& decoder, AsnElement const& element) override;
};

/// A SEQUENCE OF type without a name of its own. Order and number of the elements are part of the value.
///
///     AsnSequenceOf<Q956::RecordedUnits> list;
///     Q956::RecordedUnits* const units = list.append();
///     if (units == nullptr)
///         return XCode::NO_ELEMENT;
///     units->m_recordedTypeOfUnits = 2;
template <class T>
class CC_EXPORT AsnSequenceOf : public AsnClass<AsnSequenceOf<T>, AsnList>
{
public:
    /// The number of elements.
    std::size_t getSize() const override { return m_elements.size(); }
    /// REQUIRES, in these three: index < getSize()
    T const& getElement(std::size_t index) const override { return m_elements[index]; }
    /// As `append`.
    AsnSyntax* appendElement() override { return append(); }
    /// An element that is in no list, owned by the caller; null when memory is out.
    AsnSyntax* createElement() const override { return new (std::nothrow) T(); }

    /// As a list is when it was made.
    bool isEmpty() const { return m_elements.empty(); }
    /// The element at that place.
    T const& operator[](std::size_t index) const { return m_elements[index]; }
    /// The same, to be changed.
    T& operator[](std::size_t index) { return m_elements[index]; }
    /// For walks in the order of the elements; appending and clearing end them.
    auto begin() const { return m_elements.begin(); }
    /// Behind the last element.
    auto end() const { return m_elements.end(); }
    /// Appends an element with its initial value. Null when memory is out; the list is then unchanged. The next change
    /// of the list may move the element.
    T* append()
    {
        try
        {
            return &m_elements.emplace_back();
        }
        catch (std::bad_alloc const&)
        {
            return nullptr;
        }
    }
    /// Appends a copy: OK, or NO_ELEMENT when memory is out; the list is then unchanged.
    XCode append(T const& element)
    {
        try
        {
            m_elements.push_back(element);
            return XCode::OK;
        }
        catch (std::bad_alloc const&)
        {
            return XCode::NO_ELEMENT;
        }
    }
    /// Ends the elements; the memory is kept.
    void clear() { m_elements.clear(); }

protected:
    /// As `clear`.
    void clearElements() override { clear(); }

private:
    std::vector<T> m_elements;
};
