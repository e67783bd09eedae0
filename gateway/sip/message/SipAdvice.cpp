#include "sip/message/SipAdvice.h"

#include "sip/message/SipProperty.h"

#include <expat.h>

#include <algorithm>
#include <memory>
#include <new>
#include <strings.h>
#include <type_traits>

namespace
{
constexpr char SEPARATOR = '|'; // between a namespace and a name
constexpr std::size_t DEEPEST_ELEMENT = 16;
constexpr std::size_t MOST_ELEMENTS = 1000;
constexpr std::size_t LONGEST_TEXT = 64;
constexpr std::size_t LONGEST_CURRENCY = 10;
constexpr unsigned long long LARGEST = 16777215;
constexpr std::size_t MOST_DECIMALS = 3;

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
    std::vector<SipAdvice::Element> take() { return std::move(m_elements); }

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
        if (m_path.size() == DEEPEST_ELEMENT || m_elements.size() == MOST_ELEMENTS)
        {
            stop();
            return;
        }
        std::string const prefix = std::string(SipAdvice::NAMESPACE) + SEPARATOR;
        m_path.emplace_back(name.starts_with(prefix) ? name.substr(prefix.size()) : "?");
        m_open.push_back(m_elements.size());
        m_elements.push_back({m_path, {}});
    }
    void end()
    {
        std::string& text = m_elements[m_open.back()].text;
        constexpr char const* BLANKS = " \t\r\n";
        std::size_t const first = text.find_first_not_of(BLANKS);
        text = first == std::string::npos ? "" : text.substr(first, text.find_last_not_of(BLANKS) + 1 - first);
        m_path.pop_back();
        m_open.pop_back();
    }
    void add(std::string_view text)
    {
        std::string& all = m_elements[m_open.back()].text;
        all += text.substr(0, LONGEST_TEXT - std::min(all.size(), LONGEST_TEXT));
    }

    XML_Parser m_parser;
    std::vector<std::string> m_path;
    std::vector<std::size_t> m_open; // of the path, among the elements
    std::vector<SipAdvice::Element> m_elements;
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

} // namespace

bool SipAdvice::Element::isBelow(std::string_view ancestor) const
{
    return !path.empty() && std::find(path.begin(), path.end() - 1, ancestor) != path.end() - 1;
}

bool SipAdvice::IS_TYPE(std::string_view contentType)
{
    std::string const type(contentType.substr(0, contentType.find_first_of("; \t")));
    return strcasecmp(type.c_str(), TYPE) == 0;
}

std::vector<SipAdvice::Element> SipAdvice::READ(std::string_view body)
{
    std::unique_ptr<std::remove_pointer_t<XML_Parser>, void (*)(XML_Parser)> const parser(
        XML_ParserCreateNS(nullptr, SEPARATOR), XML_ParserFree);
    if (parser == nullptr)
        throw std::bad_alloc();
    Reader reader(parser.get());
    bool const isXml = XML_Parse(parser.get(), body.data(), static_cast<int>(body.size()), XML_TRUE) == XML_STATUS_OK;
    if (reader.isOutOfMemory() || XML_GetErrorCode(parser.get()) == XML_ERROR_NO_MEMORY)
        throw std::bad_alloc();
    std::vector<Element> elements = isXml ? reader.take() : std::vector<Element>();
    if (!elements.empty() && elements.front().path.front() != "aoc")
        elements.clear();
    return elements;
}

std::string SipAdvice::WRITE(std::string const& advice)
{
    return std::string(R"(<?xml version="1.0" encoding="UTF-8"?><aoc xmlns=")") + NAMESPACE + "\">" + advice + "</aoc>";
}

std::optional<int> SipAdvice::READ_UNITS(std::string_view text)
{
    std::optional<Decimal> const number = DECIMAL_OF(text);
    if (!number || number->decimals != 0)
        return std::nullopt;
    return static_cast<int>(number->value);
}

bool SipAdvice::READ_AMOUNT(std::string_view text, Q956::Amount& amount)
{
    std::optional<Decimal> const decimal = DECIMAL_OF(text);
    std::optional<Q956::EMultiplier::Type> const multiplier = decimal ? MULTIPLIER_OF(*decimal) : std::nullopt;
    if (!multiplier)
        return false;
    amount.m_currencyAmount = static_cast<int>(decimal->value);
    amount.m_multiplier = *multiplier;
    return true;
}

bool SipAdvice::READ_CURRENCY(std::string_view text, Q956::Currency& currency)
{
    currency = SipProperty::STRING(std::string(text));
    return !text.empty() && text.size() <= LONGEST_CURRENCY && std::all_of(text.begin(), text.end(), IS_PRINTABLE);
}

std::string SipAdvice::ELEMENT(std::string_view name, std::string const& content)
{
    return std::string("<").append(name) + ">" + content + "</" + std::string(name) + ">";
}

std::string SipAdvice::ESCAPE(std::string_view text)
{
    std::string escaped;
    for (char const c : text)
        if (c == '<' || c == '&' || c == '>')
            escaped += c == '<' ? "&lt;" : c == '&' ? "&amp;" : "&gt;";
        else if (IS_PRINTABLE(c))
            escaped += c;
    return escaped;
}

std::string SipAdvice::AMOUNT_TEXT(Q956::Amount const& amount)
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

std::string SipAdvice::PRICE_TEXT(Q956::Currency const& currency, Q956::Amount const& amount)
{
    return ELEMENT("currency-id", ESCAPE(currency.get().view())) + ELEMENT("currency-amount", AMOUNT_TEXT(amount));
}
