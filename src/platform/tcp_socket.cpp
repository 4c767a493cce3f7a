#include "platform/tcp_socket.h"

#include <arpa/inet.h>
#include <fcntl.h>
#include <netdb.h>
#include <netinet/in.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

namespace plat {

const int kSockErrWouldBlock = EWOULDBLOCK;
const int kSockErrTimedOut = ETIMEDOUT;
const int kSockErrConnRefused = ECONNREFUSED;

namespace {

thread_local int t_lastError = 0;

int Fail() {
    t_lastError = errno;
    return -1;
}

int WaitFor(SocketHandle s, short events, uint32_t timeoutMs) {
    if (s < 0) {
        t_lastError = EBADF;
        return -1;
    }
    pollfd pfd{s, events, 0};
    int timeout =
        timeoutMs > static_cast<uint32_t>(INT32_MAX) ? INT32_MAX : static_cast<int>(timeoutMs);
    for (;;) {
        int rc = poll(&pfd, 1, timeout);
        if (rc < 0 && errno == EINTR) {
            continue;
        }
        if (rc < 0) {
            return Fail();
        }
        if (rc == 0) {
            return 0;
        }
        if ((pfd.revents & POLLNVAL) != 0) {
            t_lastError = EBADF;
            return -1;
        }
        // An error or hang-up also makes the next call return at once, as select reports it.
        return 1;
    }
}

}  // namespace

bool ParseIpv4(const char* text, uint32_t* address) {
    if (text == nullptr) {
        return false;
    }
    in_addr addr{};
    if (inet_pton(AF_INET, text, &addr) != 1) {
        return false;
    }
    *address = ntohl(addr.s_addr);
    return true;
}

bool ResolveIpv4(const char* host, uint32_t* address) {
    if (host == nullptr || *host == '\0') {
        return false;
    }
    if (ParseIpv4(host, address)) {
        return true;
    }
    addrinfo hints{};
    hints.ai_family = AF_INET;
    hints.ai_socktype = SOCK_STREAM;
    addrinfo* result = nullptr;
    if (getaddrinfo(host, nullptr, &hints, &result) != 0 || result == nullptr) {
        return false;
    }
    bool found = false;
    for (addrinfo* it = result; it != nullptr; it = it->ai_next) {
        if (it->ai_family == AF_INET && it->ai_addr != nullptr) {
            sockaddr_in sin{};
            std::memcpy(&sin, it->ai_addr, sizeof(sin));
            *address = ntohl(sin.sin_addr.s_addr);
            found = true;
            break;
        }
    }
    freeaddrinfo(result);
    return found;
}

SocketHandle SocketCreateTcp() {
    int s = socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, IPPROTO_TCP);
    if (s < 0) {
        return Fail();
    }
    return s;
}

bool SocketSetNonBlocking(SocketHandle s, bool nonBlocking) {
    int flags = fcntl(s, F_GETFL, 0);
    if (flags < 0) {
        return Fail() == 0;
    }
    flags = nonBlocking ? (flags | O_NONBLOCK) : (flags & ~O_NONBLOCK);
    if (fcntl(s, F_SETFL, flags) != 0) {
        return Fail() == 0;
    }
    return true;
}

int SocketConnect(SocketHandle s, const SIpv4Endpoint& peer) {
    sockaddr_in sin{};
    sin.sin_family = AF_INET;
    sin.sin_port = htons(peer.port);
    sin.sin_addr.s_addr = htonl(peer.address);
    if (connect(s, reinterpret_cast<const sockaddr*>(&sin), sizeof(sin)) == 0) {
        return 0;
    }
    if (errno == EINPROGRESS || errno == EWOULDBLOCK || errno == EAGAIN) {
        t_lastError = kSockErrWouldBlock;
        return 1;
    }
    return Fail();
}

int SocketConnectResult(SocketHandle s) {
    int err = 0;
    socklen_t len = sizeof(err);
    if (getsockopt(s, SOL_SOCKET, SO_ERROR, &err, &len) != 0) {
        return errno;
    }
    return err;
}

int SocketWaitReadable(SocketHandle s, uint32_t timeoutMs) {
    return WaitFor(s, POLLIN, timeoutMs);
}

int SocketWaitWritable(SocketHandle s, uint32_t timeoutMs) {
    return WaitFor(s, POLLOUT, timeoutMs);
}

long SocketSend(SocketHandle s, const void* data, size_t len) {
    for (;;) {
        ssize_t n = send(s, data, len, MSG_NOSIGNAL);
        if (n < 0 && errno == EINTR) {
            continue;
        }
        if (n < 0) {
            return Fail();
        }
        return static_cast<long>(n);
    }
}

long SocketRecv(SocketHandle s, void* data, size_t len, int flags) {
    for (;;) {
        ssize_t n = recv(s, data, len, flags);
        if (n < 0 && errno == EINTR) {
            continue;
        }
        if (n < 0) {
            return Fail();
        }
        return static_cast<long>(n);
    }
}

bool SocketSetRecvBuffer(SocketHandle s, int bytes) {
    if (setsockopt(s, SOL_SOCKET, SO_RCVBUF, &bytes, sizeof(bytes)) != 0) {
        return Fail() == 0;
    }
    return true;
}

void SocketShutdownBoth(SocketHandle s) {
    if (s >= 0) {
        shutdown(s, SHUT_RDWR);
    }
}

void SocketClose(SocketHandle s) {
    if (s >= 0) {
        close(s);
    }
}

int SocketLastError() {
    return t_lastError;
}

}  // namespace plat
