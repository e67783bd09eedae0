#include "media/rtp/DatagramBatch.h"

#include <algorithm>
#include <utility>

DatagramBatch::DatagramBatch()
{
    for (unsigned int i = 0; i < MOST; ++i)
    {
        m_receivedVectors[i] = {m_octets[i].data(), LONGEST};
        m_received[i].msg_hdr.msg_iov = &m_receivedVectors[i];
        m_received[i].msg_hdr.msg_iovlen = 1;
        m_received[i].msg_hdr.msg_name = &m_sources[i].any;
        m_received[i].msg_hdr.msg_namelen = sizeof(sockaddr_in6);
        m_sent[i].msg_hdr.msg_iov = &m_sentVectors[i];
        m_sent[i].msg_hdr.msg_iovlen = 1;
    }
}

unsigned int DatagramBatch::receive(int descriptor)
{
    m_queued = 0;
    return static_cast<unsigned int>(std::max(recvmmsg(descriptor, m_received.data(), MOST, 0, nullptr), 0));
}

DatagramAddress const& DatagramBatch::getSource(unsigned int index)
{
    // the system writes how long the address is to where it reads how long it may be
    m_sources[index].length = std::exchange(m_received[index].msg_hdr.msg_namelen, socklen_t{sizeof(sockaddr_in6)});
    return m_sources[index];
}

void DatagramBatch::queue(std::span<unsigned char> octets, DatagramAddress const& to)
{
    if (m_queued == MOST)
        return;
    m_sentVectors[m_queued] = {octets.data(), octets.size()};
    m_sent[m_queued].msg_hdr.msg_name = const_cast<sockaddr*>(&to.any);
    m_sent[m_queued].msg_hdr.msg_namelen = to.length;
    ++m_queued;
}

unsigned int DatagramBatch::send(int descriptor)
{
    unsigned int taken = 0;
    for (unsigned int at = 0; at < m_queued;)
    {
        int const sent = sendmmsg(descriptor, &m_sent[at], m_queued - at, 0);
        taken += static_cast<unsigned int>(std::max(sent, 0));
        at += static_cast<unsigned int>(std::max(sent, 1)); // one that the system refuses does not hold up the others
    }
    m_queued = 0;
    return taken;
}
