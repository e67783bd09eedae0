#include "media/tone/ToneTable.h"

#include <algorithm>
#include <iterator>
#include <toml++/toml.h>
#include <utility>

namespace
{
using ETone = MG_Tones::ECallProgressTone;

struct Named
{
    std::string_view key;
    ETone::Type tone;
};
constexpr Named NAMES[] = {{"dial", ETone::DIAL},
                           {"internal-dial", ETone::INTERNAL_DIAL},
                           {"special-dial", ETone::SPECIAL_DIAL},
                           {"second-dial", ETone::SECOND_DIAL},
                           {"recall-dial", ETone::RECALL_DIAL},
                           {"ringing", ETone::RINGING},
                           {"special-ringing", ETone::SPECIAL_RINGING},
                           {"busy", ETone::BUSY},
                           {"congestion", ETone::CONGESTION},
                           {"special-information", ETone::SPECIAL_INFORMATION},
                           {"intercept", ETone::INTERCEPT},
                           {"number-unobtainable", ETone::NUMBER_UNOBTAINABLE},
                           {"warning", ETone::WARNING},
                           {"record", ETone::RECORD},
                           {"payphone-recognition", ETone::PAYPHONE_RECOGNITION},
                           {"call-waiting", ETone::CALL_WAITING},
                           {"caller-waiting", ETone::CALLER_WAITING},
                           {"confirmation", ETone::CONFIRMATION},
                           {"positive-indication", ETone::POSITIVE_INDICATION},
                           {"negative-indication", ETone::NEGATIVE_INDICATION},
                           {"refusal", ETone::REFUSAL},
                           {"acceptance", ETone::ACCEPTANCE},
                           {"answer", ETone::ANSWER},
                           {"comfort", ETone::COMFORT},
                           {"hold", ETone::HOLD},
                           {"pay", ETone::PAY},
                           {"intrusion", ETone::INTRUSION},
                           {"offering", ETone::OFFERING},
                           {"conference", ETone::CONFERENCE},
                           {"end-of-three-party", ETone::END_OF_THREE_PARTY},
                           {"off-hook-warning", ETone::OFF_HOOK_WARNING},
                           {"permanent-signal", ETone::PERMANENT_SIGNAL},
                           {"line-lock-out", ETone::LINE_LOCK_OUT},
                           {"preemption", ETone::PREEMPTION},
                           {"queue", ETone::QUEUE},
                           {"route", ETone::ROUTE},
                           {"valid", ETone::VALID},
                           {"waiting", ETone::WAITING},
                           {"facilities", ETone::FACILITIES},
                           {"calling-card", ETone::CALLING_CARD},
                           {"end-of-period-warning", ETone::END_OF_PERIOD_WARNING},
                           {"warning-pip", ETone::WARNING_PIP},
                           {"cpe-alerting", ETone::CPE_ALERTING}};

ETone::Type TONE_OF(std::string_view key)
{
    auto const found =
        std::find_if(std::begin(NAMES), std::end(NAMES), [key](Named const& one) { return one.key == key; });
    return found == std::end(NAMES) ? ETone::NONE : found->tone;
}

/// Whether it is an array of pieces.
bool READ(toml::node const& node, Tone& tone)
{
    toml::array const* const pieces = node.as_array();
    if (pieces == nullptr || pieces->empty())
        return false;
    for (toml::node const& piece : *pieces)
    {
        std::string_view const text = piece.value_or(std::string_view());
        if (text == "...")
            tone.again = tone.pieces.size();
        else if (!tone.add(text))
            return false;
    }
    return !tone.pieces.empty();
}
} // namespace

bool ToneTable::read(std::string_view text, std::string const& country, std::string& error)
try
{
    toml::table const file = toml::parse(text);
    toml::table const* const tones = file[country].as_table();
    if (tones == nullptr)
        return error = "no tones of " + country, false;
    std::map<ETone::Type, Tone> read;
    for (auto const& [key, node] : *tones)
    {
        ETone::Type const tone = TONE_OF(key.str());
        if (tone == ETone::NONE || !READ(node, read[tone]))
            return error = country + "." + std::string(key.str()) + " is no tone", false;
    }
    m_tones = std::move(read);
    return true;
}
catch (toml::parse_error const& malformed)
{
    return error = std::string(malformed.description()), false;
}

Tone const* ToneTable::find(ETone::Type tone) const
{
    auto const found = m_tones.find(tone);
    return found == m_tones.end() ? nullptr : &found->second;
}
