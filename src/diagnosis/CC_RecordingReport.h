#pragma once

#include "diagnosis/CC_Recording.h"
#include "platform/base/Export.h"
#include "platform/base/InfoContainer.h"

#include <array>
#include <cstdint>
#include <map>
#include <string>
#include <string_view>
#include <vector>

/// What a recording tells, as lines of text or JSON.
///
/// Numbers and names of a leg whose presentation was not allowed (Q.931, octet 3a) at any time of the recording are
/// shown as "(withheld)", and so are those of a leg whose beginning the recording has lost, unless it tells that they
/// were allowed. Characters that would steer a terminal are shown as "\x1b". Throws std::bad_alloc when memory is out.
///
///     CC_RecordingReport const report(CC_Recording::READ_FILE(path));
///     for (std::string const& line : report.getLadder(7))
///         std::puts(line.c_str());
class CC_EXPORT CC_RecordingReport
{
public:
    /// Without line breaks.
    using Lines = std::vector<std::string>;

    /// How numbers and names are shown that were not to be presented.
    enum class Privacy
    {
        MASKED, ///< as "(withheld)"
        WHOLE   ///< as they were signalled
    };

    /// Takes the recording over.
    explicit CC_RecordingReport(CC_Recording recording, Privacy privacy = Privacy::MASKED);

    /// The recording that it tells of.
    CC_Recording const& getRecording() const { return m_recording; }

    /// The exchange between the legs of one call, a column for each: time in milliseconds since the call's first event,
    /// turn of the loop, and what happened at whose leg. Empty for a call that the recording does not know.
    Lines getLadder(std::uint64_t call) const;
    /// The ladders of all calls, in the order of their beginning.
    Lines getLadders() const;
    /// Each value that the property of that leg took: time, turn, value, writer, filter. `propertyName`: long or short.
    /// Empty when there is none.
    Lines getHistory(std::uint64_t leg, std::string_view propertyName) const;
    /// One line a call: serial, numbers, state, age, cause. The first line says what the columns are.
    Lines getCalls() const;
    /// One JSON object an event, `call` 0: of all calls and of none.
    Lines getJson(std::uint64_t call = 0) const;
    /// The same of the events of which `getHistory` tells.
    Lines getHistoryJson(std::uint64_t leg, std::string_view propertyName) const;
    /// One JSON object a call: "call", "state" ("up" or "ended"), "hasBeginning", "age" in nanoseconds, "numbers" (one
    /// a leg, null: unknown), "cause" (once there is one).
    Lines getCallsJson() const;

    /// Adds the lines to a dump, each at that level.
    static InfoContainer& ADD(InfoContainer& info, unsigned int level, Lines const& lines);

private:
    // of each leg that the recording mentions
    struct Leg
    {
        std::string name;
        bool hasBeginning = false;
        // of the number, the second number, those of redirections
        std::array<bool, 3> isWithheld{};
        std::array<bool, 3> isAllowed{};
    };
    class Summary;
    using Numbers = std::map<std::uint64_t, std::string>; // of the legs

    void note(CC_Recording::Event const& event);
    Leg const* find(std::uint64_t leg) const;
    bool isWithheld(std::uint64_t leg, unsigned int propertyId) const;
    std::string nameOf(std::uint64_t leg) const;
    std::string valueOf(CC_Recording::Event const& event, CC_RecordFormat::Brief const& brief) const;
    std::string writerOf(CC_Recording::Event const& event) const;
    std::string changeOf(CC_Recording::Event const& event) const;
    std::string textOf(CC_Recording::Event const& event) const;
    std::string jsonOf(CC_Recording::Event const& event) const;
    std::map<std::uint64_t, Summary> summarise(Numbers& numbers) const;
    std::string timeOf(CC_Recording::Event const& event) const;
    std::vector<std::uint64_t> getCallSerials() const;

    CC_Recording m_recording;
    Privacy m_privacy;
    std::map<std::uint64_t, Leg> m_legs; // by serial number
};
