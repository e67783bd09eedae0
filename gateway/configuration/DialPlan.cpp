#include "configuration/DialPlan.h"

#include "configuration/ConfigurationSection.h"

namespace
{
constexpr std::size_t LONGEST_PREFIX = 8;

std::string READ_DIGITS(ConfigurationSection const& section, char const* key)
{
    std::string digits = section.text(key, {});
    if (digits.size() > LONGEST_PREFIX || digits.find_first_not_of("0123456789") != std::string::npos)
        section.refuse(key, "must be digits, " + std::to_string(LONGEST_PREFIX) + " at most");
    return digits;
}

bool HAS_PREFIX(std::string_view number, std::string_view prefix)
{
    return !prefix.empty() && number.starts_with(prefix) && number.size() > prefix.size();
}

bool IS_BEGINNING(std::string_view number, std::string_view prefix)
{
    return prefix.size() >= number.size() && prefix.starts_with(number);
}
} // namespace

DialPlan DialPlan::READ(ConfigurationSection const& section)
{
    DialPlan plan{READ_DIGITS(section, "international-prefix"), READ_DIGITS(section, "national-prefix"),
                  READ_DIGITS(section, "country-code")};
    if (!plan.national.empty() && plan.national == plan.international)
        section.refuse("national-prefix", "is the international one");
    if (!plan.country.empty() && plan.national.empty())
        section.refuse("country-code", "is of no use without national-prefix");
    return plan;
}

/// The longer prefix first: one most often begins with the other.
std::string DialPlan::normalise(std::string_view number) const
{
    bool const isInternational = HAS_PREFIX(number, international);
    bool const isNational = !country.empty() && HAS_PREFIX(number, national);
    if (isInternational && !(isNational && national.size() > international.size()))
        return std::string("+").append(number.substr(international.size()));
    if (isNational)
        return std::string("+").append(country).append(number.substr(national.size()));
    return std::string(number);
}

bool DialPlan::isBeginning(std::string_view number) const
{
    return IS_BEGINNING(number, international) || IS_BEGINNING(number, national);
}
