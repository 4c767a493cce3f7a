#include "platform/tcp_socket.h"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <sys/socket.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <thread>

#include "platform/clock.h"

namespace {

// A listening socket on 127.0.0.1 with an ephemeral port.
class CListener {
public:
    CListener() {
        m_fd = socket(AF_INET, SOCK_STREAM, 0);
        sockaddr_in sin{};
        sin.sin_family = AF_INET;
        sin.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        bind(m_fd, reinterpret_cast<sockaddr*>(&sin), sizeof(sin));
        listen(m_fd, 4);
        socklen_t len = sizeof(sin);
        getsockname(m_fd, reinterpret_cast<sockaddr*>(&sin), &len);
        m_port = ntohs(sin.sin_port);
    }
    ~CListener() { Close(); }
    void Close() {
        if (m_fd >= 0) {
            close(m_fd);
            m_fd = -1;
        }
    }
    int Accept() { return accept(m_fd, nullptr, nullptr); }
    uint16_t Port() const { return m_port; }

private:
    int m_fd = -1;
    uint16_t m_port = 0;
};

plat::SocketHandle ConnectTo(uint16_t port, uint32_t timeoutMs) {
    plat::SocketHandle s = plat::SocketCreateTcp();
    if (s == plat::kInvalidSocket || !plat::SocketSetNonBlocking(s, true)) {
        return plat::kInvalidSocket;
    }
    plat::SIpv4Endpoint peer;
    EXPECT_TRUE(plat::ParseIpv4("127.0.0.1", &peer.address));
    peer.port = port;
    int rc = plat::SocketConnect(s, peer);
    if (rc == 1) {
        if (plat::SocketWaitWritable(s, timeoutMs) != 1 || plat::SocketConnectResult(s) != 0) {
            plat::SocketClose(s);
            return plat::kInvalidSocket;
        }
    } else if (rc != 0) {
        plat::SocketClose(s);
        return plat::kInvalidSocket;
    }
    return s;
}

}  // namespace

TEST(TcpSocket, ParsesAndResolvesIpv4) {
    uint32_t addr = 0;
    ASSERT_TRUE(plat::ParseIpv4("192.168.1.20", &addr));
    EXPECT_EQ(0xC0A80114u, addr);
    EXPECT_FALSE(plat::ParseIpv4("192.168.1", &addr));
    EXPECT_FALSE(plat::ParseIpv4("camera", &addr));
    ASSERT_TRUE(plat::ResolveIpv4("localhost", &addr));
    EXPECT_EQ(0x7F000001u, addr);
    EXPECT_FALSE(plat::ResolveIpv4("", &addr));
    EXPECT_FALSE(plat::ResolveIpv4("no-such-host.invalid", &addr));
}

TEST(TcpSocket, ExchangesBytesWithLoopbackListener) {
    CListener listener;
    plat::SocketHandle s = ConnectTo(listener.Port(), 2000);
    ASSERT_NE(plat::kInvalidSocket, s);
    int peer = listener.Accept();
    ASSERT_GE(peer, 0);

    const char request[] = "GET / HTTP/1.0\r\n\r\n";
    EXPECT_EQ(static_cast<long>(sizeof(request) - 1),
              plat::SocketSend(s, request, sizeof(request) - 1));
    char got[64] = {};
    ASSERT_EQ(static_cast<ssize_t>(sizeof(request) - 1), recv(peer, got, sizeof(got), 0));
    EXPECT_STREQ(request, got);

    ASSERT_EQ(5, send(peer, "hello", 5, 0));
    ASSERT_EQ(1, plat::SocketWaitReadable(s, 2000));
    char buf[16] = {};
    EXPECT_EQ(5, plat::SocketRecv(s, buf, sizeof(buf)));
    EXPECT_STREQ("hello", buf);

    // Peer closes: readable, then a receive of 0; a send must not raise SIGPIPE.
    close(peer);
    ASSERT_EQ(1, plat::SocketWaitReadable(s, 2000));
    EXPECT_EQ(0, plat::SocketRecv(s, buf, sizeof(buf)));
    for (int i = 0; i < 5 && plat::SocketSend(s, "x", 1) > 0; ++i) {
        plat::SleepMs(10);
    }
    EXPECT_EQ(-1, plat::SocketSend(s, "x", 1));
    plat::SocketShutdownBoth(s);
    plat::SocketClose(s);
}

TEST(TcpSocket, RefusedConnectionIsReported) {
    uint16_t port;
    {
        CListener listener;
        port = listener.Port();
    }
    plat::SocketHandle s = plat::SocketCreateTcp();
    ASSERT_NE(plat::kInvalidSocket, s);
    ASSERT_TRUE(plat::SocketSetNonBlocking(s, true));
    plat::SIpv4Endpoint peer{0x7F000001u, port};
    int rc = plat::SocketConnect(s, peer);
    if (rc == 1) {
        ASSERT_EQ(1, plat::SocketWaitWritable(s, 2000));
        EXPECT_EQ(plat::kSockErrConnRefused, plat::SocketConnectResult(s));
    } else {
        EXPECT_EQ(-1, rc);
        EXPECT_EQ(plat::kSockErrConnRefused, plat::SocketLastError());
    }
    plat::SocketClose(s);
}

TEST(TcpSocket, ReceiveWaitTimesOutOnSilentPeer) {
    CListener listener;
    plat::SocketHandle s = ConnectTo(listener.Port(), 2000);
    ASSERT_NE(plat::kInvalidSocket, s);
    int peer = listener.Accept();
    uint32_t start = plat::TickCount();
    EXPECT_EQ(0, plat::SocketWaitReadable(s, 150));
    uint32_t elapsed = plat::TickCount() - start;
    EXPECT_GE(elapsed, 145u);
    EXPECT_LT(elapsed, 2000u);
    char c;
    EXPECT_EQ(-1, plat::SocketRecv(s, &c, 1));
    EXPECT_EQ(plat::kSockErrWouldBlock, plat::SocketLastError());
    EXPECT_TRUE(plat::SocketSetRecvBuffer(s, 0));
    close(peer);
    plat::SocketClose(s);
}

TEST(TcpSocket, WaitOnInvalidHandleFails) {
    EXPECT_EQ(-1, plat::SocketWaitReadable(plat::kInvalidSocket, 10));
    EXPECT_EQ(-1, plat::SocketWaitWritable(plat::kInvalidSocket, 10));
}
