#include "camera_simulator.h"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include <chrono>
#include <cstring>
#include <string>

#include "sim_md5.h"

namespace {

using camsim::CCameraSimulator;
using camsim::EFault;
using camsim::SSimulatorConfig;

int Connect(uint16_t port) {
    int fd = socket(AF_INET, SOCK_STREAM, 0);
    sockaddr_in sin{};
    sin.sin_family = AF_INET;
    sin.sin_port = htons(port);
    sin.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    EXPECT_EQ(0, connect(fd, reinterpret_cast<sockaddr*>(&sin), sizeof(sin)));
    return fd;
}

// Reads until the peer closes, maxBytes arrive or nothing comes for idleMs.
std::string ReadAll(int fd, int idleMs = 1500, size_t maxBytes = 1 << 20) {
    std::string out;
    char buf[4096];
    while (out.size() < maxBytes) {
        pollfd pfd{fd, POLLIN, 0};
        if (poll(&pfd, 1, idleMs) <= 0) {
            break;
        }
        ssize_t n = recv(fd, buf, sizeof(buf), 0);
        if (n <= 0) {
            break;
        }
        out.append(buf, static_cast<size_t>(n));
    }
    return out;
}

std::string Get(uint16_t port, const std::string& path, const std::string& auth,
                size_t maxBytes = 1 << 20) {
    int fd = Connect(port);
    std::string req = "GET " + path + " HTTP/1.0\r\n";
    if (!auth.empty()) {
        req += "Authorization: " + auth + "\r\n";
    }
    req += "\r\n";
    EXPECT_EQ(static_cast<ssize_t>(req.size()), send(fd, req.data(), req.size(), MSG_NOSIGNAL));
    std::string answer = ReadAll(fd, 1500, maxBytes);
    close(fd);
    return answer;
}

std::string Basic(const std::string& user, const std::string& pass) {
    return "Basic " + camsim::Base64(user + ":" + pass);
}

std::string Quoted(const std::string& text, const std::string& key) {
    size_t p = text.find(key + "=\"");
    if (p == std::string::npos) {
        return std::string();
    }
    p += key.size() + 2;
    return text.substr(p, text.find('"', p) - p);
}

}  // namespace

TEST(CameraSimulator, OwnDigestAndBase64MatchTheirReferences) {
    EXPECT_EQ("d41d8cd98f00b204e9800998ecf8427e", camsim::Md5Hex(""));
    EXPECT_EQ("9e107d9d372bb6826bd81d3542a419d6",
              camsim::Md5Hex("The quick brown fox jumps over the lazy dog"));
    EXPECT_EQ(
        "57edf4a22be3c955ac49da2e2107b67a",
        camsim::Md5Hex(
            "12345678901234567890123456789012345678901234567890123456789012345678901234567890"));
    EXPECT_EQ("Zm9vYmFy", camsim::Base64("foobar"));
    EXPECT_EQ("Zm9vYg==", camsim::Base64("foob"));
    EXPECT_EQ("Zm9vYmE=", camsim::Base64("fooba"));
}

TEST(CameraSimulator, AnswersInquiriesAndRemembersCommands) {
    SSimulatorConfig cfg;
    cfg.dateFormat = "dmy";
    cfg.dmoVersion = "1.10.2";
    CCameraSimulator sim(cfg);
    uint16_t port = sim.Start();
    ASSERT_NE(0, port);
    std::string sys = Get(port, "/command/inquiry.cgi?inq=system", Basic("admin", "admin"));
    EXPECT_EQ(0u, sys.find("HTTP/1.0 200 OK\r\n"));
    EXPECT_NE(std::string::npos, sys.find("DateFormat=dmy"));
    std::string body = sys.substr(sys.find("\r\n\r\n") + 4);
    EXPECT_NE(std::string::npos,
              sys.find("Content-Length: " + std::to_string(body.size()) + "\r\n"));
    std::string ver = Get(port, "/command/inquiry.cgi?inq=metadata", Basic("admin", "admin"));
    EXPECT_NE(std::string::npos, ver.find("MovingObjectDetectionVersion=1.10.2\r\n"));
    EXPECT_NE(std::string::npos, ver.find("UnattendedObjectDetectionVersion=1.0.0\r\n"));
    std::string cmd =
        Get(port, "/command/objectdetection.cgi?Od99Mode=mod", Basic("admin", "admin"));
    EXPECT_EQ(0u, cmd.find("HTTP/1.0 200 OK"));
    // Wrong credentials are refused with a Basic challenge.
    std::string refused = Get(port, "/command/x.cgi", Basic("admin", "wrong"));
    EXPECT_EQ(0u, refused.find("HTTP/1.0 401"));
    EXPECT_NE(std::string::npos, refused.find("WWW-Authenticate: Basic"));
    auto requests = sim.Requests();
    ASSERT_EQ(4u, requests.size());
    EXPECT_EQ("/command/objectdetection.cgi?Od99Mode=mod", requests[2].path);
    EXPECT_EQ(Basic("admin", "admin"), requests[2].authorization);
    sim.Stop();
}

TEST(CameraSimulator, StreamPartsCarryHeadersAndMatchingLengths) {
    SSimulatorConfig cfg;
    cfg.fps = 100;
    cfg.maxFrames = 3;
    cfg.objects = 2;
    CCameraSimulator sim(cfg);
    uint16_t port = sim.Start();
    std::string s = Get(port, "/metadata.cgi?format=binary", Basic("admin", "admin"));
    ASSERT_EQ(0u, s.find("HTTP/1.0 200 OK\r\n"));
    size_t pos = s.find("\r\n\r\n") + 4;
    int parts = 0;
    while ((pos = s.find("--myboundary\r\n", pos)) != std::string::npos) {
        size_t headEnd = s.find("\r\n\r\n", pos);
        ASSERT_NE(std::string::npos, headEnd);
        std::string head = s.substr(pos, headEnd - pos);
        EXPECT_NE(std::string::npos, head.find("CamTim: "));
        EXPECT_NE(std::string::npos, head.find("TimStamp: " + std::to_string(parts + 1)));
        size_t cl = head.find("Content-Length: ");
        ASSERT_NE(std::string::npos, cl);
        size_t len = std::stoul(head.substr(cl + 16));
        // Time block, object block of two 20-byte records, end marker.
        EXPECT_EQ(12u + 12u + 40u + 4u, len);
        std::string data = s.substr(headEnd + 4, len);
        EXPECT_EQ(std::string("\xff\xff\xff\xff"), data.substr(len - 4));
        EXPECT_EQ("\r\n", s.substr(headEnd + 4 + len, 2));
        pos = headEnd + 4 + len;
        ++parts;
    }
    EXPECT_EQ(3, parts);
    EXPECT_EQ(3, sim.FramesSent());
}

TEST(CameraSimulator, DigestChallengeAndAcceptance) {
    SSimulatorConfig cfg;
    cfg.digest = true;
    cfg.maxFrames = 1;
    cfg.password = "s3cret";
    CCameraSimulator sim(cfg);
    uint16_t port = sim.Start();
    std::string first = Get(port, "/metadata.cgi", Basic("admin", "s3cret"));
    ASSERT_EQ(0u, first.find("HTTP/1.0 401"));
    const std::string nonce = Quoted(first, "nonce");
    EXPECT_EQ("camsim", Quoted(first, "realm"));
    ASSERT_EQ(32u, nonce.size());
    const std::string ha1 = camsim::Md5Hex("admin:camsim:s3cret");
    const std::string ha2 = camsim::Md5Hex("GET:/metadata.cgi");
    const std::string cnonce = "7f31c08a5be94d26";
    auto line = [&](const std::string& response, const std::string& n) {
        return "Digest username=\"admin\", realm=\"camsim\", nonce=\"" + n +
               "\", uri=\"/metadata.cgi\", qop=auth, nc=00000001, cnonce=\"" + cnonce +
               "\", response=\"" + response + "\", opaque=\"\"";
    };
    const std::string good =
        camsim::Md5Hex(ha1 + ":" + nonce + ":00000001:" + cnonce + ":auth:" + ha2);
    std::string wrong = Get(port, "/metadata.cgi", line(std::string(32, '0'), nonce));
    EXPECT_EQ(0u, wrong.find("HTTP/1.0 401"));
    EXPECT_NE(nonce, Quoted(wrong, "nonce"));  // a fresh nonce with every challenge
    std::string unknownNonce = Get(port, "/metadata.cgi", line(good, std::string(32, 'a')));
    EXPECT_EQ(0u, unknownNonce.find("HTTP/1.0 401"));
    std::string accepted = Get(port, "/metadata.cgi", line(good, nonce));
    EXPECT_EQ(0u, accepted.find("HTTP/1.0 200 OK"));
    EXPECT_NE(std::string::npos, accepted.find("--myboundary"));
    EXPECT_EQ(1, sim.DigestAccepted());
}

TEST(CameraSimulator, CgiFaults) {
    struct {
        EFault fault;
        const char* expectStart;
    } cases[] = {{EFault::kStatus404, "HTTP/1.0 404"},
                 {EFault::kStatus500, "HTTP/1.0 500"},
                 {EFault::kStatus503, "HTTP/1.0 503"},
                 {EFault::kStatus301, "HTTP/1.0 301"},
                 {EFault::kNoStatusLine, "OK\r\n"}};
    for (const auto& c : cases) {
        SSimulatorConfig cfg;
        cfg.cgiFault = c.fault;
        CCameraSimulator sim(cfg);
        std::string a = Get(sim.Start(), "/command/x.cgi", Basic("admin", "admin"));
        EXPECT_EQ(0u, a.find(c.expectStart)) << camsim::FaultName(c.fault) << ": " << a;
    }
    auto withFault = [](EFault f) {
        SSimulatorConfig cfg;
        cfg.cgiFault = f;
        CCameraSimulator sim(cfg);
        return Get(sim.Start(), "/command/x.cgi", Basic("admin", "admin"));
    };
    EXPECT_EQ(std::string::npos, withFault(EFault::kMissingContentLength).find("Content-Length"));
    std::string wrong = withFault(EFault::kWrongContentLength);
    EXPECT_NE(std::string::npos, wrong.find("Content-Length: 9\r\n"));  // "OK\r\n" is 4 bytes
    std::string shortBody = withFault(EFault::kShortBody);
    EXPECT_NE(std::string::npos, shortBody.find("Content-Length: 4\r\n"));
    EXPECT_EQ("OK", shortBody.substr(shortBody.find("\r\n\r\n") + 4));
    EXPECT_EQ(std::string::npos, withFault(EFault::kGarbage).find("HTTP/1."));
}

TEST(CameraSimulator, StreamFaultsAfterGoodFrames) {
    SSimulatorConfig cfg;
    cfg.fps = 100;
    cfg.streamFault = EFault::kWrongContentLength;
    cfg.faultAfterFrames = 1;
    cfg.maxFrames = 2;
    CCameraSimulator wrong(cfg);
    std::string s = Get(wrong.Start(), "/metadata.cgi", Basic("admin", "admin"));
    EXPECT_NE(std::string::npos, s.find("Content-Length: 68\r\n"));
    EXPECT_NE(std::string::npos, s.find("Content-Length: abc\r\n"));

    cfg.streamFault = EFault::kCloseMidPart;
    cfg.maxFrames = 0;
    CCameraSimulator mid(cfg);
    auto start = std::chrono::steady_clock::now();
    s = Get(mid.Start(), "/metadata.cgi", Basic("admin", "admin"));
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(3));  // it closed
    size_t second = s.rfind("--myboundary\r\n");
    ASSERT_NE(std::string::npos, second);
    EXPECT_LT(s.size() - (s.find("\r\n\r\n", second) + 4), 68u);
}

TEST(CameraSimulator, StopReturnsPromptlyWithAStalledClientConnected) {
    SSimulatorConfig cfg;
    cfg.streamFault = EFault::kStall;
    CCameraSimulator sim(cfg);
    uint16_t port = sim.Start();
    int fd = Connect(port);
    std::string req =
        "GET /metadata.cgi HTTP/1.0\r\nAuthorization: " + Basic("admin", "admin") + "\r\n\r\n";
    ASSERT_GT(send(fd, req.data(), req.size(), MSG_NOSIGNAL), 0);
    std::string head = ReadAll(fd, 300);
    EXPECT_EQ(0u, head.find("HTTP/1.0 200 OK"));
    int idle = socket(AF_INET, SOCK_STREAM, 0);  // connected, never sends a request
    close(idle);
    int silent = Connect(port);
    auto start = std::chrono::steady_clock::now();
    sim.Stop();
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(2));
    EXPECT_EQ(0, sim.FramesSent());
    close(fd);
    close(silent);
}
