#include "isdn/link/IsdnWindow.h"

namespace
{
constexpr std::size_t CONTROL = 2; // where it is, behind the address (Q.921, 3.4)
constexpr std::size_t RECEIVED = 3;
constexpr unsigned int NUMBERS = 128;
constexpr unsigned char POLL = 0x10;
constexpr unsigned char SABME = 0x6f;

bool IS_INFORMATION(IsdnWindow::Frame frame) { return frame.size() > RECEIVED && (frame[CONTROL] & 1) == 0; }
bool IS_SUPERVISORY(IsdnWindow::Frame frame) { return frame.size() > RECEIVED && (frame[CONTROL] & 3) == 1; }
/// The numbers begin anew.
bool IS_BEGIN(IsdnWindow::Frame frame) { return frame.size() > CONTROL && (frame[CONTROL] & ~POLL) == SABME; }
} // namespace

void IsdnWindow::onSent(Frame frame)
{
    if (IS_BEGIN(frame))
        *this = {};
    if (!IS_INFORMATION(frame))
        return;
    unsigned int const next = (frame[CONTROL] / 2u + 1) % NUMBERS;
    bool const isAgain = (next - m_next) % NUMBERS > NUMBERS / 2;
    if (!isAgain)
        m_next = next;
}

void IsdnWindow::onReceived(Frame frame)
{
    if (IS_BEGIN(frame))
        *this = {};
    if (IS_INFORMATION(frame) || IS_SUPERVISORY(frame))
        m_acknowledged = frame[RECEIVED] / 2u;
}
