#include "host/CallTrace.h"

#include <gtest/gtest.h>

#include <cstdlib>

namespace
{
/// A stream that keeps what is written to it.
class Paper
{
public:
    Paper() : stream(open_memstream(&m_text, &m_size)) {}
    ~Paper()
    {
        std::fclose(stream);
        std::free(m_text);
    }
    std::string text() const
    {
        std::fflush(stream);
        return std::string(m_text, m_size);
    }
    std::FILE* stream;

private:
    char* m_text = nullptr;
    std::size_t m_size = 0;
};
} // namespace

TEST(CallTrace, OnlyTheFirstCallsGetALadder)
{
    Paper paper;
    CallTrace trace(2, paper.stream);
    EXPECT_NE(trace.begin(1, "a", "b"), nullptr);
    EXPECT_NE(trace.begin(2, "a", "b"), nullptr);
    EXPECT_EQ(trace.begin(3, "a", "b"), nullptr);
}

TEST(CallTrace, ALadderIsPrintedWhenBothSidesHaveLetGoOfIt)
{
    Paper paper;
    CallTrace trace(1, paper.stream);
    auto calling = trace.begin(7, "a", "b");
    auto called = trace.find(7);
    EXPECT_EQ(called, calling);
    calling->add(CallTrace::LEFT, "<- INVITE");
    called->add(CallTrace::RIGHT, "-> INVITE");
    calling.reset();
    EXPECT_EQ(paper.text(), "");
    called.reset();
    EXPECT_NE(paper.text().find("call 7, in on interface a and out on interface b\n"), std::string::npos);
    EXPECT_LT(paper.text().find("<- INVITE"), paper.text().find("-> INVITE"));
}

TEST(CallTrace, ACallThatIsOverOrWasNeverTracedIsNotFound)
{
    Paper paper;
    CallTrace trace(1, paper.stream);
    EXPECT_EQ(trace.find(1), nullptr);
    trace.begin(1, "a", "b").reset();
    EXPECT_EQ(trace.find(1), nullptr);
}
