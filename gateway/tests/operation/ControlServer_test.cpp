#include "operation/control/ControlServer.h"

#include "host/EpollLoop.h"
#include "platform/eventloop/TYEventLoop.h"

#include <array>
#include <csignal>
#include <deque>
#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <sys/signalfd.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

namespace
{
/// Echoes; "long" in a copy, "much" with more than the system keeps for who does not read.
class Echo : public ControlHandler
{
public:
    bool isLong(ControlRequest const& request) const override { return request.verb == "long"; }
    ControlAnswer answer(ControlRequest const& request, std::string const& user) override
    {
        ++answers;
        lastUser = user;
        if (request.verb == "long" && !request.arguments.empty())
            return {std::vector<std::string>(1000, std::string(1000, 'x')), {}};
        return {{request.verb == "much" ? std::string(100000, 'x') : request.verb}, {}};
    }

    unsigned int answers = 0;
    std::string lastUser;
};

/// An operator's tool.
class Tool
{
public:
    explicit Tool(std::string const& path) : m_descriptor(socket(AF_UNIX, SOCK_STREAM | SOCK_NONBLOCK, 0))
    {
        sockaddr_un address = {};
        address.sun_family = AF_UNIX;
        path.copy(address.sun_path, path.size());
        m_isConnected = connect(m_descriptor, reinterpret_cast<sockaddr*>(&address), sizeof address) == 0;
    }
    ~Tool() { close(m_descriptor); }
    Tool(Tool const&) = delete;
    Tool& operator=(Tool const&) = delete;

    void say(std::string const& text) const
    {
        EXPECT_EQ(send(m_descriptor, text.data(), text.size(), MSG_NOSIGNAL), static_cast<ssize_t>(text.size()));
    }
    void hear()
    {
        std::array<char, 65536> piece{};
        ssize_t const size = read(m_descriptor, piece.data(), piece.size());
        m_isClosed |= size == 0 || (size < 0 && errno != EAGAIN);
        m_heard.append(piece.data(), size > 0 ? static_cast<std::size_t>(size) : 0);
    }
    int get() const { return m_descriptor; }
    bool isConnected() const { return m_isConnected; }
    bool isClosed() const { return m_isClosed; }
    std::string const& getHeard() const { return m_heard; }

private:
    int m_descriptor;
    bool m_isConnected = false;
    bool m_isClosed = false;
    std::string m_heard;
};

class ControlServerTest : public testing::Test
{
protected:
    ControlServerTest()
    {
        std::array<char, 64> name{"/tmp/control-test.XXXXXX"};
        folder = mkdtemp(name.data());
        options.path = folder + "/control";
        sigset_t signals;
        sigemptyset(&signals);
        sigaddset(&signals, SIGCHLD);
        sigprocmask(SIG_BLOCK, &signals, nullptr);
        m_signals = signalfd(-1, &signals, SFD_NONBLOCK | SFD_CLOEXEC);
        loop.attach(timers);
        loop.watch(m_signals, [this] { onChild(); });
    }
    ~ControlServerTest() override
    {
        server.reset();
        loop.forget(m_signals);
        close(m_signals);
        std::filesystem::remove_all(folder);
    }
    void open() { server = std::make_unique<ControlServer>(options, loop, timers, handler); }
    /// Runs the loop until the tool has heard so much, or it was closed.
    void runUntilHeard(Tool& tool, std::string const& end)
    {
        loop.watch(tool.get(),
                   [&]
                   {
                       tool.hear();
                       if (tool.isClosed() || tool.getHeard().ends_with(end))
                           loop.stop();
                   });
        loop.run();
        loop.forget(tool.get());
    }
    std::string complaintOf()
    {
        try
        {
            open();
        }
        catch (std::runtime_error const& error)
        {
            return error.what();
        }
        return "none";
    }

    std::string folder;
    ControlOptions options;
    TYEventLoop timers;
    EpollLoop loop;
    Echo handler;
    std::unique_ptr<ControlServer> server;

private:
    void onChild()
    {
        signalfd_siginfo info = {};
        while (read(m_signals, &info, sizeof info) > 0)
        {
        }
        server->onChild();
    }
    int m_signals = -1;
};

TEST_F(ControlServerTest, AnswersOneRequestAfterTheOther)
{
    open();
    Tool tool(options.path);
    tool.say("one\ntwo\nthr");
    runUntilHeard(tool, "two\n\n");
    EXPECT_EQ(tool.getHeard(), "ok\none\n\nok\ntwo\n\n");
    tool.say("ee\n");
    runUntilHeard(tool, "three\n\n");
    EXPECT_NE(handler.lastUser.find("uid " + std::to_string(getuid())), std::string::npos) << handler.lastUser;
}

TEST_F(ControlServerTest, HasLongAnswersToldByACopyAndThoseBehindAfterwards)
{
    open();
    Tool tool(options.path);
    tool.say("long and\nshort\n");
    runUntilHeard(tool, "ok\nshort\n\n");
    EXPECT_GT(tool.getHeard().size(), 1000000u);
    EXPECT_EQ(handler.answers, 1u) << "the copy's answer is not made here";
}

TEST_F(ControlServerTest, ClosesWhoDoesNotReadWhatItIsTold)
{
    open();
    Tool tool(options.path);
    Tool other(options.path);
    std::string requests;
    for (int i = 0; i < 100; ++i)
        requests += "much\n";
    tool.say(requests);
    other.say("hello\n");
    runUntilHeard(other, "\n\n");
    EXPECT_LT(handler.answers, 20u);
    runUntilHeard(tool, "never");
    EXPECT_TRUE(tool.isClosed());
}

TEST_F(ControlServerTest, RefusesALineWithoutAnEnd)
{
    open();
    Tool tool(options.path);
    tool.say(std::string(ControlServer::LONGEST_LINE + 1, 'a'));
    runUntilHeard(tool, "never");
    EXPECT_EQ(tool.getHeard(), "error: this is no line of text\n\n");
}

TEST_F(ControlServerTest, RefusesWhatWouldSteerATerminal)
{
    open();
    Tool tool(options.path);
    tool.say("status \x1b[2J\n");
    runUntilHeard(tool, "never");
    EXPECT_EQ(tool.getHeard(), "error: this is no line of text\n\n");
    EXPECT_EQ(handler.answers, 0u);
}

TEST_F(ControlServerTest, ClosesWhoAsksNothing)
{
    options.idle = 1;
    open();
    Tool tool(options.path);
    runUntilHeard(tool, "never");
    EXPECT_EQ(tool.getHeard(), "");
    EXPECT_TRUE(tool.isClosed());
}

TEST_F(ControlServerTest, LetsWhoWasSilentForLongestGiveWay)
{
    options.maxClients = 2;
    open();
    Tool first(options.path);
    Tool second(options.path);
    second.say("a\n");
    runUntilHeard(second, "\n\n");
    first.say("b\n");
    runUntilHeard(first, "\n\n");
    Tool third(options.path);
    third.say("c\n");
    runUntilHeard(third, "\n\n");
    EXPECT_EQ(third.getHeard(), "ok\nc\n\n");
    runUntilHeard(second, "never");
    first.say("d\n");
    runUntilHeard(first, "d\n\n");
    EXPECT_FALSE(first.isClosed());
}

TEST_F(ControlServerTest, OutlivesHundredsWhoSayNothing)
{
    open();
    std::deque<Tool> silent;
    for (int i = 0; i < 500; ++i)
    {
        silent.emplace_back(options.path);
        if (i % 50 != 0) // as many as the system lets wait
            continue;
        Tool tool(options.path);
        tool.say("a\n");
        runUntilHeard(tool, "\n\n");
        EXPECT_EQ(tool.getHeard(), "ok\na\n\n");
    }
}

TEST_F(ControlServerTest, EndsBeforeAnAnswerIsTold)
{
    open();
    Tool tool(options.path);
    tool.say("long and\nlong and\n");
    Tool other(options.path);
    other.say("a\n");
    runUntilHeard(other, "\n\n");
    server.reset();
    EXPECT_FALSE(Tool(options.path).isConnected());
}

TEST_F(ControlServerTest, HasTheModeThatWasAskedFor)
{
    options.mode = 0620;
    open();
    struct stat status = {};
    ASSERT_EQ(stat(options.path.c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 0777u, 0620u);
    server.reset();
    EXPECT_FALSE(std::filesystem::exists(options.path));
}

TEST_F(ControlServerTest, TakesThePlaceOfASocketThatNobodyListensOn)
{
    sockaddr_un address = {};
    address.sun_family = AF_UNIX;
    options.path.copy(address.sun_path, options.path.size());
    int const stale = socket(AF_UNIX, SOCK_STREAM, 0);
    ASSERT_EQ(bind(stale, reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
    close(stale);
    EXPECT_EQ(complaintOf(), "none");
    EXPECT_TRUE(Tool(options.path).isConnected());
}

TEST_F(ControlServerTest, TellsWhyThereIsNoSocket)
{
    open();
    EXPECT_THROW(ControlServer(options, loop, timers, handler), std::runtime_error) << "somebody listens there";
    server.reset();
    options.group = "no-such-group";
    EXPECT_EQ(complaintOf(), "there is no group 'no-such-group'");
    options.group.clear();
    std::ofstream(options.path) << "text";
    EXPECT_EQ(complaintOf(), "there is a file of that name, which is no socket");
    options.path = folder + "/none/control";
    EXPECT_EQ(complaintOf(), "cannot be listened on: No such file or directory");
    options.path = std::string(200, 'a');
    EXPECT_EQ(complaintOf(), "the name is too long for a socket");
}
} // namespace
