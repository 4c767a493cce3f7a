#include "scripted_peer.h"

#include <arpa/inet.h>
#include <fcntl.h>
#include <netinet/in.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <chrono>
#include <stdexcept>

namespace testkit {

namespace {

int ListenLoopback(int backlog, uint16_t* port) {
    int fd = socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
    if (fd < 0) {
        throw std::runtime_error("socket");
    }
    sockaddr_in addr{};
    addr.sin_family = AF_INET;
    addr.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t len = sizeof(addr);
    if (bind(fd, reinterpret_cast<sockaddr*>(&addr), sizeof(addr)) != 0 ||
        listen(fd, backlog) != 0 ||
        getsockname(fd, reinterpret_cast<sockaddr*>(&addr), &len) != 0) {
        close(fd);
        throw std::runtime_error("listen");
    }
    *port = ntohs(addr.sin_port);
    return fd;
}

bool WaitReadable(int fd, int ms) {
    pollfd p{fd, POLLIN, 0};
    return poll(&p, 1, ms) > 0;
}

}  // namespace

CScriptedPeer::CScriptedPeer(std::vector<SReply> script) : m_script(std::move(script)) {
    m_listener = ListenLoopback(16, &m_port);
    m_thread = std::thread([this] { Run(); });
}

CScriptedPeer::~CScriptedPeer() {
    m_stop = true;
    m_thread.join();
    close(m_listener);
}

std::vector<std::string> CScriptedPeer::Requests() {
    std::lock_guard<std::mutex> lock(m_mutex);
    return m_requests;
}

void CScriptedPeer::Run() {
    size_t next = 0;
    while (!m_stop) {
        if (!WaitReadable(m_listener, 20)) {
            continue;
        }
        int fd = accept(m_listener, nullptr, nullptr);
        if (fd < 0) {
            continue;
        }
        ++m_connections;
        if (next < m_script.size()) {
            Serve(fd, m_script[next++]);
        }
        shutdown(fd, SHUT_RDWR);
        close(fd);
    }
}

void CScriptedPeer::Serve(int fd, const SReply& reply) {
    std::string request;
    char buf[512];
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(2);
    while (request.find("\r\n\r\n") == std::string::npos &&
           std::chrono::steady_clock::now() < deadline && !m_stop) {
        if (!WaitReadable(fd, 20)) {
            continue;
        }
        ssize_t n = recv(fd, buf, sizeof(buf), 0);
        if (n <= 0) {
            break;
        }
        request.append(buf, static_cast<size_t>(n));
    }
    {
        std::lock_guard<std::mutex> lock(m_mutex);
        m_requests.push_back(request);
    }
    const auto answerAt =
        std::chrono::steady_clock::now() + std::chrono::milliseconds(reply.delayMs);
    while (!m_stop && std::chrono::steady_clock::now() < answerAt) {
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    size_t sent = 0;
    while (sent < reply.bytes.size()) {
        ssize_t n = send(fd, reply.bytes.data() + sent, reply.bytes.size() - sent, MSG_NOSIGNAL);
        if (n <= 0) {
            break;
        }
        sent += static_cast<size_t>(n);
    }
    while (reply.hold && !m_stop) {
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
}

CStalledListener::CStalledListener() {
    m_listener = ListenLoopback(0, &m_port);
    // A backlog of 0 still admits one connection; it fills the queue.
    m_filler = socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
    sockaddr_in addr{};
    addr.sin_family = AF_INET;
    addr.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    addr.sin_port = htons(m_port);
    if (connect(m_filler, reinterpret_cast<sockaddr*>(&addr), sizeof(addr)) != 0) {
        throw std::runtime_error("filler connect");
    }
}

CStalledListener::~CStalledListener() {
    close(m_filler);
    close(m_listener);
}

uint16_t UnusedPort() {
    uint16_t port = 0;
    int fd = ListenLoopback(1, &port);
    close(fd);
    return port;
}

}  // namespace testkit
