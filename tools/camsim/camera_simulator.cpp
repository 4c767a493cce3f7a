#include "camera_simulator.h"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <chrono>
#include <cstdio>
#include <cstring>
#include <ctime>

#include "meta_encoder.h"
#include "sim_md5.h"

namespace camsim {

namespace {

constexpr size_t kMaxRequestBytes = 16 * 1024;
constexpr int kRequestTimeoutMs = 5000;

const struct {
    EFault fault;
    const char* name;
} kFaultNames[] = {
    {EFault::kNone, "none"},
    {EFault::kStatus404, "404"},
    {EFault::kStatus500, "500"},
    {EFault::kStatus503, "503"},
    {EFault::kStatus301, "301"},
    {EFault::kMissingContentLength, "missing-length"},
    {EFault::kWrongContentLength, "wrong-length"},
    {EFault::kShortBody, "short-body"},
    {EFault::kStall, "stall"},
    {EFault::kCloseMidPart, "close-mid-part"},
    {EFault::kGarbage, "garbage"},
    {EFault::kNoStatusLine, "no-status-line"},
};

std::string Lower(std::string s) {
    for (char& c : s) {
        if (c >= 'A' && c <= 'Z') {
            c = static_cast<char>(c - 'A' + 'a');
        }
    }
    return s;
}

// Value of a header (case-insensitive name), without leading blanks; empty when absent.
std::string HeaderValue(const std::string& raw, const char* name) {
    const std::string lower = Lower(raw);
    const std::string key = "\n" + Lower(name) + ":";
    size_t pos = lower.find(key);
    if (pos == std::string::npos) {
        return std::string();
    }
    size_t start = pos + key.size();
    while (start < raw.size() && (raw[start] == ' ' || raw[start] == '\t')) {
        ++start;
    }
    size_t end = raw.find("\r\n", start);
    return raw.substr(start, end == std::string::npos ? std::string::npos : end - start);
}

// A parameter of a Digest header: key="value" or key=value.
std::string DigestParam(const std::string& params, const std::string& key) {
    size_t pos = 0;
    while ((pos = params.find(key + "=", pos)) != std::string::npos) {
        if (pos == 0 || params[pos - 1] == ' ' || params[pos - 1] == ',') {
            break;
        }
        pos += key.size();
    }
    if (pos == std::string::npos) {
        return std::string();
    }
    size_t start = pos + key.size() + 1;
    if (start < params.size() && params[start] == '"') {
        size_t end = params.find('"', start + 1);
        return end == std::string::npos ? std::string() : params.substr(start + 1, end - start - 1);
    }
    size_t end = params.find(',', start);
    return params.substr(start, end == std::string::npos ? std::string::npos : end - start);
}

const char* StatusText(int code) {
    switch (code) {
        case 200:
            return "OK";
        case 301:
            return "Moved Permanently";
        case 401:
            return "Unauthorized";
        case 404:
            return "Not Found";
        case 500:
            return "Internal Server Error";
        default:
            return "Service Unavailable";
    }
}

std::string CamTimText(time_t now, const std::string& dateFormat) {
    std::tm tm{};
    localtime_r(&now, &tm);
    const char* pattern = dateFormat == "mdy"   ? "%m-%d-%Y %a %H:%M:%S"
                          : dateFormat == "dmy" ? "%d-%m-%Y %a %H:%M:%S"
                                                : "%Y-%m-%d %a %H:%M:%S";
    char buf[64];
    std::strftime(buf, sizeof(buf), pattern, &tm);
    return buf;
}

}  // namespace

bool ParseFault(const std::string& name, EFault* fault) {
    for (const auto& f : kFaultNames) {
        if (name == f.name) {
            *fault = f.fault;
            return true;
        }
    }
    return false;
}

const char* FaultName(EFault fault) {
    for (const auto& f : kFaultNames) {
        if (f.fault == fault) {
            return f.name;
        }
    }
    return "none";
}

CCameraSimulator::CCameraSimulator(SSimulatorConfig config) : m_config(std::move(config)) {}

CCameraSimulator::~CCameraSimulator() {
    Stop();
}

uint16_t CCameraSimulator::Start() {
    if (m_listenFd >= 0) {
        return m_port;
    }
    m_listenFd = socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
    if (m_listenFd < 0) {
        return 0;
    }
    int one = 1;
    setsockopt(m_listenFd, SOL_SOCKET, SO_REUSEADDR, &one, sizeof(one));
    sockaddr_in sin{};
    sin.sin_family = AF_INET;
    sin.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    sin.sin_port = htons(m_config.port);
    socklen_t len = sizeof(sin);
    if (bind(m_listenFd, reinterpret_cast<sockaddr*>(&sin), sizeof(sin)) != 0 ||
        listen(m_listenFd, 16) != 0 ||
        getsockname(m_listenFd, reinterpret_cast<sockaddr*>(&sin), &len) != 0) {
        close(m_listenFd);
        m_listenFd = -1;
        return 0;
    }
    m_port = ntohs(sin.sin_port);
    m_stop = false;
    m_acceptThread = std::thread([this] { AcceptLoop(); });
    return m_port;
}

void CCameraSimulator::Stop() {
    m_stop = true;
    if (m_acceptThread.joinable()) {
        m_acceptThread.join();
    }
    {
        std::lock_guard<std::mutex> guard(m_mutex);
        for (int fd : m_clientFds) {
            shutdown(fd, SHUT_RDWR);
        }
    }
    std::list<std::thread> threads;
    {
        std::lock_guard<std::mutex> guard(m_mutex);
        threads.swap(m_clientThreads);
    }
    for (std::thread& t : threads) {
        t.join();
    }
    if (m_listenFd >= 0) {
        close(m_listenFd);
        m_listenFd = -1;
    }
}

std::vector<SRequest> CCameraSimulator::Requests() {
    std::lock_guard<std::mutex> guard(m_mutex);
    return m_requests;
}

void CCameraSimulator::AcceptLoop() {
    while (!m_stop) {
        pollfd pfd{m_listenFd, POLLIN, 0};
        if (poll(&pfd, 1, 100) <= 0) {
            continue;
        }
        int fd = accept4(m_listenFd, nullptr, nullptr, SOCK_CLOEXEC);
        if (fd < 0) {
            continue;
        }
        ++m_connections;
        std::lock_guard<std::mutex> guard(m_mutex);
        m_clientFds.insert(fd);
        m_clientThreads.emplace_back([this, fd] { Serve(fd); });
    }
}

bool CCameraSimulator::Sleep(int ms) {
    auto until = std::chrono::steady_clock::now() + std::chrono::milliseconds(ms);
    while (!m_stop && std::chrono::steady_clock::now() < until) {
        std::this_thread::sleep_for(std::chrono::milliseconds(ms < 20 ? ms : 20));
    }
    return !m_stop;
}

bool CCameraSimulator::SendAll(int fd, const std::string& data) {
    size_t sent = 0;
    while (sent < data.size() && !m_stop) {
        ssize_t n = send(fd, data.data() + sent, data.size() - sent, MSG_NOSIGNAL);
        if (n <= 0) {
            return false;
        }
        sent += static_cast<size_t>(n);
    }
    return sent == data.size();
}

void CCameraSimulator::Serve(int fd) {
    std::string raw;
    char buf[2048];
    auto deadline = std::chrono::steady_clock::now() + std::chrono::milliseconds(kRequestTimeoutMs);
    while (!m_stop && raw.find("\r\n\r\n") == std::string::npos && raw.size() < kMaxRequestBytes &&
           std::chrono::steady_clock::now() < deadline) {
        pollfd pfd{fd, POLLIN, 0};
        if (poll(&pfd, 1, 100) <= 0) {
            continue;
        }
        ssize_t n = recv(fd, buf, sizeof(buf), 0);
        if (n <= 0) {
            break;
        }
        raw.append(buf, static_cast<size_t>(n));
    }
    if (raw.find("\r\n\r\n") != std::string::npos) {
        SRequest req;
        req.raw = raw;
        size_t sp1 = raw.find(' ');
        size_t sp2 = sp1 == std::string::npos ? sp1 : raw.find(' ', sp1 + 1);
        if (sp2 != std::string::npos) {
            req.method = raw.substr(0, sp1);
            req.path = raw.substr(sp1 + 1, sp2 - sp1 - 1);
        }
        req.authorization = HeaderValue(raw, "Authorization");
        {
            std::lock_guard<std::mutex> guard(m_mutex);
            m_requests.push_back(req);
        }
        std::string challenge;
        const bool stream = req.path.rfind("/metadata.cgi", 0) == 0;
        if (!Authorised(req, stream, &challenge)) {
            std::string body = "Unauthorized\r\n";
            SendAll(fd, "HTTP/1.0 401 Unauthorized\r\n" + challenge +
                            "Content-Type: text/plain\r\nContent-Length: " +
                            std::to_string(body.size()) + "\r\n\r\n" + body);
        } else if (stream) {
            ServeStream(fd);
        } else {
            AnswerCgi(fd, req);
        }
    }
    {
        std::lock_guard<std::mutex> guard(m_mutex);
        m_clientFds.erase(fd);
    }
    shutdown(fd, SHUT_RDWR);
    close(fd);
}

std::string CCameraSimulator::NewNonce() {
    std::lock_guard<std::mutex> guard(m_mutex);
    std::string nonce = Md5Hex("camsim-nonce-" + std::to_string(++m_nonceSerial) + "-" +
                               std::to_string(static_cast<long>(time(nullptr))));
    m_nonces.insert(nonce);
    return nonce;
}

bool CCameraSimulator::CheckDigest(const std::string& authorization) {
    if (authorization.rfind("Digest ", 0) != 0) {
        return false;
    }
    const std::string p = authorization.substr(7);
    const std::string nonce = DigestParam(p, "nonce");
    {
        std::lock_guard<std::mutex> guard(m_mutex);
        if (m_nonces.count(nonce) == 0) {
            return false;
        }
    }
    if (DigestParam(p, "username") != m_config.user || DigestParam(p, "realm") != m_config.realm) {
        return false;
    }
    const std::string ha1 = Md5Hex(m_config.user + ":" + m_config.realm + ":" + m_config.password);
    const std::string ha2 = Md5Hex("GET:" + DigestParam(p, "uri"));
    const std::string qop = DigestParam(p, "qop");
    const std::string expected = qop.empty()
                                     ? Md5Hex(ha1 + ":" + nonce + ":" + ha2)
                                     : Md5Hex(ha1 + ":" + nonce + ":" + DigestParam(p, "nc") + ":" +
                                              DigestParam(p, "cnonce") + ":" + qop + ":" + ha2);
    return DigestParam(p, "response") == expected;
}

bool CCameraSimulator::Authorised(const SRequest& req, bool stream, std::string* challenge) {
    if (!m_config.requireAuth) {
        return true;
    }
    if (stream && m_config.digest) {
        if (CheckDigest(req.authorization)) {
            ++m_digestAccepted;
            return true;
        }
        *challenge = "WWW-Authenticate: Digest realm=\"" + m_config.realm + "\", nonce=\"" +
                     NewNonce() + "\", qop=\"auth\"\r\n";
        return false;
    }
    if (req.authorization == "Basic " + Base64(m_config.user + ":" + m_config.password)) {
        return true;
    }
    *challenge = "WWW-Authenticate: Basic realm=\"" + m_config.realm + "\"\r\n";
    return false;
}

void CCameraSimulator::AnswerCgi(int fd, const SRequest& req) {
    std::string body;
    if (req.path.rfind("/command/inquiry.cgi?inq=system", 0) == 0) {
        body = "ModelName=CAMSIM\r\nDateFormat=" + m_config.dateFormat + "\r\n";
    } else if (req.path.rfind("/command/inquiry.cgi?inq=metadata", 0) == 0) {
        body = "MovingObjectDetectionVersion=" + m_config.dmoVersion +
               "\r\nUnattendedObjectDetectionVersion=" + m_config.dsoVersion + "\r\n";
    } else {
        body = "OK\r\n";
    }
    int status = 200;
    switch (m_config.cgiFault) {
        case EFault::kStatus404:
            status = 404;
            break;
        case EFault::kStatus500:
            status = 500;
            break;
        case EFault::kStatus503:
            status = 503;
            break;
        case EFault::kStatus301:
            status = 301;
            break;
        case EFault::kStall:
            while (Sleep(50)) {
            }
            return;
        case EFault::kGarbage:
            SendAll(fd, std::string("\x01\xff\x7fgarbage\x00\x10", 12));
            return;
        case EFault::kNoStatusLine:
            SendAll(fd, body);
            return;
        default:
            break;
    }
    std::string head = "HTTP/1.0 " + std::to_string(status) + " " + StatusText(status) +
                       "\r\nContent-Type: text/plain\r\n";
    size_t announced = body.size();
    if (m_config.cgiFault == EFault::kWrongContentLength) {
        announced += 5;
    }
    if (m_config.cgiFault != EFault::kMissingContentLength) {
        head += "Content-Length: " + std::to_string(announced) + "\r\n";
    }
    std::string answer = head + "\r\n" + body;
    if (m_config.cgiFault == EFault::kShortBody) {
        answer.resize(answer.size() - 2);
    }
    SendAll(fd, answer);
}

void CCameraSimulator::ServeStream(int fd) {
    if (!SendAll(fd,
                 "HTTP/1.0 200 OK\r\nContent-Type: multipart/x-mixed-replace;"
                 "boundary=myboundary\r\n\r\n")) {
        return;
    }
    const int periodMs = m_config.fps > 0 ? static_cast<int>(1000.0 / m_config.fps) : 100;
    CMetaEncoder encoder;
    encoder.SetGrid(m_config.gridWidth, m_config.gridHeight);
    for (uint32_t frame = 0; !m_stop && (m_config.maxFrames == 0 || frame < m_config.maxFrames);
         ++frame) {
        const bool faulty =
            m_config.streamFault != EFault::kNone && frame >= m_config.faultAfterFrames;
        if (faulty && m_config.streamFault == EFault::kStall) {
            while (Sleep(50)) {
            }
            return;
        }
        if (faulty && m_config.streamFault == EFault::kGarbage) {
            SendAll(fd, std::string("\x00\x13garbage-bytes\xff\xfe\r\n", 19));
            Sleep(periodMs);
            continue;
        }
        // Objects move across the grid along their own straight tracks, bouncing at its edges.
        const time_t now = time(nullptr);
        encoder.ClearObjects();
        encoder.SetTime(static_cast<uint32_t>(now),
                        (frame * static_cast<uint32_t>(periodMs)) % 1000);
        const int boxW = m_config.gridWidth / 8 + 1;
        const int boxH = m_config.gridHeight / 6 + 1;
        for (int i = 0; i < m_config.objects; ++i) {
            const int spanX = m_config.gridWidth - boxW > 0 ? m_config.gridWidth - boxW : 1;
            const int spanY = m_config.gridHeight - boxH > 0 ? m_config.gridHeight - boxH : 1;
            int x = static_cast<int>((frame * (2 + i) + i * 17) % (2 * spanX));
            int y = static_cast<int>((frame * (1 + i % 3) + i * 11) % (2 * spanY));
            x = x < spanX ? x : 2 * spanX - x;
            y = y < spanY ? y : 2 * spanY - y;
            SMetaObject obj;
            obj.objectId = static_cast<uint32_t>(i + 1);
            obj.boxX1 = static_cast<uint16_t>(x);
            obj.boxY1 = static_cast<uint16_t>(y);
            obj.boxX2 = static_cast<uint16_t>(x + boxW - 1);
            obj.boxY2 = static_cast<uint16_t>(y + boxH - 1);
            encoder.AddObject(obj);
        }
        std::vector<uint8_t> data = encoder.Encode();
        std::string payload(data.begin(), data.end());
        std::string length = "Content-Length: " + std::to_string(payload.size()) + "\r\n";
        if (faulty && m_config.streamFault == EFault::kMissingContentLength) {
            length.clear();
        } else if (faulty && m_config.streamFault == EFault::kWrongContentLength) {
            length = "Content-Length: abc\r\n";
        }
        std::string part = "--myboundary\r\nContent-Type: application/octet-stream\r\n" + length +
                           "CamTim: " + CamTimText(now, m_config.dateFormat) +
                           "\r\nTimStamp: " + std::to_string(frame + 1) + "\r\n\r\n";
        if (faulty && m_config.streamFault == EFault::kShortBody) {
            payload.resize(payload.size() / 2);
        }
        if (faulty && m_config.streamFault == EFault::kCloseMidPart) {
            SendAll(fd, part + payload.substr(0, payload.size() / 2));
            return;
        }
        if (!SendAll(fd, part + payload + "\r\n")) {
            return;
        }
        ++m_framesSent;
        if (!Sleep(periodMs)) {
            return;
        }
    }
}

}  // namespace camsim
