#pragma once

#include "platform/base/TYTime.h"

#include <cstdio>
#include <map>
#include <memory>
#include <string>
#include <vector>

/// Ladders of the first calls: what each side's module received, sent, was told and did, with the time since the
/// INVITE. A call's ladder is printed when the last of its two sides has let go of it.
///
///     std::shared_ptr<CallTrace::Ladder> const ladder = trace.begin(1, "a", "b");
///     if (ladder)
///         ladder->add(CallTrace::LEFT, "<- INVITE");
class CallTrace
{
public:
    /// The calling side stands left, the called side right.
    enum Column : unsigned int
    {
        LEFT = 0,
        RIGHT = 1
    };

    class Ladder
    {
    public:
        Ladder(std::FILE* stream, unsigned int callNumber, std::string left, std::string right);
        ~Ladder(); ///< prints
        Ladder(Ladder const&) = delete;
        Ladder& operator=(Ladder const&) = delete;

        void add(Column column, std::string text);

    private:
        struct Line
        {
            double milliseconds;
            Column column;
            std::string text;
        };

        std::FILE* m_stream;
        unsigned int m_callNumber;
        std::string m_left;
        std::string m_right;
        TY::Time m_start;
        std::vector<Line> m_lines;
    };

    /// Traces that many calls; does not own the stream.
    explicit CallTrace(unsigned int calls, std::FILE* stream = stdout) : m_left(calls), m_stream(stream) {}

    /// The ladder of a call that begins now, null when enough calls were traced.
    std::shared_ptr<Ladder> begin(unsigned int callNumber, std::string left, std::string right);
    /// That of a call that is up; null when it is not traced.
    std::shared_ptr<Ladder> find(unsigned int callNumber) const;

private:
    unsigned int m_left;
    std::FILE* m_stream;
    std::map<unsigned int, std::weak_ptr<Ladder>> m_ladders;
};
