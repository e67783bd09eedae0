#pragma once

#include <string>
#include <termios.h>
#include <vector>

/// The user's terminal as a screen that is drawn again and again: without the cursor, and what was there before is back
/// at the end, also when a signal asks for it.
class Terminal
{
public:
    enum Event
    {
        TIME_OVER,
        KEY,
        END ///< a signal, or nobody is there any more
    };

    Terminal();
    ~Terminal();
    Terminal(Terminal const&) = delete;
    Terminal& operator=(Terminal const&) = delete;

    /// Whether there is one, on both the standard input and output.
    static bool IS_THERE();
    unsigned int getRows() const;
    /// What fits of the lines.
    void draw(std::vector<std::string> const& lines) const;
    /// Until a key is hit, or the milliseconds are over, or the size changes.
    Event wait(int milliseconds, char& key) const;

private:
    unsigned int getColumns() const;

    termios m_before{};
};
