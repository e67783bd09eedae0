#pragma once

/// The times of one side of a link, in milliseconds. What is 0 the stack decides.
struct IsdnTimers
{
    unsigned int t200 = 0; ///< an answer to a frame (Q.921, 5.9.1)
    unsigned int t203 = 0; ///< the longest silence of the D channel (Q.921, 5.9.8)
    unsigned int t302 =
        15000;             ///< between two digits of a number, overlap receiving (Q.931, 9.1); ours, not the stack's
    unsigned int t303 = 0; ///< an answer to SETUP
    unsigned int t304 = 20000;     ///< an answer to the last digits, overlap sending (Q.931, 9.2); ours
    unsigned int t305 = 0;         ///< an answer to DISCONNECT
    unsigned int t308 = 0;         ///< an answer to RELEASE
    unsigned int t309 = 6000;      ///< how long calls outlast a link that is down (Q.931, 5.8.9)
    unsigned int t310 = 0;         ///< what follows CALL PROCEEDING
    unsigned int t313 = 0;         ///< an answer to CONNECT, user side
    unsigned int answer = 180000;  ///< until a call to the line that nobody answers ends; ours (T301 of Q.931, 9.1)
    unsigned int reopening = 1000; ///< between two attempts to open a line
};
