#include "isdn/line/IsdnBlock.h"

#include <algorithm>
#include <sys/socket.h>

bool IsdnBlock::receive(int channel)
{
    std::array<unsigned char, LENGTH + 1> octets; // one more shows what is too long
    ssize_t length = 0;
    do
        length = recv(channel, octets.data(), octets.size(), MSG_DONTWAIT);
    while (length > 0 && static_cast<std::size_t>(length) != LENGTH);
    if (length <= 0)
        return false;
    timestamp = 0;
    for (std::size_t i = 0; i < LENGTH - SAMPLES; ++i)
        timestamp = timestamp << 8 | octets[i];
    std::copy_n(octets.begin() + (LENGTH - SAMPLES), SAMPLES, speech.begin());
    return true;
}

bool IsdnBlock::send(int channel) const
{
    std::array<unsigned char, LENGTH> octets;
    for (unsigned int i = 0; i < LENGTH - SAMPLES; ++i)
        octets[i] = static_cast<unsigned char>(timestamp >> (24 - 8 * i));
    std::copy(speech.begin(), speech.end(), octets.begin() + (LENGTH - SAMPLES));
    return ::send(channel, octets.data(), octets.size(), MSG_DONTWAIT | MSG_NOSIGNAL) ==
           static_cast<ssize_t>(octets.size());
}
