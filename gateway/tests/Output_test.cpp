#include "operation/Output.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <fcntl.h>
#include <fstream>
#include <sstream>
#include <unistd.h>

namespace
{
/// A pipe that nobody reads until somebody does.
class Pipe
{
public:
    Pipe()
    {
        if (pipe2(m_ends, O_CLOEXEC) != 0)
            std::abort();
    }
    ~Pipe()
    {
        close(m_ends[0]);
        close(m_ends[1]);
    }
    Pipe(Pipe const&) = delete;
    Pipe& operator=(Pipe const&) = delete;
    int in() const { return m_ends[1]; }
    /// At least so many octets; waits for them.
    std::string read(std::size_t least) const
    {
        std::string text;
        char buffer[65536];
        while (text.size() < least)
            text.append(buffer, static_cast<std::size_t>(::read(m_ends[0], buffer, sizeof buffer)));
        return text;
    }

private:
    int m_ends[2];
};

std::string LINE(unsigned int number)
{
    std::string line = std::to_string(number);
    line.resize(99, '.');
    return line + "\n";
}
} // namespace

TEST(Output, WhatIsReadIsOutAtOnce)
{
    Pipe const pipe;
    Output output(pipe.in());
    output.write("one\n");
    output.write("two\n");
    EXPECT_EQ(pipe.read(8), "one\ntwo\n");
    EXPECT_EQ(output.getDropped(), 0u);
}

TEST(Output, WhoDoesNotReadHoldsUpNobodyAndGetsEverythingInItsOrderLater)
{
    constexpr unsigned int LINES = 5000; // seven times what a pipe holds
    Pipe const pipe;
    Output output(pipe.in());
    for (unsigned int i = 0; i < LINES; ++i)
        output.write(LINE(i));
    std::string expected;
    for (unsigned int i = 0; i < LINES; ++i)
        expected += LINE(i);
    EXPECT_EQ(pipe.read(expected.size()), expected);
    EXPECT_EQ(output.getDropped(), 0u);
}

TEST(Output, WhatFindsNoRoomIsCountedAndToldOf)
{
    Pipe const pipe;
    Output output(pipe.in(), 1000);
    for (unsigned int i = 0; i < 2000; ++i)
        output.write(LINE(i));
    unsigned long long const dropped = output.getDropped();
    ASSERT_GT(dropped, 0u);
    std::string const told = "(" + std::to_string(dropped) + " texts were dropped: nobody read them)\n";
    std::size_t const whole = (2000 - dropped) * 100;
    std::string const text = pipe.read(whole + told.size());
    EXPECT_EQ(text.size(), whole + told.size());
    EXPECT_TRUE(text.ends_with(told));
    EXPECT_TRUE(text.starts_with(LINE(0) + LINE(1)));
}

TEST(Output, AnEndDoesNotWaitForWhoNeverReads)
{
    Pipe const pipe;
    Output output(pipe.in());
    for (unsigned int i = 0; i < 2000; ++i)
        output.write(LINE(i));
}

TEST(Output, AStreamOfTheCLibraryLeadsToIt)
{
    Pipe const pipe;
    Output output(pipe.in());
    std::FILE* const stream = output.makeStream();
    ASSERT_NE(stream, nullptr);
    std::fprintf(stream, "%d calls\n", 3);
    std::fclose(stream);
    EXPECT_EQ(pipe.read(8), "3 calls\n");
}

TEST(Output, AFileIsAppendedToAndCanBeAnother)
{
    char name[] = "/tmp/output-test-XXXXXX";
    close(mkstemp(name));
    Output output(STDERR_FILENO);
    EXPECT_FALSE(output.open("/nonexistent/file"));
    ASSERT_TRUE(output.open(name));
    output.write("before\n");
    std::string const moved = std::string(name) + ".1";
    ASSERT_EQ(std::rename(name, moved.c_str()), 0);
    ASSERT_TRUE(output.open(name));
    output.write("after\n");
    auto const content = [](std::string const& file)
    {
        std::ostringstream text;
        text << std::ifstream(file).rdbuf();
        return text.str();
    };
    EXPECT_EQ(content(moved), "before\n");
    EXPECT_EQ(content(name), "after\n");
    unlink(name);
    unlink(moved.c_str());
}
