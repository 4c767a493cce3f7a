#ifndef QUORVEX_TOOLS_CAMSIM_CAMERA_SIMULATOR_H
#define QUORVEX_TOOLS_CAMSIM_CAMERA_SIMULATOR_H

#include <atomic>
#include <cstdint>
#include <list>
#include <mutex>
#include <set>
#include <string>
#include <thread>
#include <vector>

namespace camsim {

// Faults the simulator can inject into CGI answers or into the metadata stream.
enum class EFault {
    kNone,
    kStatus404,
    kStatus500,
    kStatus503,
    kStatus301,
    kMissingContentLength,  // CGI: no header; stream: a part without it
    kWrongContentLength,    // CGI: announces more than it sends; stream: "Content-Length: abc"
    kShortBody,             // fewer bytes than announced, then the connection closes
    kStall,                 // stops sending but keeps the connection open
    kCloseMidPart,          // stream: closes in the middle of a part
    kGarbage,               // bytes that are no HTTP at all
    kNoStatusLine,          // CGI: the body alone, without status line and headers
};

// Name used on the command line ("404", "missing-length", ...); false when unknown.
bool ParseFault(const std::string& name, EFault* fault);
const char* FaultName(EFault fault);

struct SSimulatorConfig {
    uint16_t port = 0;  // 0: an ephemeral port
    bool requireAuth = true;
    std::string user = "admin";
    std::string password = "admin";
    bool digest = false;  // the stream demands Digest authentication
    std::string realm = "camsim";
    std::string dateFormat = "ymd";  // ymd, mdy or dmy
    std::string dmoVersion = "1.0.0";
    std::string dsoVersion = "1.0.0";
    double fps = 10.0;
    int objects = 2;
    uint16_t gridWidth = 160;
    uint16_t gridHeight = 120;
    uint32_t maxFrames = 0;  // per stream connection; 0 = until the client goes
    EFault cgiFault = EFault::kNone;
    EFault streamFault = EFault::kNone;
    uint32_t faultAfterFrames = 0;  // stream faults start after this many good frames
};

struct SRequest {
    std::string method;
    std::string path;
    std::string authorization;
    std::string raw;
};

// A network camera with video analytics on 127.0.0.1: HTTP/1.0 inquiries and commands with
// Basic authentication, and a multipart metadata stream ("--myboundary" parts carrying binary
// object metadata) that may demand Digest authentication.
class CCameraSimulator {
public:
    explicit CCameraSimulator(SSimulatorConfig config = SSimulatorConfig());
    ~CCameraSimulator();
    CCameraSimulator(const CCameraSimulator&) = delete;
    CCameraSimulator& operator=(const CCameraSimulator&) = delete;

    // Listens and returns the port, or 0 when the socket cannot be had.
    uint16_t Start();
    // Closes every connection and joins every thread; returns within about a second.
    void Stop();
    uint16_t Port() const { return m_port; }

    std::vector<SRequest> Requests();
    int Connections() const { return m_connections.load(); }
    int FramesSent() const { return m_framesSent.load(); }
    int DigestAccepted() const { return m_digestAccepted.load(); }

private:
    void AcceptLoop();
    void Serve(int fd);
    void AnswerCgi(int fd, const SRequest& req);
    void ServeStream(int fd);
    bool Authorised(const SRequest& req, bool stream, std::string* challenge);
    bool CheckDigest(const std::string& authorization);
    std::string NewNonce();
    bool SendAll(int fd, const std::string& data);
    bool Sleep(int ms);

    SSimulatorConfig m_config;
    int m_listenFd = -1;
    uint16_t m_port = 0;
    std::atomic<bool> m_stop{false};
    std::thread m_acceptThread;
    std::mutex m_mutex;  // requests, client sockets, threads, nonces
    std::vector<SRequest> m_requests;
    std::set<int> m_clientFds;
    std::list<std::thread> m_clientThreads;
    std::set<std::string> m_nonces;
    uint32_t m_nonceSerial = 0;
    std::atomic<int> m_connections{0};
    std::atomic<int> m_framesSent{0};
    std::atomic<int> m_digestAccepted{0};
};

}  // namespace camsim

#endif  // QUORVEX_TOOLS_CAMSIM_CAMERA_SIMULATOR_H
