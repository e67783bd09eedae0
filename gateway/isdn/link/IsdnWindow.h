#pragma once

#include <cstddef>
#include <span>

/// What of the frames that were sent the far side has acknowledged (Q.921, 5.6), as the frames themselves tell: the
/// stack has no word for what it still has to send.
///
///     window.onSent(frame);
///     window.onReceived(answer);
///     if (window.isClear())
///         ...
class IsdnWindow
{
public:
    using Frame = std::span<unsigned char const>;

    void onSent(Frame frame);
    void onReceived(Frame frame);
    /// Whether all was acknowledged. Then nothing waits for its turn either: an acknowledgement makes room for it, and
    /// the stack sends it at once.
    bool isClear() const { return m_next == m_acknowledged; }

private:
    unsigned int m_next = 0;         // N(S) of what is sent next, so V(S)
    unsigned int m_acknowledged = 0; // N(R) of what came last
};
