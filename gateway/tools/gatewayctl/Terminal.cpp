#include "Terminal.h"

#include <algorithm>
#include <csignal>
#include <cstdio>
#include <poll.h>
#include <sys/ioctl.h>
#include <tuple>
#include <unistd.h>

namespace
{
constexpr unsigned int USUAL_ROWS = 24;
constexpr unsigned int USUAL_COLUMNS = 80;
constexpr char const* OTHER_SCREEN = "\x1b[?1049h\x1b[?25l";
constexpr char const* FIRST_SCREEN = "\x1b[?25h\x1b[?1049l";
constexpr char const* TO_THE_START = "\x1b[H";
constexpr char const* CLEAR_LINE = "\x1b[K";
constexpr char const* CLEAR_BELOW = "\x1b[J";

volatile std::sig_atomic_t s_isOver = 0;

void HANDLE_SIGNALS(void (*end)(int), void (*resize)(int))
{
    struct sigaction action = {};
    action.sa_handler = end;
    for (int const signal : {SIGINT, SIGTERM, SIGHUP})
        sigaction(signal, &action, nullptr);
    action.sa_handler = resize;
    sigaction(SIGWINCH, &action, nullptr); // that it comes ends a wait
}

void WRITE(std::string const& text)
{
    std::fwrite(text.data(), 1, text.size(), stdout);
    std::fflush(stdout);
}
} // namespace

bool Terminal::IS_THERE() { return isatty(STDIN_FILENO) == 1 && isatty(STDOUT_FILENO) == 1; }

Terminal::Terminal()
{
    tcgetattr(STDIN_FILENO, &m_before);
    termios settings = m_before;
    settings.c_lflag &= ~static_cast<tcflag_t>(ICANON | ECHO);
    tcsetattr(STDIN_FILENO, TCSANOW, &settings);
    HANDLE_SIGNALS([](int) { s_isOver = 1; }, [](int) {});
    WRITE(OTHER_SCREEN);
}

Terminal::~Terminal()
{
    WRITE(FIRST_SCREEN);
    tcsetattr(STDIN_FILENO, TCSANOW, &m_before);
    HANDLE_SIGNALS(SIG_DFL, SIG_DFL);
}

unsigned int Terminal::getRows() const
{
    winsize size = {};
    return ioctl(STDOUT_FILENO, TIOCGWINSZ, &size) == 0 && size.ws_row != 0 ? size.ws_row : USUAL_ROWS;
}

unsigned int Terminal::getColumns() const
{
    winsize size = {};
    return ioctl(STDOUT_FILENO, TIOCGWINSZ, &size) == 0 && size.ws_col != 0 ? size.ws_col : USUAL_COLUMNS;
}

/// Over what was there, so that nothing flickers.
void Terminal::draw(std::vector<std::string> const& lines) const
{
    std::string text = TO_THE_START;
    std::size_t const rows = std::min<std::size_t>(lines.size(), getRows());
    for (std::size_t i = 0; i < rows; ++i)
        text += (i == 0 ? "" : "\n") + lines[i].substr(0, getColumns()) + CLEAR_LINE;
    WRITE(text + CLEAR_BELOW);
}

Terminal::Event Terminal::wait(int milliseconds, char& key) const
{
    pollfd input = {STDIN_FILENO, POLLIN, 0};
    int const ready = s_isOver != 0 ? 0 : poll(&input, 1, milliseconds);
    if (s_isOver != 0)
        return END;
    if (ready <= 0)
        return TIME_OVER;
    return read(STDIN_FILENO, &key, 1) == 1 ? KEY : END;
}
