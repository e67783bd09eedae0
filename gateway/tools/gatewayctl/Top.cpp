#include "Top.h"

#include "Connection.h"
#include "Terminal.h"

namespace
{
constexpr int INTERVAL = 2000;          // milliseconds
constexpr unsigned int OTHER_LINES = 3; // two that the gateway tells, and ours
} // namespace

std::string Top::run(Connection& connection)
{
    Terminal const terminal;
    for (;;)
    {
        unsigned int const rows = terminal.getRows();
        Connection::Answer answer = connection.ask("top --sort " + m_order + " --rows " +
                                                   std::to_string(rows > OTHER_LINES ? rows - OTHER_LINES : 0));
        if (!answer.isOk)
            return answer.status;
        answer.lines.insert(answer.lines.begin(),
                            "by " + m_order + "; keys: a by age, r by rate, s by score, q to quit");
        terminal.draw(answer.lines);
        char key = 0;
        Terminal::Event const event = terminal.wait(INTERVAL, key);
        if (event == Terminal::END || (event == Terminal::KEY && !follow(key)))
            return {};
    }
}

bool Top::follow(char key)
{
    switch (key)
    {
    case 'a':
        m_order = "age";
        break;
    case 'r':
        m_order = "rate";
        break;
    case 's':
        m_order = "quality";
        break;
    default:
        break;
    }
    return key != 'q';
}
