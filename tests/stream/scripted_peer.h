#ifndef QUORVEX_TESTS_STREAM_SCRIPTED_PEER_H
#define QUORVEX_TESTS_STREAM_SCRIPTED_PEER_H

#include <atomic>
#include <cstdint>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace testkit {

// A TCP listener on 127.0.0.1 (ephemeral port) that answers each connection with the next
// reply of its script, byte for byte, for answers no well-behaved server would give.
class CScriptedPeer {
public:
    struct SReply {
        std::string bytes;
        uint32_t delayMs = 0;  // wait this long after the request before answering
        bool hold = false;     // after answering, keep the connection open until destroyed
    };

    explicit CScriptedPeer(std::vector<SReply> script);
    ~CScriptedPeer();
    CScriptedPeer(const CScriptedPeer&) = delete;
    CScriptedPeer& operator=(const CScriptedPeer&) = delete;

    uint16_t Port() const { return m_port; }
    // The requests received so far, one per connection, up to their blank line.
    std::vector<std::string> Requests();
    int Connections() const { return m_connections; }

private:
    void Run();
    void Serve(int fd, const SReply& reply);

    std::vector<SReply> m_script;
    int m_listener = -1;
    uint16_t m_port = 0;
    std::atomic<bool> m_stop{false};
    std::atomic<int> m_connections{0};
    std::mutex m_mutex;
    std::vector<std::string> m_requests;
    std::thread m_thread;
};

// A port on 127.0.0.1 whose accept queue is full, so that a further connection attempt
// stays pending: a camera that does not answer the connection request.
class CStalledListener {
public:
    CStalledListener();
    ~CStalledListener();
    CStalledListener(const CStalledListener&) = delete;
    CStalledListener& operator=(const CStalledListener&) = delete;
    uint16_t Port() const { return m_port; }

private:
    int m_listener = -1;
    int m_filler = -1;
    uint16_t m_port = 0;
};

// A port on 127.0.0.1 on which nothing listens.
uint16_t UnusedPort();

}  // namespace testkit

#endif  // QUORVEX_TESTS_STREAM_SCRIPTED_PEER_H
