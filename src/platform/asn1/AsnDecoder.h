#pragma once

#include "platform/asn1/AsnTag.h"
#include "platform/asn1/AsnTrace.h"

class AsnSyntax;

/// One element of an encoding: what its header says and where its contents stand. Positions count from the first octet
/// of the whole input, which is octet 0.
struct AsnElement
{
    /// What the identifier octets say. @{
    AsnTag tag;
    bool isConstructed = false;
    /// @}
    std::size_t offset = 0; ///< of the identifier
    std::size_t begin = 0;  ///< of the contents
    std::size_t end = 0;    ///< behind the contents
    std::size_t next = 0;   ///< behind the element; differs from `end` where the length is indefinite
};

/// Reads BER: definite lengths in any form, indefinite lengths, strings in segments. A tag has a single form: numbers
/// below 31 in one octet, others in as few as hold them.
///
/// Made by AsnSyntax::decode; the types call it for their contents. It holds no memory of its own, looks at each octet
/// once for each level of structure around it and refuses what is nested deeper than MAX_DEPTH, so an input costs time
/// and memory in proportion to its size. Every error text ends with the octet at which the input went wrong.
class CC_EXPORT AsnDecoder : public AsnTrace
{
public:
    /// No record comes near it; a constructed string could nest for ever.
    static constexpr unsigned int MAX_DEPTH = 16;

    /// `octets` must outlive the decoder.
    AsnDecoder(unsigned char const* octets, std::size_t length, char const* root, String& error)
        : AsnTrace(root, error), m_octets(octets), m_length(length)
    {
    }

    /// Reads the one element that the whole input must be. False: the error text is set and `value` is whatever was
    /// read so far.
    bool decodeWhole(AsnSyntax& value);

    /// Reads the header of the element at `position` and finds its end, which lies within `end`.
    bool readElement(std::size_t position, std::size_t end, AsnElement& element);
    /// Goes into the contents of a constructed element, unless it is primitive or too deep. Each success is ended by
    /// `close`; after a failure nothing more is decoded.
    bool open(AsnElement const& element);
    /// Comes out of the contents again.
    void close() { --m_depth; }
    /// Whether the element is primitive, as the types without components must be.
    bool expectPrimitive(AsnElement const& element);

    /// The octet at that position of the input, and its address. REQUIRES: it lies within. @{
    unsigned char getOctet(std::size_t position) const { return m_octets[position]; }
    unsigned char const* getOctets(std::size_t position) const { return m_octets + position; }
    /// @}

    /// Fails with the reason followed by the element's tag: "has no place for [3], octet 7".
    bool failWithTag(char const* reason, AsnElement const& element);

private:
    struct Header
    {
        AsnElement element; ///< `end` and `next` are not known yet where the length is indefinite
        bool isIndefinite = false;
    };
    bool readHeader(std::size_t position, std::size_t end, Header& header);
    bool readTag(std::size_t& position, std::size_t end, AsnElement& element);
    bool readLongTagNumber(std::size_t& position, std::size_t end, unsigned int& number);
    bool readLength(std::size_t& position, std::size_t end, std::size_t& length, bool& isIndefinite);
    bool findEndOfContents(std::size_t end, AsnElement& element);

    unsigned char const* m_octets;
    std::size_t m_length;
    unsigned int m_depth = 0;
};
