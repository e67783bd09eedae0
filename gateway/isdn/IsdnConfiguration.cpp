#include "isdn/IsdnConfiguration.h"

#include "configuration/ConfigurationSection.h"
#include "isdn/line/IsdnLine.h"

#include <sys/un.h>

namespace
{
constexpr unsigned int LONGEST = 3600000; // milliseconds

/// "1-15", "17", ...: the B channels in service.
void READ_CHANNELS(ConfigurationSection const& section, IsdnConfiguration& line)
{
    if (!section.has("channels"))
        return;
    line.channels.reset();
    for (std::string const& text : section.texts("channels", {}))
    {
        std::size_t const dash = text.find('-');
        std::string const first = text.substr(0, dash);
        std::string const last = dash == std::string::npos ? first : text.substr(dash + 1);
        for (std::string const* const number : {&first, &last})
            if (number->empty() || number->size() > 2 || number->find_first_not_of("0123456789") != std::string::npos)
                section.refuse("channels", "'" + text + "' is neither a timeslot nor a range of them");
        for (auto slot = static_cast<unsigned int>(std::stoi(first));
             slot <= static_cast<unsigned int>(std::stoi(last)); ++slot)
            if (slot == 0 || slot > IsdnLine::LAST_TIMESLOT)
                section.refuse("channels", "has timeslots from 1 to 31");
            else if (slot != IsdnLine::D_TIMESLOT)
                line.channels.set(slot);
    }
    if (line.channels.none())
        section.refuse("channels", "must have a B channel");
}

void READ_TIMERS(ConfigurationSection const& section, IsdnTimers& timers)
{
    section.allow(
        {"t200", "t203", "t302", "t303", "t304", "t305", "t308", "t309", "t310", "t313", "answer", "reopening"});
    auto const read = [&](char const* key, unsigned int& timer)
    { timer = section.number(key, timer, timer == 0 ? 0 : 1, LONGEST); };
    read("t200", timers.t200);
    read("t203", timers.t203);
    read("t302", timers.t302);
    read("t303", timers.t303);
    read("t304", timers.t304);
    read("t305", timers.t305);
    read("t308", timers.t308);
    read("t309", timers.t309);
    read("t310", timers.t310);
    read("t313", timers.t313);
    read("answer", timers.answer);
    read("reopening", timers.reopening);
}
} // namespace

IsdnConfiguration IsdnConfiguration::READ(ConfigurationSection const& section)
{
    section.allow({"name", "line", "side", "channels", "overlap-sending", "overlap-receiving", "digits", "failure-tone",
                   "timers"});
    IsdnConfiguration line;
    line.name = section.neededText("name");
    line.line = section.neededText("line");
    if (line.line.size() >= sizeof sockaddr_un::sun_path)
        section.refuse("line", "is too long for the path of a socket");
    line.isNetwork = section.oneOf("side", "user", {"user", "network"}) == "network";
    line.isOverlapSending = section.oneOf("overlap-sending", "on", {"on", "off"}) == "on";
    std::string const receiving = section.oneOf("overlap-receiving", "collect", {"collect", "hand-on", "off"});
    line.isOverlapReceiving = receiving != "off";
    line.collects = receiving == "collect";
    line.digits = section.oneOf("digits", "keypad", {"keypad", "sound"}) == "keypad" ? Digits::KEYPAD : Digits::SOUND;
    line.failureTone = section.number("failure-tone", line.failureTone, 0, 60);
    READ_CHANNELS(section, line);
    READ_TIMERS(section.section("timers"), line.timers);
    return line;
}
