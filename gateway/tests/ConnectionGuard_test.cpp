#include "host/ConnectionGuard.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <cstdint>
#include <netinet/in.h>
#include <unistd.h>
#include <vector>

namespace
{
/// A listening socket of the loopback, who connects to it, and what was accepted.
class ConnectionGuardTest : public testing::Test
{
protected:
    ConnectionGuardTest()
    {
        m_listening = keep(socket(AF_INET, SOCK_STREAM | SOCK_NONBLOCK, 0));
        m_address.sin_family = AF_INET;
        m_address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        socklen_t length = sizeof m_address;
        auto* const address = reinterpret_cast<sockaddr*>(&m_address);
        EXPECT_EQ(bind(m_listening, address, length), 0);
        EXPECT_EQ(listen(m_listening, 8), 0);
        EXPECT_EQ(getsockname(m_listening, address, &length), 0);
    }
    ~ConnectionGuardTest() override
    {
        for (int const descriptor : m_kept)
            close(descriptor);
    }
    SocketAddress listening() const { return {"127.0.0.1", ntohs(m_address.sin_port)}; }

    /// One more connects: what accept() gives.
    int take()
    {
        int const client = keep(socket(AF_INET, SOCK_STREAM, 0));
        EXPECT_EQ(connect(client, reinterpret_cast<sockaddr const*>(&m_address), sizeof m_address), 0);
        errno = ECHILD; // of something before
        int const taken = accept(m_listening, nullptr, nullptr);
        return taken < 0 ? taken : keep(taken);
    }
    int keep(int descriptor)
    {
        m_kept.push_back(descriptor);
        return descriptor;
    }
    void end(int descriptor)
    {
        std::erase(m_kept, descriptor);
        close(descriptor);
    }

private:
    sockaddr_in m_address{};
    int m_listening = -1;
    std::vector<int> m_kept;
};

std::vector<AddressRange> const EVERYBODY{AddressRange::PARSE("0.0.0.0/0")};
} // namespace

TEST_F(ConnectionGuardTest, ASourceHasOnlySoManyConnectionsAndThoseThatEndedDoNotCount)
{
    ConnectionGuard const guard(listening(), EVERYBODY, 2);
    int const first = take();
    EXPECT_GE(first, 0);
    EXPECT_GE(take(), 0);
    EXPECT_EQ(take(), -1);
    EXPECT_EQ(errno, 0) << "nothing that the caller should do something about";
    EXPECT_EQ(guard.getNumberOfRefused(), 1u);
    end(first);
    EXPECT_GE(take(), 0);
}

TEST_F(ConnectionGuardTest, ASourceThatIsNotServedHasNone)
{
    ConnectionGuard const guard(listening(), {AddressRange::PARSE("192.0.2.0/24")}, 2);
    EXPECT_EQ(take(), -1);
    EXPECT_EQ(guard.getNumberOfRefused(), 1u);
}

TEST_F(ConnectionGuardTest, WhatNobodyGuardsTakesAll)
{
    ConnectionGuard const guard({"127.0.0.1", 1}, {}, 0);
    unsigned long long const before = ConnectionGuard::GET_NUMBER_OF_CALLS();
    EXPECT_GE(take(), 0);
    EXPECT_EQ(ConnectionGuard::GET_NUMBER_OF_CALLS(), before + 1);
    EXPECT_EQ(guard.getNumberOfRefused(), 0u);
}
