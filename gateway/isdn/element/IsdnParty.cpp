#include "isdn/element/IsdnParty.h"

#include "adapters/CC_CallAdapterE164.h"
#include "configuration/DialPlan.h"
#include "isdn/element/IsdnProperty.h"
#include "isdn/element/IsdnSubaddress.h"
#include "isdn/element/IsdnText.h"
#include "properties/CC_PropertyKeys.h"

using namespace IsdnProperty;

namespace
{
constexpr std::string_view NUMBER_SIGNS = "0123456789*#";
constexpr int TYPE_SHIFT = 4;
constexpr int PLAN_MASK = 0x0f;
constexpr int TYPE_MASK = 0x07;
constexpr int PRESENTATION_SHIFT = 5;
constexpr int TWO_BITS = 0x03;
constexpr int LATIN_1 = PRI_CHAR_SET_ISO8859_1;

void SET_PLAN(IsdnParty& party, int plan)
{
    party.type = static_cast<QTypeOfNumber>(plan >> TYPE_SHIFT & TYPE_MASK);
    party.plan = static_cast<QNumberingPlan>(plan & PLAN_MASK);
}

int PRESENTATION_OF(IsdnParty const& party)
{
    return (static_cast<int>(party.presentation) & TWO_BITS) << PRESENTATION_SHIFT |
           (static_cast<int>(party.screening) & TWO_BITS);
}

/// The name and number of the stack's structures are arrays that end with a 0.
template <std::size_t SIZE>
void WRITE(std::string_view text, char (&array)[SIZE])
{
    array[text.copy(array, SIZE - 1)] = '\0';
}
} // namespace

IsdnParty IsdnParty::OF(pri_party_id const& id)
{
    IsdnParty party;
    if (id.number.valid != 0)
    {
        party.number = id.number.str;
        SET_PLAN(party, id.number.plan);
        party.presentation =
            static_cast<QPresentationIndicator>(id.number.presentation >> PRESENTATION_SHIFT & TWO_BITS);
        party.screening = static_cast<QScreeningIndicator>(id.number.presentation & TWO_BITS);
    }
    if (id.name.valid != 0)
        party.name = IsdnText::FROM_WIRE(id.name.str);
    party.subaddress = IsdnSubaddress::OF(id.subaddress);
    return party;
}

IsdnParty IsdnParty::OF_CALLED(char const* number, int plan)
{
    IsdnParty party;
    party.number = number;
    if (plan >= 0)
        SET_PLAN(party, plan);
    return party;
}

IsdnParty IsdnParty::normalised(DialPlan const& dialPlan) const
{
    bool const isOfNetwork = plan == QNumberingPlan::ISDN || plan == QNumberingPlan::UNKNOWN;
    bool const isNational = type == QTypeOfNumber::NATIONAL && !dialPlan.country.empty();
    bool const isAsDialled = type == QTypeOfNumber::UNKNOWN;
    if (!isOfNetwork || number.empty() || (!isNational && !isAsDialled))
        return *this;
    IsdnParty const whole = OF_TEXT(isNational ? "+" + dialPlan.country + number : dialPlan.normalise(number));
    if (whole.type != QTypeOfNumber::INTERNATIONAL)
        return *this;
    IsdnParty party = *this;
    party.number = whole.number;
    party.type = whole.type;
    party.plan = whole.plan;
    return party;
}

IsdnParty IsdnParty::OF_PEER(CC_CallAdapterE164 const& adapter)
{
    IsdnParty party;
    party.number = adapter.getPeerE164().view();
    party.type = adapter.getPeerTypeOfNumber();
    party.plan = adapter.getPeerNumberingPlan();
    party.presentation = adapter.getPeerPresentationIndicator(QPresentationIndicator::ALLOWED);
    party.screening = adapter.getPeerScreeningIndicator(QScreeningIndicator::USER_PROVIDED_NOT_SCREENED);
    party.name = adapter.getPeerName().view();
    if (auto const* const text = CC_PropertyString::FROM(adapter.getPeerProperty(IsdnSubaddress::PROPERTY)))
        party.subaddress = text->getValue().view();
    return party;
}

IsdnParty IsdnParty::OF_OFFER(CC_PropertyContainer const& properties)
{
    using namespace CC_PropertyId;
    IsdnParty party;
    party.number = VALUE_OF<CC_PropertyString>(properties.get(E164_NUMBER), E164_NUMBER).view();
    party.type = VALUE_OF<CC_PropertyTypeOfNumber>(properties.get(TYPE_OF_NUMBER), TYPE_OF_NUMBER);
    party.plan = VALUE_OF<CC_PropertyNumberingPlan>(properties.get(NUMBERING_PLAN), NUMBERING_PLAN);
    party.name = VALUE_OF<CC_PropertyString>(properties.get(NAME), NAME).view();
    if (auto const* const text = CC_PropertyString::FROM(properties.get(IsdnSubaddress::PROPERTY)))
        party.subaddress = text->getValue().view();
    return party;
}

std::string IsdnParty::getDigits() const
{
    std::string_view const digits = std::string_view(number).substr(number.starts_with('+') ? 1 : 0);
    bool const isNumber = digits.find_first_not_of(NUMBER_SIGNS) == std::string_view::npos;
    return isNumber && digits.size() <= LONGEST_NUMBER ? std::string(digits) : std::string();
}

int IsdnParty::getPlan() const
{
    bool const isInternational = number.starts_with('+');
    int const wireType = static_cast<int>(isInternational ? QTypeOfNumber::INTERNATIONAL : type);
    int const wirePlan = static_cast<int>(isInternational ? QNumberingPlan::ISDN : plan);
    return (wireType & TYPE_MASK) << TYPE_SHIFT | (wirePlan & PLAN_MASK);
}

pri_party_id IsdnParty::getId() const
{
    pri_party_id id = {};
    std::string const digits = getDigits();
    id.number.valid = !digits.empty() || presentation != QPresentationIndicator::ALLOWED;
    id.number.plan = getPlan();
    id.number.presentation = PRESENTATION_OF(*this);
    WRITE(digits, id.number.str);
    id.name.valid = !name.empty();
    id.name.presentation = PRESENTATION_OF(*this);
    id.name.char_set = LATIN_1;
    WRITE(IsdnText::TO_WIRE(name, LONGEST_NAME), id.name.str);
    id.subaddress = IsdnSubaddress::TO_WIRE(subaddress);
    return id;
}

void IsdnParty::addTo(CC_PropertyContainer& properties) const
{
    using namespace CC_PropertyId;
    ADD_TEXT(properties, E164_NUMBER, number);
    ADD(properties, CC_PropertyTypeOfNumber(TYPE_OF_NUMBER, type));
    ADD(properties, CC_PropertyNumberingPlan(NUMBERING_PLAN, plan));
    ADD(properties, CC_PropertyPresentationIndicator(PRESENTATION_INDICATOR, presentation));
    ADD(properties, CC_PropertyScreeningIndicator(SCREENING_INDICATOR, screening));
    ADD_TEXT(properties, NAME, name);
    if (!subaddress.empty())
        ADD_TEXT(properties, IsdnSubaddress::PROPERTY, subaddress);
}

std::string IsdnParty::getText() const
{
    bool const needsPlus = type == QTypeOfNumber::INTERNATIONAL && !number.empty() && number.front() != '+';
    return (needsPlus ? "+" : "") + number;
}

IsdnParty IsdnParty::OF_TEXT(std::string_view text)
{
    IsdnParty party;
    bool const isInternational = text.starts_with('+');
    party.number = text.substr(isInternational ? 1 : 0);
    if (isInternational)
        party.type = QTypeOfNumber::INTERNATIONAL;
    return party;
}
