#include "operation/http/HttpServer.h"

#include "host/EpollLoop.h"

#include <arpa/inet.h>
#include <array>
#include <deque>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <memory>
#include <netinet/in.h>
#include <new>
#include <poll.h>
#include <stdexcept>
#include <string>
#include <sys/resource.h>
#include <sys/socket.h>
#include <unistd.h>

namespace
{
/// One that the system has to give at this moment.
std::uint16_t FREE_PORT()
{
    int const descriptor = socket(AF_INET, SOCK_STREAM, 0);
    sockaddr_in address = {};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t length = sizeof address;
    bind(descriptor, reinterpret_cast<sockaddr*>(&address), sizeof address);
    getsockname(descriptor, reinterpret_cast<sockaddr*>(&address), &length);
    close(descriptor);
    return ntohs(address.sin_port);
}

class Browser
{
public:
    explicit Browser(std::uint16_t port) : m_descriptor(socket(AF_INET, SOCK_STREAM, 0))
    {
        sockaddr_in address = {};
        address.sin_family = AF_INET;
        address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        address.sin_port = htons(port);
        EXPECT_EQ(connect(m_descriptor, reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
    }
    ~Browser() { close(m_descriptor); }
    Browser(Browser const&) = delete;
    Browser& operator=(Browser const&) = delete;

    void say(std::string const& text) const
    {
        EXPECT_EQ(send(m_descriptor, text.data(), text.size(), MSG_NOSIGNAL), static_cast<ssize_t>(text.size()));
    }
    /// Reads what is there; false: nothing comes any more.
    bool hear()
    {
        std::array<char, 65536> piece{};
        ssize_t const size = read(m_descriptor, piece.data(), piece.size());
        heard.append(piece.data(), size > 0 ? static_cast<std::size_t>(size) : 0);
        return size > 0;
    }
    void hearAll()
    {
        while (hear())
        {
        }
    }
    int get() const { return m_descriptor; }

    std::string heard;

private:
    int m_descriptor;
};

struct HttpServerTest : testing::Test
{
    void open(HttpServer::Milliseconds patience = HttpServer::PATIENCE)
    {
        std::map<std::string, std::function<HttpAnswer()>> const pages{
            {"/page",
             [this]
             {
                 ++made;
                 return HttpAnswer{200, content};
             }},
            {"/none", []() -> HttpAnswer { throw std::bad_alloc(); }}};
        server = std::make_unique<HttpServer>(SocketAddress{"127.0.0.1", port}, loop, HttpContents{pages, files, relay},
                                              patience);
    }
    /// What is answered to that while the loop turns.
    std::string ask(std::string const& request)
    {
        Browser browser(port);
        browser.say(request);
        runUntilOver(browser);
        return browser.heard;
    }
    void runUntilOver(Browser& browser)
    {
        loop.watch(browser.get(),
                   [&]
                   {
                       if (!browser.hear())
                           loop.stop();
                   });
        loop.run();
        loop.forget(browser.get());
    }

    EpollLoop loop;
    std::uint16_t port = FREE_PORT();
    std::string content = "figures\n";
    unsigned int made = 0;
    std::map<std::string, HttpAnswer> files;
    HttpRelay* relay = nullptr;
    std::unique_ptr<HttpServer> server;
};

TEST_F(HttpServerTest, GivesOutAPage)
{
    open();
    EXPECT_EQ(ask("GET /page?x=1 HTTP/1.1\r\nHost: localhost:1\r\n\r\n"),
              "HTTP/1.1 200 OK\r\nContent-Type: text/plain; charset=utf-8\r\nContent-Length: 8\r\n"
              "Cache-Control: no-store\r\nX-Content-Type-Options: nosniff\r\n"
              "Content-Security-Policy: default-src 'none'; style-src 'self' 'unsafe-inline'; script-src 'self'; "
              "connect-src 'self'; base-uri 'none'; form-action 'none'; frame-ancestors 'none'\r\n"
              "Connection: close\r\n\r\nfigures\n");
    EXPECT_TRUE(ask("HEAD /page HTTP/1.0\r\n\r\n").ends_with("Connection: close\r\n\r\n"));
}

TEST_F(HttpServerTest, GivesOutAFileWithoutTheLoop)
{
    files["/file"] = {200, "as it is\n", "text/css"};
    open();
    Browser browser(port);
    browser.say("GET /file HTTP/1.0\r\n\r\n");
    browser.hearAll();
    EXPECT_TRUE(browser.heard.starts_with("HTTP/1.1 200 OK\r\nContent-Type: text/css\r\n"));
    EXPECT_TRUE(browser.heard.ends_with("as it is\n"));
}

namespace
{
/// Gives out what is written into a pipe, up to a full stop.
class PipeRelay : public HttpRelay
{
public:
    PipeRelay() { EXPECT_EQ(pipe2(ends, O_NONBLOCK | O_CLOEXEC), 0); }
    ~PipeRelay() override { closeWriting(); }

    int open(HttpRequest const& request, unsigned int& refusal) override
    {
        refusal = 503;
        return request.path == "/piped" ? ends[0] : -1;
    }
    std::optional<HttpAnswer> read(std::string_view come, bool isEnd) override
    {
        if (come.ends_with('.'))
            return HttpAnswer{200, std::string(come)};
        return isEnd ? std::optional(HttpAnswer::REFUSING(503)) : std::nullopt;
    }
    void say(std::string_view text) const
    {
        EXPECT_EQ(write(ends[1], text.data(), text.size()), static_cast<ssize_t>(text.size()));
    }
    void closeWriting()
    {
        if (ends[1] >= 0)
            close(std::exchange(ends[1], -1));
    }

private:
    int ends[2]{-1, -1};
};
} // namespace

TEST_F(HttpServerTest, RelaysWhatComesInPiecesOnceItIsWhole)
{
    PipeRelay pipe;
    relay = &pipe;
    open();
    Browser browser(port);
    browser.say("GET /piped HTTP/1.0\r\n\r\n");
    pipe.say("one, ");
    pipe.say("two.");
    browser.hearAll();
    EXPECT_TRUE(browser.heard.ends_with("\r\n\r\none, two."));
}

TEST_F(HttpServerTest, TellsThatWhatItRelaysHasEndedEarly)
{
    PipeRelay pipe;
    relay = &pipe;
    open();
    Browser browser(port);
    browser.say("GET /piped HTTP/1.0\r\n\r\n");
    pipe.say("one, ");
    pipe.closeWriting();
    browser.hearAll();
    EXPECT_TRUE(browser.heard.starts_with("HTTP/1.1 503 "));
}

TEST_F(HttpServerTest, WaitsForWhatItRelaysAsLongAsForTheLoop)
{
    PipeRelay pipe;
    relay = &pipe;
    open(HttpServer::Milliseconds(50));
    Browser browser(port);
    browser.say("GET /piped HTTP/1.0\r\n\r\n");
    browser.hearAll();
    EXPECT_TRUE(browser.heard.starts_with("HTTP/1.1 503 "));
}

TEST_F(HttpServerTest, AnswersWithTheReasonWhyNothingIsRelayed)
{
    PipeRelay pipe;
    relay = &pipe;
    open();
    Browser browser(port);
    browser.say("GET /other HTTP/1.0\r\n\r\n");
    browser.hearAll();
    EXPECT_TRUE(browser.heard.starts_with("HTTP/1.1 503 "));
    pipe.say("for nobody");
}

TEST_F(HttpServerTest, MakesAPageOnceForManyWhoAskAtOnce)
{
    open();
    std::deque<Browser> browsers;
    for (int i = 0; i < 10; ++i)
        browsers.emplace_back(port).say("GET /page HTTP/1.0\r\n\r\n");
    for (Browser& browser : browsers)
    {
        runUntilOver(browser);
        EXPECT_TRUE(browser.heard.ends_with("figures\n"));
    }
    EXPECT_LT(made, 10u);
}

TEST_F(HttpServerTest, WaitsForTheRestOfARequest)
{
    open();
    Browser browser(port);
    browser.say("GET /pa");
    EXPECT_TRUE(ask("GET /page HTTP/1.0\r\n\r\n").ends_with("figures\n")); // meanwhile
    browser.say("ge HTTP/1.0\r\n\r");
    browser.say("\nand more");
    runUntilOver(browser);
    EXPECT_TRUE(browser.heard.ends_with("figures\n"));
}

TEST_F(HttpServerTest, TellsAPageThatIsMuchLongerThanWhatTheSystemKeeps)
{
    content.assign(20000000, 'x');
    open();
    EXPECT_GT(ask("GET /page HTTP/1.0\r\n\r\n").size(), content.size());
}

TEST_F(HttpServerTest, ForgetsWhoDoesNotReadAndWhoDoesNotAsk)
{
    content.assign(20000000, 'x');
    open(HttpServer::Milliseconds(300));
    Browser reader(port);
    reader.say("GET /page HTTP/1.0\r\n\r\n");
    loop.watch(reader.get(), [&] { loop.stop(); });
    loop.run(); // the answer has begun
    loop.forget(reader.get());
    Browser silent(port);
    runUntilOver(silent); // came later, and was given up later
    EXPECT_EQ(silent.heard, "");
    reader.hearAll();
    EXPECT_LT(reader.heard.size(), content.size());
}

TEST_F(HttpServerTest, SaysThatTheLoopStandsStill)
{
    open(HttpServer::Milliseconds(50));
    Browser browser(port);
    browser.say("GET /page HTTP/1.0\r\n\r\n");
    browser.hearAll();
    EXPECT_TRUE(browser.heard.starts_with("HTTP/1.1 503 Service Unavailable\r\n")) << browser.heard;
    EXPECT_TRUE(browser.heard.ends_with("the gateway's loop does not turn\n"));
}

TEST_F(HttpServerTest, SaysThatThereIsNoMemory)
{
    open();
    EXPECT_TRUE(ask("GET /none HTTP/1.0\r\n\r\n").starts_with("HTTP/1.1 503 Service Unavailable\r\n"));
}

TEST_F(HttpServerTest, AnswersAmongAThousandWhoSayNothing)
{
    rlimit limit = {};
    getrlimit(RLIMIT_NOFILE, &limit);
    rlim_t const before = limit.rlim_cur;
    limit.rlim_cur = std::min<rlim_t>(4096, limit.rlim_max);
    setrlimit(RLIMIT_NOFILE, &limit);
    open();
    std::deque<Browser> silent;
    for (int i = 0; i < 1000; ++i)
        silent.emplace_back(port);
    EXPECT_TRUE(ask("GET /page HTTP/1.0\r\n\r\n").ends_with("figures\n"));
    silent.front().hearAll();
    EXPECT_EQ(silent.front().heard, "") << "it gave way";
    silent.clear();
    limit.rlim_cur = before;
    setrlimit(RLIMIT_NOFILE, &limit);
}

TEST_F(HttpServerTest, RefusesWhatItDoesNotHave)
{
    open();
    std::pair<std::string, std::string> const cases[] = {
        {"GET /else HTTP/1.0\r\n\r\n", "404 Not Found"},
        {"POST /page HTTP/1.0\r\n\r\n", "405 Method Not Allowed"},
        {"POST /else HTTP/1.0\r\n\r\n", "405 Method Not Allowed"},
        {"PUT /page HTTP/1.0\r\n\r\n", "405 Method Not Allowed"},
        {"GET /page HTTP/1.1\r\nx: y\r\n\r\n", "400 Bad Request"},
        {"GET /page\r\n\r\n", "400 Bad Request"},
        {"get /page HTTP/1.0\r\n\r\n", "400 Bad Request"},
        {"\r\n\r\n", "400 Bad Request"},
        {std::string("\0\xff\x16\x03\r\n\r\n", 8), "400 Bad Request"},
        {"GET /page HTTP/1.9\r\n\r\n", "505 HTTP Version Not Supported"},
        {std::string(HttpServer::LONGEST_REQUEST + 1, 'a'), "431 Request Header Fields Too Large"}};
    for (auto const& [request, status] : cases)
        EXPECT_TRUE(ask(request).starts_with("HTTP/1.1 " + status + "\r\n")) << request << ": " << status;
    EXPECT_EQ(made, 0u);
}

TEST_F(HttpServerTest, AnswersWhoHasCalledItByALoopbackAddressAlone)
{
    open();
    for (char const* const host : {"localhost", "localhost:9160", "127.0.0.1:9160", "127.1.2.3", "[::1]:9160", "[::1]"})
        EXPECT_TRUE(ask(std::string("GET /page HTTP/1.1\r\nhOST:  ") + host + " \r\n\r\n").ends_with("figures\n"))
            << host;
    for (char const* const host :
         {"", "evil.example", "127.evil.example", "127.0.0.1.evil.example:9160", "[::2]", "localhost.evil.example"})
        EXPECT_TRUE(ask(std::string("GET /page HTTP/1.1\r\nHost: ") + host + "\r\n\r\n").starts_with("HTTP/1.1 421 "))
            << host;
}

TEST_F(HttpServerTest, TakesARequestThatIsJustNotTooLong)
{
    open();
    std::string const around = "GET /page HTTP/1.0\r\nx: \r\n\r\n";
    std::string const rest(HttpServer::LONGEST_REQUEST - around.size(), 'a');
    EXPECT_TRUE(ask("GET /page HTTP/1.0\r\nx: " + rest + "\r\n\r\n").ends_with("figures\n"));
    EXPECT_TRUE(ask("GET /page HTTP/1.0\r\nx: a" + rest + "\r\n\r\n").starts_with("HTTP/1.1 431 "));
}

TEST_F(HttpServerTest, EndsWhileSomebodyWaits)
{
    open();
    Browser browser(port);
    browser.say("GET /page HTTP/1.0\r\n\r\n");
    server.reset();
    browser.hearAll();
    EXPECT_EQ(browser.heard, "");
    open(); // its port is free again
}

TEST_F(HttpServerTest, TellsWhyItCannotListen)
{
    open();
    EXPECT_THROW(HttpServer(SocketAddress{"127.0.0.1", port}, loop, {}), std::runtime_error);
    EXPECT_NO_THROW(HttpServer(SocketAddress{"::1", FREE_PORT()}, loop, {}));
}
} // namespace
