#ifndef QUORVEX_PLATFORM_TCP_SOCKET_H
#define QUORVEX_PLATFORM_TCP_SOCKET_H

#include <cstddef>
#include <cstdint>

namespace plat {

// IPv4 TCP client sockets. Handles are plain integers; kInvalidSocket means none.
// Sockets never raise SIGPIPE: a camera that closes the connection makes a send fail
// with an error instead of killing the host process.
using SocketHandle = int;
constexpr SocketHandle kInvalidSocket = -1;

// Error numbers as SocketLastError reports them (the system's errno values).
extern const int kSockErrWouldBlock;  // operation would block / connect in progress
extern const int kSockErrTimedOut;
extern const int kSockErrConnRefused;

// An IPv4 address and port, both in host byte order.
struct SIpv4Endpoint {
    uint32_t address = 0;
    uint16_t port = 0;
};

// A dotted IPv4 address; false when the text is not one.
bool ParseIpv4(const char* text, uint32_t* address);
// Dotted address first, else a name lookup taking the first IPv4 address.
bool ResolveIpv4(const char* host, uint32_t* address);

SocketHandle SocketCreateTcp();
bool SocketSetNonBlocking(SocketHandle s, bool nonBlocking);
// 0 connected, 1 in progress (wait for writability), -1 failed (see SocketLastError).
int SocketConnect(SocketHandle s, const SIpv4Endpoint& peer);
// The outcome of a connect that was in progress: 0 connected, else the error number.
int SocketConnectResult(SocketHandle s);
// select-style waits: 1 ready, 0 timed out, -1 failed.
int SocketWaitReadable(SocketHandle s, uint32_t timeoutMs);
int SocketWaitWritable(SocketHandle s, uint32_t timeoutMs);
// Bytes sent or received, 0 when the peer closed (receive), -1 on error.
long SocketSend(SocketHandle s, const void* data, size_t len);
long SocketRecv(SocketHandle s, void* data, size_t len, int flags = 0);
bool SocketSetRecvBuffer(SocketHandle s, int bytes);
void SocketShutdownBoth(SocketHandle s);
void SocketClose(SocketHandle s);
int SocketLastError();

}  // namespace plat

#endif  // QUORVEX_PLATFORM_TCP_SOCKET_H
