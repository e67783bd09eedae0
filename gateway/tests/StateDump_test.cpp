#include "operation/StateDump.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <csignal>
#include <string>
#include <sys/wait.h>
#include <unistd.h>

namespace
{
/// The standard output of this process, read back.
class ReadBackOutput
{
public:
    ReadBackOutput()
    {
        int ends[2] = {};
        EXPECT_EQ(pipe(ends), 0);
        m_before = dup(STDOUT_FILENO);
        dup2(ends[1], STDOUT_FILENO);
        close(ends[1]);
        m_read = ends[0];
    }
    ~ReadBackOutput()
    {
        putBack();
        close(m_read);
    }
    ReadBackOutput(ReadBackOutput const&) = delete;
    ReadBackOutput& operator=(ReadBackOutput const&) = delete;

    /// Until nobody has the output any more.
    std::string readAll()
    {
        putBack();
        std::string text;
        char part[64];
        for (ssize_t number = 0; (number = read(m_read, part, sizeof part)) > 0;)
            text.append(part, static_cast<std::size_t>(number));
        return text;
    }

private:
    void putBack()
    {
        if (m_before < 0)
            return;
        dup2(m_before, STDOUT_FILENO);
        close(m_before);
        m_before = -1;
    }
    int m_before = -1;
    int m_read = -1;
};

/// What SIGCHLD is for the gateway.
void AWAIT_CHILD(StateDump& dump)
{
    siginfo_t info = {};
    EXPECT_EQ(waitid(P_ALL, 0, &info, WEXITED | WNOWAIT), 0);
    dump.onChild();
}

std::function<std::string()> TELLING(char const* text)
{
    return [text] { return std::string(text); };
}
} // namespace

TEST(StateDump, WhoAsksWhileItIsBeingToldIsToldNext)
{
    ReadBackOutput output;
    StateDump dump;
    dump.begin(TELLING("one "));
    dump.begin(TELLING("two "));
    AWAIT_CHILD(dump);
    AWAIT_CHILD(dump);
    EXPECT_EQ(output.readAll(), "one two ");
}

TEST(StateDump, OfSeveralThatWaitTheLastOneIsTold)
{
    ReadBackOutput output;
    StateDump dump;
    for (char const* text : {"one ", "two ", "three "})
        dump.begin(TELLING(text));
    AWAIT_CHILD(dump);
    AWAIT_CHILD(dump);
    EXPECT_EQ(output.readAll(), "one three ");
}

TEST(StateDump, WhoAsksAfterwardsIsToldAtOnce)
{
    ReadBackOutput output;
    StateDump dump;
    dump.begin(TELLING("one "));
    AWAIT_CHILD(dump);
    dump.begin(TELLING("two "));
    AWAIT_CHILD(dump);
    EXPECT_EQ(output.readAll(), "one two ");
}

TEST(StateDump, ItsEndWaitsForWhatIsBeingTold)
{
    ReadBackOutput output;
    {
        StateDump dump;
        dump.begin(TELLING("one "));
    }
    EXPECT_EQ(waitpid(-1, nullptr, WNOHANG), -1);
    EXPECT_EQ(errno, ECHILD);
    EXPECT_EQ(output.readAll(), "one ");
}
