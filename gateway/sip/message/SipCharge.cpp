#include "sip/message/SipCharge.h"

#include "sip/message/SipProperty.h"

#include <expat.h>

#include <algorithm>
#include <iterator>
#include <memory>
#include <new>
#include <strings.h>
#include <type_traits>
#include <vector>

using Charge = SipCharge::Charge;

namespace
{
constexpr char const* NAMESPACE = "http://uri.etsi.org/ngn/params/xml/simservs/aoc";
constexpr char SEPARATOR = '|'; // between a namespace and a name
constexpr std::size_t DEEPEST_ELEMENT = 16;
constexpr std::size_t LONGEST_TEXT = 64;
constexpr std::size_t LONGEST_CURRENCY = 10;
constexpr unsigned long long LARGEST = 16777215;
constexpr std::size_t MOST_DECIMALS = 3;
constexpr char const* UNITS = "UNIT";

// in the order of Q956::EAOCEBillingId
constexpr std::string_view BILLING_IDS[] = {
    "normal-charging", "reverse-charging", "credit-card", "cfu", "cfb", "cfnr", "cd", "ect"};

/// What the elements of the body say, by their paths.
struct Told
{
    bool isAoc = false;
    bool isFinal = false;
    bool hasCharge = false;
    bool isTotal = false;
    bool isFree = false;
    bool isNotAvailable = false;
    std::string currency;
    std::string amount;
    std::string billingId;
};

/// An expat parser's callbacks. Nothing is thrown through the parser; it is stopped instead.
class Reader
{
public:
    explicit Reader(XML_Parser parser) : m_parser(parser)
    {
        XML_SetUserData(parser, this);
        XML_SetElementHandler(parser, BEGIN, END);
        XML_SetCharacterDataHandler(parser, TEXT);
        XML_SetStartDoctypeDeclHandler(parser, DOCTYPE); // no entities of the sender's
    }

    bool isOutOfMemory() const { return m_isOutOfMemory; }
    Told const& getTold() const { return m_told; }

private:
    static void XMLCALL BEGIN(void* reader, XML_Char const* name, XML_Char const**)
    {
        static_cast<Reader*>(reader)->guard([&](Reader& self) { self.begin(name); });
    }
    static void XMLCALL END(void* reader, XML_Char const*)
    {
        static_cast<Reader*>(reader)->guard([&](Reader& self) { self.end(); });
    }
    static void XMLCALL TEXT(void* reader, XML_Char const* text, int length)
    {
        static_cast<Reader*>(reader)->guard([&](Reader& self) { self.add({text, static_cast<std::size_t>(length)}); });
    }
    static void XMLCALL DOCTYPE(void* reader, XML_Char const*, XML_Char const*, XML_Char const*, int)
    {
        static_cast<Reader*>(reader)->stop();
    }

    template <class Work>
    void guard(Work const& work)
    {
        try
        {
            work(*this);
        }
        catch (std::bad_alloc const&)
        {
            m_isOutOfMemory = true;
            stop();
        }
    }
    void stop() { XML_StopParser(m_parser, XML_FALSE); }

    void begin(std::string_view name)
    {
        if (m_path.size() == DEEPEST_ELEMENT)
        {
            stop();
            return;
        }
        std::string const prefix = std::string(NAMESPACE) + SEPARATOR;
        m_path.emplace_back(name.starts_with(prefix) ? name.substr(prefix.size()) : "?");
        m_text.clear();
        m_told.isAoc = m_told.isAoc || (m_path.size() == 1 && m_path[0] == "aoc");
        m_told.isFinal = m_told.isFinal || isAt("aoc-e");
        m_told.hasCharge = m_told.hasCharge || isAt("recorded-charges");
        m_told.isFree = m_told.isFree || isAt("free-charge");
        m_told.isNotAvailable = m_told.isNotAvailable || isAt("not-available");
    }
    void end()
    {
        if (isAt("currency-id"))
            m_told.currency = getText();
        else if (isAt("currency-amount"))
            m_told.amount = getText();
        else if (isAt("billing-id"))
            m_told.billingId = getText();
        else if (isAt("charging-info"))
            m_told.isTotal = getText() == "total";
        m_path.pop_back();
        m_text.clear();
    }
    void add(std::string_view text)
    {
        m_text += text;
        if (m_text.size() > LONGEST_TEXT)
            m_text.erase(LONGEST_TEXT);
    }

    std::string getText() const
    {
        constexpr char const* BLANKS = " \t\r\n";
        std::size_t const first = m_text.find_first_not_of(BLANKS);
        return first == std::string::npos ? "" : m_text.substr(first, m_text.find_last_not_of(BLANKS) + 1 - first);
    }
    /// Below aoc-d or aoc-e, where the names are not used twice.
    bool isAt(std::string_view name) const
    {
        bool const isCharge =
            m_path.size() >= 2 && m_path[0] == "aoc" && (m_path[1] == "aoc-d" || m_path[1] == "aoc-e");
        return isCharge && m_path.back() == name;
    }

    XML_Parser m_parser;
    std::vector<std::string> m_path;
    std::string m_text;
    Told m_told;
    bool m_isOutOfMemory = false;
};

/// A value, and how many decimals it has.
struct Decimal
{
    unsigned long long value = 0;
    int decimals = 0;
};

std::optional<Decimal> DECIMAL_OF(std::string_view text)
{
    std::size_t const point = std::min(text.find('.'), text.size());
    std::string_view const whole = text.substr(0, point);
    std::string_view const fraction = text.substr(std::min(point + 1, text.size()));
    bool const isNumber = text.find_first_not_of("0123456789.") == std::string_view::npos &&
                          fraction.find('.') == std::string_view::npos && !(whole.empty() && fraction.empty());
    if (!isNumber || whole.size() > 12) // beyond any multiplier
        return std::nullopt;
    Decimal decimal;
    for (char const c : std::string(whole) + std::string(fraction.substr(0, MOST_DECIMALS)))
        decimal.value = 10 * decimal.value + static_cast<unsigned long long>(c - '0');
    decimal.decimals = static_cast<int>(std::min(fraction.size(), MOST_DECIMALS));
    if (fraction.size() > MOST_DECIMALS && fraction[MOST_DECIMALS] >= '5')
        ++decimal.value;
    for (; decimal.value > LARGEST; --decimal.decimals)
        decimal.value = (decimal.value + 5) / 10;
    return decimal;
}

/// The multipliers go from a thousandth up to a thousand.
std::optional<Q956::EMultiplier::Type> MULTIPLIER_OF(Decimal const& decimal)
{
    int const multiplier = Q956::EMultiplier::ONE - decimal.decimals;
    if (multiplier > Q956::EMultiplier::THOUSAND)
        return std::nullopt;
    return static_cast<Q956::EMultiplier::Type>(multiplier);
}

/// Of IA5, without its control characters.
bool IS_PRINTABLE(char c) { return c >= ' ' && c < '\x7f'; }

bool READ_AMOUNT(Told const& told, Charge::Specific::Recorded& recorded)
{
    std::optional<Decimal> const amount = DECIMAL_OF(told.amount);
    std::optional<Q956::EMultiplier::Type> const multiplier = amount ? MULTIPLIER_OF(*amount) : std::nullopt;
    if (!multiplier)
        return false;
    if (told.currency != UNITS)
    {
        auto& currency = recorded.select(recorded.m_currency);
        currency.m_rCurrency = SipProperty::STRING(told.currency);
        currency.m_rAmount.m_currencyAmount = static_cast<int>(amount->value);
        currency.m_rAmount.m_multiplier = *multiplier;
        return !told.currency.empty() && told.currency.size() <= LONGEST_CURRENCY &&
               std::all_of(told.currency.begin(), told.currency.end(), IS_PRINTABLE);
    }
    Q956::RecordedUnits* const units = recorded.select(recorded.m_unitsList).append();
    if (units == nullptr)
        throw std::bad_alloc();
    units->m_recordedNumber.select(units->m_recordedNumber.m_recordedNumberOfUnits) = static_cast<int>(amount->value);
    return amount->decimals == 0; // nobody charges half a unit
}

std::optional<Charge> CHARGE_OF(Told const& told)
{
    Charge charge;
    if (!told.isAoc || !told.hasCharge)
        return std::nullopt;
    if (told.isFree)
        return charge.select(charge.m_freeOfCharge), charge;
    if (told.isNotAvailable)
        return charge.select(charge.m_chargeNotAvailable), charge;
    Charge::Specific& specific = charge.select(charge.m_specific);
    specific.m_typeOfChargingInfo =
        told.isFinal || told.isTotal ? Q956::ETypeOfChargingInfo::TOTAL : Q956::ETypeOfChargingInfo::SUB_TOTAL;
    auto const* const id = std::find(std::begin(BILLING_IDS), std::end(BILLING_IDS), told.billingId);
    if (id != std::end(BILLING_IDS))
        specific.setPresent(specific.m_billingId) =
            static_cast<Q956::EAOCEBillingId::Type>(id - std::begin(BILLING_IDS));
    if (!READ_AMOUNT(told, specific.m_recorded))
        return std::nullopt;
    return charge;
}

// --- writing ---------------------------------------------------------------------------------------------------------

std::string ELEMENT(char const* name, std::string const& content)
{
    return std::string("<") + name + ">" + content + "</" + name + ">";
}

std::string ESCAPE(std::string_view text)
{
    std::string escaped;
    for (char const c : text)
        if (c == '<' || c == '&' || c == '>')
            escaped += c == '<' ? "&lt;" : c == '&' ? "&amp;" : "&gt;";
        else if (IS_PRINTABLE(c))
            escaped += c;
    return escaped;
}

std::string AMOUNT_TEXT(Q956::Amount const& amount)
{
    std::string text = std::to_string(static_cast<int>(amount.m_currencyAmount));
    int const decimals =
        Q956::EMultiplier::ONE - static_cast<int>(static_cast<Q956::EMultiplier::Type>(amount.m_multiplier));
    if (decimals <= 0)
        return text == "0" ? text : text + std::string(static_cast<std::size_t>(std::min(-decimals, 3)), '0');
    auto const count = static_cast<std::size_t>(decimals);
    if (text.size() <= count)
        text.insert(0, count + 1 - text.size(), '0');
    return text.insert(text.size() - count, 1, '.');
}

/// In money or in units; empty: not known.
std::string RECORDED_TEXT(Charge::Specific::Recorded const& recorded)
{
    if (recorded.isSelected(recorded.m_currency))
        return ELEMENT("currency-id", ESCAPE(recorded.m_currency.m_rCurrency.get().view())) +
               ELEMENT("currency-amount", AMOUNT_TEXT(recorded.m_currency.m_rAmount));
    unsigned long long sum = 0;
    bool isKnown = false;
    if (recorded.isSelected(recorded.m_unitsList))
        for (Q956::RecordedUnits const& units : recorded.m_unitsList)
            if (auto const& number = units.m_recordedNumber; number.isSelected(number.m_recordedNumberOfUnits))
            {
                sum += static_cast<unsigned int>(static_cast<int>(number.m_recordedNumberOfUnits));
                isKnown = true;
            }
    return isKnown ? ELEMENT("currency-id", UNITS) + ELEMENT("currency-amount", std::to_string(sum)) : "";
}

std::string CHARGES_TEXT(Charge const& charge)
{
    if (charge.isSelected(charge.m_freeOfCharge))
        return "<free-charge/>";
    std::string const recorded =
        charge.isSelected(charge.m_specific) ? RECORDED_TEXT(charge.m_specific.m_recorded) : std::string();
    return recorded.empty() ? "<not-available/>" : ELEMENT("recorded-currency-units", recorded);
}

std::string BILLING_TEXT(Charge const& charge)
{
    if (!charge.isSelected(charge.m_specific) || !charge.m_specific.isPresent(charge.m_specific.m_billingId))
        return {};
    auto const id = static_cast<std::size_t>(static_cast<int>(charge.m_specific.m_billingId));
    return id < std::size(BILLING_IDS) ? ELEMENT("billing-id", std::string(BILLING_IDS[id])) : std::string();
}
} // namespace

bool SipCharge::IS_TYPE(std::string_view contentType)
{
    std::string const type(contentType.substr(0, contentType.find_first_of("; \t")));
    return strcasecmp(type.c_str(), TYPE) == 0;
}

std::optional<Charge> SipCharge::READ(std::string_view body)
{
    std::unique_ptr<std::remove_pointer_t<XML_Parser>, void (*)(XML_Parser)> const parser(
        XML_ParserCreateNS(nullptr, SEPARATOR), XML_ParserFree);
    if (parser == nullptr)
        throw std::bad_alloc();
    Reader const reader(parser.get());
    bool const isXml = XML_Parse(parser.get(), body.data(), static_cast<int>(body.size()), XML_TRUE) == XML_STATUS_OK;
    if (reader.isOutOfMemory() || XML_GetErrorCode(parser.get()) == XML_ERROR_NO_MEMORY)
        throw std::bad_alloc();
    return isXml ? CHARGE_OF(reader.getTold()) : std::nullopt;
}

bool SipCharge::IS_TOTAL(Charge const& charge)
{
    return charge.isSelected(charge.m_specific) &&
           charge.m_specific.m_typeOfChargingInfo == Q956::ETypeOfChargingInfo::TOTAL;
}

std::string SipCharge::WRITE(Charge const& charge)
{
    bool const isTotal = IS_TOTAL(charge);
    std::string const charges = ELEMENT("recorded-charges", CHARGES_TEXT(charge)) + BILLING_TEXT(charge);
    std::string const advice =
        isTotal ? ELEMENT("aoc-e", charges) : ELEMENT("aoc-d", ELEMENT("charging-info", "subtotal") + charges);
    return std::string(R"(<?xml version="1.0" encoding="UTF-8"?><aoc xmlns=")") + NAMESPACE + "\">" + advice + "</aoc>";
}
