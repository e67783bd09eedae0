#include "sip/message/SipTariff.h"

#include "sip/message/SipAdvice.h"

#include <algorithm>
#include <iterator>
#include <new>
#include <span>

using namespace SipAdvice;
using Tariff = SipTariff::Tariff;
using Info = Q956::AOCSCurrencyInfo::Info;

namespace
{
constexpr std::size_t DEPTH_OF_ITEM = 4; // aoc, aoc-s, charged-items, the item
constexpr int LAST_CODE = 10;

struct Item
{
    std::string_view name;
    Q956::EChargedItem::Type item;
};
constexpr Item ITEMS[] = {{"basic", Q956::EChargedItem::BASIC_COMMUNICATION},
                          {"communication-attempt", Q956::EChargedItem::CALL_ATTEMPT},
                          {"communication-setup", Q956::EChargedItem::CALL_SETUP},
                          {"services", Q956::EChargedItem::OPERATION_OF_SUPPLEMENTARY_SERV}};

// in the order of Q956::EScale
constexpr std::string_view SCALES[] = {"one-hundredth-second", "one-tenth-second", "one-second",       "ten-seconds",
                                       "one-minute",           "one-hour",         "twenty-four-hours"};
// in the order of Q956::EChargingType
constexpr std::string_view CHARGING_TYPES[] = {"continuous", "step-function"};

// --- reading ---------------------------------------------------------------------------------------------------------

/// What an item's rate says, in which no name is used twice but those of a time.
using Rate = std::span<Element const>;

bool HAS(Rate const& rate, std::string_view name)
{
    return std::any_of(rate.begin(), rate.end(), [&](Element const& one) { return one.getName() == name; });
}

/// Empty: it is not there.
std::string_view TEXT_OF(Rate const& rate, std::string_view name, std::string_view ancestor = "charged-items")
{
    auto const found = std::find_if(rate.begin(), rate.end(),
                                    [&](Element const& one) { return one.getName() == name && one.isBelow(ancestor); });
    return found != rate.end() ? std::string_view(found->text) : std::string_view();
}

template <class Type, std::size_t SIZE>
std::optional<Type> VALUE_OF(std::string_view name, std::string_view const (&names)[SIZE])
{
    auto const* const found = std::find(std::begin(names), std::end(names), name);
    if (found == std::end(names))
        return std::nullopt;
    return static_cast<Type>(found - std::begin(names));
}

bool READ_TIME(Rate const& rate, std::string_view ancestor, Q956::Time& time)
{
    std::optional<int> const length = READ_UNITS(TEXT_OF(rate, "time-unit", ancestor));
    auto const scale = VALUE_OF<Q956::EScale::Type>(TEXT_OF(rate, "scale", ancestor), SCALES);
    if (!length || !scale)
        return false;
    time.m_lengthOfTimeUnit = *length;
    time.m_scale = *scale;
    return true;
}

bool READ_PRICE(Rate const& rate, Q956::Currency& currency, Q956::Amount& amount)
{
    return READ_CURRENCY(TEXT_OF(rate, "currency-id"), currency) &&
           READ_AMOUNT(TEXT_OF(rate, "currency-amount"), amount);
}

bool READ_DURATION(Rate const& rate, Q956::DurationCurrency& duration)
{
    auto const type = VALUE_OF<Q956::EChargingType::Type>(TEXT_OF(rate, "charging-type"), CHARGING_TYPES);
    duration.m_dChargingType = type.value_or(Q956::EChargingType::CONTINUOUS_CHARGING);
    if (HAS(rate, "granularity") && !READ_TIME(rate, "granularity", duration.setPresent(duration.m_dGranularity)))
        return false;
    return READ_PRICE(rate, duration.m_dCurrency, duration.m_dAmount) &&
           READ_TIME(rate, "length-time-unit", duration.m_dTime);
}

/// False: it is none.
bool READ_RATE(Rate const& rate, Info& info)
{
    if (HAS(rate, "price-time"))
    {
        auto& currency = info.select(info.m_specificCurrency);
        return READ_DURATION(rate, currency.select(currency.m_durationCurrency));
    }
    if (HAS(rate, "flat-rate"))
    {
        auto& currency = info.select(info.m_specificCurrency);
        auto& flat = currency.select(currency.m_flatRateCurrency);
        return READ_PRICE(rate, flat.m_fRCurrency, flat.m_fRAmount);
    }
    if (HAS(rate, "special-code"))
    {
        std::optional<int> const code = READ_UNITS(TEXT_OF(rate, "special-code"));
        info.select(info.m_specialChargingCode) = code.value_or(0);
        return code && *code >= 1 && *code <= LAST_CODE;
    }
    if (HAS(rate, "free-charge"))
        info.select(info.m_freeOfCharge);
    else
        info.select(info.m_currencyInfoNotAvailable);
    return true;
}

bool IS_OF_TARIFF(Element const& element, std::size_t depth, std::string_view name)
{
    return element.path.size() == depth && element.path[1] == "aoc-s" && element.getName() == name;
}

/// Each item with what follows until the next one.
bool READ_ITEMS(std::vector<Element> const& elements, Tariff& tariff)
{
    auto& list = tariff.select(tariff.m_currencyInfoList);
    for (auto begin = elements.begin(); begin != elements.end(); ++begin)
    {
        auto const* const item =
            std::find_if(std::begin(ITEMS), std::end(ITEMS),
                         [&](Item const& one) { return IS_OF_TARIFF(*begin, DEPTH_OF_ITEM, one.name); });
        if (item == std::end(ITEMS))
            continue;
        auto const end = std::find_if(begin + 1, elements.end(),
                                      [](Element const& one) { return one.path.size() <= DEPTH_OF_ITEM; });
        Q956::AOCSCurrencyInfo* const entry = list.append();
        if (entry == nullptr)
            throw std::bad_alloc();
        entry->m_chargedItem = item->item;
        if (!READ_RATE({begin + 1, end}, entry->m_aOCSCurrencyInfo))
            return false;
    }
    return true;
}

// --- writing ---------------------------------------------------------------------------------------------------------

template <std::size_t SIZE>
std::string NAME_OF(int value, std::string_view const (&names)[SIZE])
{
    auto const index = static_cast<std::size_t>(value);
    return std::string(index < SIZE ? names[index] : names[0]);
}

std::string TIME_TEXT(char const* name, Q956::Time const& time)
{
    return ELEMENT(name, ELEMENT("time-unit", std::to_string(static_cast<int>(time.m_lengthOfTimeUnit))) +
                             ELEMENT("scale", NAME_OF(static_cast<int>(time.m_scale), SCALES)));
}

std::string DURATION_TEXT(Q956::DurationCurrency const& duration)
{
    std::string text = PRICE_TEXT(duration.m_dCurrency, duration.m_dAmount) +
                       TIME_TEXT("length-time-unit", duration.m_dTime) +
                       ELEMENT("charging-type", NAME_OF(static_cast<int>(duration.m_dChargingType), CHARGING_TYPES));
    if (duration.isPresent(duration.m_dGranularity))
        text += TIME_TEXT("granularity", duration.m_dGranularity);
    return ELEMENT("price-time", text);
}

std::string RATE_TEXT(Info const& info)
{
    auto const& currency = info.m_specificCurrency;
    if (info.isSelected(info.m_freeOfCharge))
        return "<free-charge/>";
    if (info.isSelected(info.m_specialChargingCode))
        return ELEMENT("special-code", std::to_string(static_cast<int>(info.m_specialChargingCode)));
    if (info.isSelected(currency) && currency.isSelected(currency.m_durationCurrency))
        return DURATION_TEXT(currency.m_durationCurrency);
    if (info.isSelected(currency) && currency.isSelected(currency.m_flatRateCurrency))
        return ELEMENT("flat-rate",
                       PRICE_TEXT(currency.m_flatRateCurrency.m_fRCurrency, currency.m_flatRateCurrency.m_fRAmount));
    return "<not-available/>";
}
} // namespace

std::optional<Tariff> SipTariff::READ(std::string_view body)
{
    std::vector<Element> const elements = SipAdvice::READ(body);
    Tariff tariff;
    for (Element const& element : elements)
    {
        if (IS_OF_TARIFF(element, 3, "charged-items"))
            return READ_ITEMS(elements, tariff) ? std::optional(tariff) : std::nullopt;
        if (!IS_OF_TARIFF(element, 3, "special-arrangement"))
            continue;
        std::optional<int> const number = READ_UNITS(element.text);
        if (!number)
            return std::nullopt;
        tariff.select(tariff.m_specialArrInfo) = *number;
        return tariff;
    }
    return std::nullopt;
}

std::string SipTariff::WRITE(Tariff const& tariff)
{
    if (tariff.isSelected(tariff.m_specialArrInfo))
        return SipAdvice::WRITE(ELEMENT(
            "aoc-s", ELEMENT("special-arrangement", std::to_string(static_cast<int>(tariff.m_specialArrInfo)))));
    std::string items;
    if (tariff.isSelected(tariff.m_currencyInfoList))
        for (Item const& item : ITEMS) // in the order of the schema
            for (Q956::AOCSCurrencyInfo const& entry : tariff.m_currencyInfoList)
                if (entry.m_chargedItem == item.item)
                {
                    items += ELEMENT(item.name, RATE_TEXT(entry.m_aOCSCurrencyInfo));
                    break; // each once
                }
    return SipAdvice::WRITE(
        ELEMENT("aoc-s", ELEMENT("charged-items", items.empty() ? "<basic><not-available/></basic>" : items)));
}
