#include "host/CallTrace.h"

#include <utility>

namespace
{
constexpr int COLUMN_WIDTH = 66;
}

CallTrace::Ladder::Ladder(std::FILE* stream, unsigned int callNumber, std::string left, std::string right)
    : m_stream(stream)
    , m_callNumber(callNumber)
    , m_left(std::move(left))
    , m_right(std::move(right))
    , m_start(TY::Time::NOW(TY::Time::MONOTONIC))
{
}

CallTrace::Ladder::~Ladder()
{
    std::fprintf(m_stream, "call %u, in on interface %s and out on interface %s\n", m_callNumber, m_left.c_str(),
                 m_right.c_str());
    std::fprintf(m_stream, "%10s  %-*s %s\n", "ms", COLUMN_WIDTH, m_left.c_str(), m_right.c_str());
    for (Line const& line : m_lines)
        if (line.column == LEFT)
            std::fprintf(m_stream, "%10.3f  %s\n", line.milliseconds, line.text.c_str());
        else
            std::fprintf(m_stream, "%10.3f  %*s %s\n", line.milliseconds, COLUMN_WIDTH, "", line.text.c_str());
    std::fflush(m_stream);
}

void CallTrace::Ladder::add(Column column, std::string text)
{
    TY::Time const now = TY::Time::NOW(TY::Time::MONOTONIC);
    double const milliseconds = static_cast<double>(now.seconds - m_start.seconds) * 1e3 +
                                static_cast<double>(now.nanoseconds - m_start.nanoseconds) / 1e6;
    m_lines.push_back({milliseconds, column, std::move(text)});
}

std::shared_ptr<CallTrace::Ladder> CallTrace::begin(unsigned int callNumber, std::string left, std::string right)
{
    if (m_left == 0)
        return nullptr;
    --m_left;
    auto ladder = std::make_shared<Ladder>(m_stream, callNumber, std::move(left), std::move(right));
    m_ladders[callNumber] = ladder;
    return ladder;
}

std::shared_ptr<CallTrace::Ladder> CallTrace::find(unsigned int callNumber) const
{
    auto const found = m_ladders.find(callNumber);
    return found != m_ladders.end() ? found->second.lock() : nullptr;
}
