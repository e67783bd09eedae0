// Decodes whatever it is given as each of the three records. What is accepted must encode, and its encoding must decode
// to the same value and encode to itself again. What is refused must leave the value as it was and say where.

#include "properties/CC_PropertyCharge.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyQoS.h"
#include "properties/CC_PropertyTariff.h"

#include <cstdint>
#include <cstdio>
#include <cstdlib>

namespace
{
void REQUIRE(bool isTrue, char const* what)
{
    if (isTrue)
        return;
    std::fprintf(stderr, "not so: %s\n", what);
    std::abort();
}

template <class Property, class Record>
void TRY(unsigned char const* octets, std::size_t length)
{
    Record record;
    String error;
    if (!record.decode(octets, length, error).isOk())
    {
        REQUIRE(record == Record(), "a refused input changes nothing");
        REQUIRE(error.view().find("octet ") != std::string_view::npos, "the text says which octet");
        return;
    }
    AsnOctets encoded;
    REQUIRE(record.encode(encoded, error).isOk(), "what is accepted encodes");
    REQUIRE(encoded.getSize() <= length, "no encoding is shorter than ours");
    Record again;
    REQUIRE(again.decode(&encoded[0], encoded.getSize(), error).isOk(), "our encoding is accepted");
    REQUIRE(again == record, "our encoding holds the same value");
    AsnOctets encodedAgain;
    REQUIRE(again.encode(encodedAgain, error).isOk() && encodedAgain == encoded, "there is one encoding of a value");
    String text;
    Property(CC_PropertyId::CHARGE, record).getValueString(text);
}
} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* octets, std::size_t length)
{
    TRY<CC_PropertyCharge, CC_PropertyCharge::Charge>(octets, length);
    TRY<CC_PropertyTariff, CC_PropertyTariff::Tariff>(octets, length);
    TRY<CC_PropertyQoS, CC_QoS>(octets, length);
    return 0;
}
