#include "stream/meta_buffer.h"

#include <gtest/gtest.h>

#include <chrono>
#include <mutex>
#include <string>
#include <utility>
#include <vector>

#include "common/temp_dir.h"
#include "quorvex/error_codes.h"
#include "scripted_peer.h"
#include "stream/base64.h"
#include "support/meta_file_logger.h"

namespace {

struct SEvents {
    std::mutex mutex;
    std::vector<std::pair<int, std::string>> events;
    bool frameSeen = false;

    std::vector<std::pair<int, std::string>> Take() {
        std::lock_guard<std::mutex> lock(mutex);
        return std::exchange(events, {});
    }
};

}  // namespace

extern "C" void StreamTestRecordEvent(int cam, void* user, META_DATA* frame, int status,
                                      const char* text, const char* text2, bool gridChanged) {
    SEvents* events = static_cast<SEvents*>(user);
    std::lock_guard<std::mutex> lock(events->mutex);
    // Transport events carry the camera index and no frame, second text or grid change.
    if (cam != 3 || frame != nullptr || text2 != nullptr || gridChanged) {
        events->frameSeen = true;
    }
    events->events.emplace_back(status, text == nullptr ? "(null)" : text);
}

namespace {

using Reply = testkit::CScriptedPeer::SReply;
using Clock = std::chrono::steady_clock;

class CTestBuffer : public CMetaBuffer {
public:
    using CMetaBuffer::ReconnectRequested;
    using CMetaBuffer::SetMonitorState;
    using CMetaBuffer::SetQueryInfo;
    using CMetaBuffer::SwitchToDigest;
    bool StartSignalled() { return m_startEvent.IsSignalled(); }
};

std::string Ok(const std::string& body) {
    return "HTTP/1.0 200 OK\r\nContent-Length: " + std::to_string(body.size()) + "\r\n\r\n" + body;
}

long MsSince(Clock::time_point start) {
    return static_cast<long>(
        std::chrono::duration_cast<std::chrono::milliseconds>(Clock::now() - start).count());
}

class MetaBufferTest : public ::testing::Test {
protected:
    void SetUp() override {
        ASSERT_EQ(1, CMetaFileLogger::Instance().Configure(m_dir.Path().c_str(), 1024, 2, 4));
    }

    // A buffer talking to 127.0.0.1:port, monitoring (loopback connections are always
    // pending at first, and those complete only while monitoring).
    void Init(CTestBuffer& buffer, uint16_t port, uint32_t timeoutMs = 500) {
        ASSERT_EQ(QVX_OK, buffer.InitializeTransport("cam1", "127.0.0.1", port, timeoutMs,
                                                     "/meta.cgi", "user", "pass",
                                                     StreamTestRecordEvent, 3, &m_events, ""));
        buffer.SetMonitorState(CMetaBuffer::kMonitoring);
    }

    bool Logged(const std::string& text) {
        return testkit::ReadFile(m_dir.File("QuorvexLog.txt")).find(text) != std::string::npos;
    }

    testkit::CTempDir m_dir;
    SEvents m_events;
};

using Event = std::pair<int, std::string>;
using Events = std::vector<Event>;

TEST_F(MetaBufferTest, RequestCgiSendsBasicRequestAndHandsBackTheBody) {
    testkit::CScriptedPeer peer({{Ok("hello")}, {"DateFormat=ymd\r\n"}});
    CTestBuffer buffer;
    Init(buffer, peer.Port());

    char* response = nullptr;
    unsigned length = 99;
    ASSERT_EQ(QVX_OK,
              buffer.RequestCGI(500, "/command/x.cgi?a=1", "user", "pass", &response, &length));
    ASSERT_NE(nullptr, response);
    EXPECT_EQ(5u, length);
    EXPECT_EQ("hello", std::string(response, length));
    CMetaBuffer::FreeResponse(response);

    // Without status line and length the whole answer comes back, terminated.
    ASSERT_EQ(QVX_OK, buffer.RequestCGI(500, "/b", "", "", &response, &length));
    EXPECT_EQ(0u, length);
    EXPECT_STREQ("DateFormat=ymd\r\n", response);
    CMetaBuffer::FreeResponse(response);

    std::vector<std::string> requests = peer.Requests();
    ASSERT_EQ(2u, requests.size());
    EXPECT_EQ("GET /command/x.cgi?a=1 HTTP/1.0\r\nAuthorization: Basic dXNlcjpwYXNz\r\n\r\n",
              requests[0]);
    EXPECT_EQ("GET /b HTTP/1.0\r\nAuthorization: Basic Og==\r\n\r\n", requests[1]);
    EXPECT_TRUE(m_events.Take().empty());
}

TEST_F(MetaBufferTest, RequestCgiReadsAnswersOfSeveralChunks) {
    // One answer exactly two chunks long (its end only shows as the peer closing) and one
    // of several chunks with a short last one.
    const std::string header = "HTTP/1.0 200 OK\r\nContent-Length: 2007\r\n\r\n";
    ASSERT_EQ(41u, header.size());
    std::string exact(2007, 'x');
    exact.back() = 'E';
    std::string longBody(3000, 'y');
    longBody.back() = 'Z';
    testkit::CScriptedPeer peer({{header + exact}, {Ok(longBody)}});
    CTestBuffer buffer;
    Init(buffer, peer.Port());

    char* response = nullptr;
    unsigned length = 0;
    ASSERT_EQ(QVX_OK, buffer.RequestCGI(500, "/a", "u", "p", &response, &length));
    EXPECT_EQ(exact, std::string(response, length));
    CMetaBuffer::FreeResponse(response);
    ASSERT_EQ(QVX_OK, buffer.RequestCGI(500, "/a", "u", "p", &response, &length));
    EXPECT_EQ(longBody, std::string(response, length));
    CMetaBuffer::FreeResponse(response);
}

TEST_F(MetaBufferTest, RequestCgiHandsOverTheAnswerOfAnHttpError) {
    testkit::CScriptedPeer peer({{"HTTP/1.1 404 Not Found\r\n\r\n"},
                                 {"HTTP/1.0 301 Moved\r\nLocation: /x\r\n\r\n"},
                                 {"HTTP/1.0 204 No Content\r\n\r\n"}});
    CTestBuffer buffer;
    Init(buffer, peer.Port());
    char* response = nullptr;

    EXPECT_EQ(QVX_ERR_INVALID_COMMAND, buffer.RequestCGI(500, "/a", "u", "p", &response, nullptr));
    // The caller releases the answer on HTTP errors too.
    ASSERT_NE(nullptr, response);
    EXPECT_EQ(0, std::string(response).rfind("HTTP/1.1 404", 0));
    CMetaBuffer::FreeResponse(response);
    EXPECT_EQ(QVX_ERR_INVALID_COMMAND, buffer.LastError());
    EXPECT_TRUE(Logged("[cam1] HTTP error:404."));

    // A status outside 4xx and 5xx does not become the last error.
    EXPECT_EQ(QVX_ERR_HTTP, buffer.RequestCGI(500, "/a", "u", "p", &response, nullptr));
    CMetaBuffer::FreeResponse(response);
    EXPECT_EQ(QVX_ERR_INVALID_COMMAND, buffer.LastError());
    EXPECT_EQ(QVX_OK, buffer.RequestCGI(500, "/a", "u", "p", &response, nullptr));
    CMetaBuffer::FreeResponse(response);

    EXPECT_EQ((Events{{-1011, "HTTP error:404"}, {-1026, "HTTP error:301"}}), m_events.Take());
    EXPECT_FALSE(m_events.frameSeen);
}

TEST_F(MetaBufferTest, RequestCgiRefusesBodiesThatDoNotMatchTheirLength) {
    testkit::CScriptedPeer peer({{"HTTP/1.0 200 OK\r\nContent-Length: 6\r\n\r\nhello"},
                                 {"HTTP/1.0 200 OK\r\nContent-Length: -3\r\n\r\nabc"},
                                 {"HTTP/1.0 200 OK\r\nContent-Length: 3\r\nabc"},
                                 {"HTTP/1.0 200 OK\r\nContent-Length: 3"}});
    CTestBuffer buffer;
    Init(buffer, peer.Port());
    for (int i = 0; i < 4; ++i) {
        char* response = nullptr;
        unsigned length = 77;
        EXPECT_EQ(QVX_ERR_UNEXPECTED_DATA,
                  buffer.RequestCGI(500, "/a", "u", "p", &response, &length));
        EXPECT_EQ(77u, length);
        CMetaBuffer::FreeResponse(response);
    }
    EXPECT_EQ((Events{{-1027, "Content-Length not match"},
                      {-1027, "Illegal Content-Length"},
                      {-1027, "Not found data seperater"},
                      {-1027, "Illegal Content-Length"}}),
              m_events.Take());
    EXPECT_TRUE(Logged("[cam1] Content-Length not match."));
}

TEST_F(MetaBufferTest, ReceiveTimesOutAgainstAPeerThatNeverAnswers) {
    testkit::CScriptedPeer peer({{"", 0, true}});
    CTestBuffer buffer;
    Init(buffer, peer.Port());
    char* response = reinterpret_cast<char*>(&buffer);
    const auto start = Clock::now();
    EXPECT_EQ(-1, buffer.RequestCGI(300, "/a", "u", "p", &response, nullptr));
    const long elapsed = MsSince(start);
    EXPECT_GE(elapsed, 290);
    EXPECT_LT(elapsed, 1500);
    EXPECT_EQ(nullptr, response);
    EXPECT_EQ((Events{{-1005, "Recv Failed"}}), m_events.Take());
    EXPECT_TRUE(Logged("select timeout."));
    EXPECT_TRUE(Logged("[cam1] Receive error."));
}

TEST_F(MetaBufferTest, ReceiveWaitsTheFullTimeOutForEachBlock) {
    testkit::CScriptedPeer peer({{"HTTP/1.0 200 OK\r\n", 200, true}});
    CTestBuffer buffer;
    Init(buffer, peer.Port());
    char buf[64] = {};
    plat::SocketHandle s = buffer.Connect(500);
    ASSERT_NE(plat::kInvalidSocket, s);
    ASSERT_EQ(4, buffer.SendAll(s, "\r\n\r\n", 4));
    // 17 bytes arrive after 200 ms; the wait for the 18th gets the whole 300 ms again.
    const auto start = Clock::now();
    EXPECT_EQ(-1, buffer.recv_n(300, s, buf, 18, 0));
    EXPECT_GE(MsSince(start), 480);
    EXPECT_EQ("HTTP/1.0 200 OK\r\n", std::string(buf));
    CMetaBuffer::CloseSocket(s);
    EXPECT_EQ(plat::kInvalidSocket, s);
}

TEST_F(MetaBufferTest, ConnectFailures) {
    CTestBuffer buffer;
    {
        // Nobody accepts: the attempt stays pending until the time-out.
        testkit::CStalledListener stalled;
        Init(buffer, stalled.Port());
        const auto start = Clock::now();
        EXPECT_EQ(plat::kInvalidSocket, buffer.Connect(300));
        const long elapsed = MsSince(start);
        EXPECT_GE(elapsed, 290);
        EXPECT_LT(elapsed, 1500);
        EXPECT_TRUE(Logged("connection timeout error"));

        // A pending attempt is given up at once when monitoring stops.
        buffer.SetMonitorState(CMetaBuffer::kIdle);
        char* response = nullptr;
        const auto again = Clock::now();
        EXPECT_EQ(QVX_ERR_TIMEOUT, buffer.RequestCGI(2000, "/a", "u", "p", &response, nullptr));
        EXPECT_LT(MsSince(again), 1000);
        EXPECT_TRUE(Logged("break connection"));
        EXPECT_TRUE(Logged("[cam1] Connect error."));
    }
    // A refused connection fails well before the time-out.
    Init(buffer, testkit::UnusedPort());
    char* response = nullptr;
    const auto start = Clock::now();
    EXPECT_EQ(QVX_ERR_TIMEOUT, buffer.RequestCGI(3000, "/a", "u", "p", &response, nullptr));
    EXPECT_LT(MsSince(start), 1000);
    EXPECT_NE(1, buffer.LastError());
    EXPECT_TRUE(Logged("connect err:"));
    EXPECT_EQ((Events{{-1006, "Connection Timeout"}, {-1006, "Connection Timeout"}}),
              m_events.Take());
}

TEST_F(MetaBufferTest, OversizedCredentialsAndPathsAreRefusedWithoutConnecting) {
    testkit::CScriptedPeer peer({{Ok("x")}});
    CTestBuffer buffer;
    Init(buffer, peer.Port());
    char* response = nullptr;
    const std::string user(600, 'u');
    EXPECT_EQ(QVX_ERR_INVALID_PARAMETERS,
              buffer.RequestCGI(500, "/a", user.c_str(), "p", &response, nullptr));
    const std::string path = "/" + std::string(2100, 'p');
    EXPECT_EQ(QVX_ERR_INVALID_PARAMETERS,
              buffer.RequestCGI(500, path.c_str(), "u", "p", &response, nullptr));
    EXPECT_EQ(QVX_ERR_INVALID_PARAMETERS,
              buffer.RequestCGI(500, nullptr, "u", "p", &response, nullptr));
    EXPECT_EQ(nullptr, response);
    EXPECT_TRUE(Logged("[cam1] Credentials too long."));
    EXPECT_EQ(0, peer.Connections());

    // The largest credentials that still fit are sent whole.
    const std::string longest(511 - 2, 'a');
    ASSERT_EQ(QVX_OK, buffer.RequestCGI(500, "/a", longest.c_str(), "", &response, nullptr));
    CMetaBuffer::FreeResponse(response);
    ASSERT_EQ(1u, peer.Requests().size());
    EXPECT_NE(std::string::npos,
              peer.Requests()[0].find("Basic " + base64::Encode(longest + ":") + "\r\n"));
}

TEST_F(MetaBufferTest, InitializeBuildsTheStreamRequestAndResolvesTheHost) {
    CTestBuffer buffer;
    EXPECT_EQ(QVX_OK, buffer.InitializeTransport("front door", "localhost", 80, 1000,
                                                 "/image/meta.cgi?x=1", "admin", "secret", nullptr,
                                                 0, nullptr, "http://10.1.2.3:80"));
    EXPECT_EQ(
        "GET /image/meta.cgi?x=1 HTTP/1.0\r\nAuthorization: Basic YWRtaW46c2VjcmV0\r\n\r\n\r\n",
        buffer.StreamRequest());
    EXPECT_STREQ("front door", buffer.DeviceName());

    EXPECT_EQ(QVX_ERR_UNKNOWN_HOST,
              buffer.InitializeTransport("cam2", "no-such-camera.invalid", 80, 1000, "/m", "a", "b",
                                         nullptr, 0, nullptr, ""));
    EXPECT_TRUE(Logged("[cam2] Fail to get addrinfo for no-such-camera.invalid."));
    // A host name longer than its field is not cut into another one.
    const std::string longHost = std::string(45, 'h') + ".local";
    EXPECT_EQ(QVX_ERR_UNKNOWN_HOST,
              buffer.InitializeTransport("cam2", longHost.c_str(), 80, 1000, "/m", "a", "b",
                                         nullptr, 0, nullptr, ""));
    const std::string password(700, 'p');
    EXPECT_EQ(QVX_ERR_INVALID_PARAMETERS,
              buffer.InitializeTransport("cam2", "127.0.0.1", 80, 1000, "/m", "a", password.c_str(),
                                         nullptr, 0, nullptr, ""));
    const std::string prefix(CMetaBuffer::kCommandPrefixSize, 'x');
    EXPECT_EQ(QVX_ERR_INVALID_PARAMETERS,
              buffer.InitializeTransport("cam2", "127.0.0.1", 80, 1000, "/m", "a", "b", nullptr, 0,
                                         nullptr, prefix.c_str()));

    EXPECT_EQ(QVX_ERR_INVALID_PARAMETERS, buffer.SetRetryCount(0));
    EXPECT_TRUE(Logged("Empty retry count."));
    EXPECT_EQ(QVX_OK, buffer.SetRetryCount(7));
    EXPECT_EQ(7, buffer.RetryCount());
}

TEST_F(MetaBufferTest, DigestChallengeReplacesTheStreamRequest) {
    CTestBuffer buffer;
    ASSERT_EQ(QVX_OK, buffer.InitializeTransport("cam1", "127.0.0.1", 80, 500, "/dir/index.html",
                                                 "basic", "basic", nullptr, 0, nullptr, ""));
    buffer.SetDigestCredentials("Mufasa", "Circle Of Life");
    EXPECT_FALSE(buffer.ReconnectRequested());
    buffer.SwitchToDigest(
        "HTTP/1.0 401 Unauthorized\r\nWWW-Authenticate: Digest realm=\"testrealm@host.com\", "
        "nonce=\"dcd98b7102dd2f0e8b11d0f600bfb0c093\", opaque=\"5ccc069c403ebaf9f0171e9517f40e41\""
        "\r\n\r\n");
    EXPECT_TRUE(buffer.ReconnectRequested());
    // The Digest credentials, not the Basic ones, sign the request; the line ends the header.
    EXPECT_EQ(
        "GET /dir/index.html HTTP/1.0\r\nAuthorization: Digest username=\"Mufasa\", "
        "realm=\"testrealm@host.com\", nonce=\"dcd98b7102dd2f0e8b11d0f600bfb0c093\", "
        "uri=\"/dir/index.html\", qop=auth, nc=00000001, cnonce=\"7f31c08a5be94d26\", "
        "response=\"5969367a8fa33696253bdfb8856f8fd8\", "
        "opaque=\"5ccc069c403ebaf9f0171e9517f40e41\"\r\n\r\n",
        buffer.StreamRequest());
}

TEST_F(MetaBufferTest, CameraInfoTurnsAStartingMonitorIntoARunningOne) {
    CTestBuffer buffer;
    Init(buffer, testkit::UnusedPort());
    buffer.SetMonitorState(CMetaBuffer::kStarting);
    buffer.SetQueryInfo(false);
    EXPECT_FALSE(buffer.StartSignalled());
    // Without the inquiry nothing is asked of the camera, which here does not even exist.
    EXPECT_EQ(QVX_OK, buffer.GetCameraInfo());
    EXPECT_EQ(CMetaBuffer::kMonitoring, buffer.MonitorState());
    EXPECT_TRUE(buffer.StartSignalled());
    EXPECT_TRUE(m_events.Take().empty());

    // A stopping monitor is left as it is.
    buffer.SetMonitorState(CMetaBuffer::kStopping);
    EXPECT_EQ(QVX_OK, buffer.GetCameraInfo());
    EXPECT_EQ(CMetaBuffer::kStopping, buffer.MonitorState());
}

TEST_F(MetaBufferTest, CameraInfoReadsDateFormatAndVersions) {
    testkit::CScriptedPeer peer({{Ok("DateFormat=dmy\r\n")},
                                 {Ok("MovingObjectDetectionVersion=1.10.2\r\n"
                                     "UnattendedObjectDetectionVersion=12.3.45\r\n")},
                                 // Digit form, and an answer without the version keys.
                                 {Ok("DateFormat=1\r\n")},
                                 {Ok("Nothing=here\r\n")},
                                 {"HTTP/1.0 200 OK\r\n\r\nDateFormat=xyz"},
                                 {Ok("DateFormat=0")},
                                 {"HTTP/1.0 404 Not Found\r\n\r\n"},
                                 {Ok("DateFormat=ymd")},
                                 {Ok("MovingObjectDetectionVersion=3.0.1\r\n")}});
    CTestBuffer buffer;
    Init(buffer, peer.Port());
    const char dateFormatPath[] = "/command/inquiry.cgi?inq=system";
    const char versionPath[] = "/command/inquiry.cgi?inq=version";
    buffer.SetInquiryPaths(dateFormatPath, versionPath);

    // The unattended-object version 12 is not one the engine supports; that is only noted.
    ASSERT_EQ(QVX_OK, buffer.GetCameraInfo());
    EXPECT_EQ(2, buffer.DateFormat());
    EXPECT_EQ(1, buffer.DmoRevision().m_major);
    EXPECT_EQ(10, buffer.DmoRevision().m_minor);
    EXPECT_EQ(2, buffer.DmoRevision().m_revision);
    EXPECT_EQ(12, buffer.DsoRevision().m_major);
    EXPECT_EQ(3, buffer.DsoRevision().m_minor);
    EXPECT_EQ(45, buffer.DsoRevision().m_revision);
    std::vector<std::string> requests = peer.Requests();
    ASSERT_EQ(2u, requests.size());
    EXPECT_EQ(0, requests[0].rfind("GET /command/inquiry.cgi?inq=system HTTP/1.0\r\n", 0));
    EXPECT_EQ(0, requests[1].rfind("GET /command/inquiry.cgi?inq=version HTTP/1.0\r\n", 0));

    // Missing keys leave the versions as they were.
    ASSERT_EQ(QVX_OK, buffer.GetCameraInfo());
    EXPECT_EQ(1, buffer.DateFormat());
    EXPECT_EQ(10, buffer.DmoRevision().m_minor);
    EXPECT_EQ(45, buffer.DsoRevision().m_revision);

    // An unknown format stops the inquiry before the version request.
    EXPECT_EQ(QVX_ERR_UNEXPECTED_DATA, buffer.GetCameraInfo());
    EXPECT_EQ(1, buffer.DateFormat());
    EXPECT_EQ(5u, peer.Requests().size());
    EXPECT_TRUE(Logged("[cam1] Unknown DateFormat."));

    // A failing version request is the inquiry's result; the format is already taken.
    EXPECT_EQ(QVX_ERR_INVALID_COMMAND, buffer.GetCameraInfo());
    EXPECT_EQ(0, buffer.DateFormat());
    EXPECT_TRUE(Logged("[cam1] GetVersion error."));

    // A moving-object major version the engine does not know stops the connection.
    EXPECT_EQ(QVX_ERR_UNSUPPORTED_DMO_MAJOR, buffer.GetCameraInfo());
    EXPECT_EQ(3, buffer.DmoRevision().m_major);
    EXPECT_EQ(0, buffer.DmoRevision().m_reserved);
    EXPECT_TRUE(Logged("[cam1] DMO version unmatch."));
    EXPECT_EQ((Events{{-1011, "HTTP error:404"}, {-1034, "DMO version unmatch"}}), m_events.Take());
}

TEST_F(MetaBufferTest, CommandQueueSendsOldestFirstAndRetriesFailures) {
    testkit::CScriptedPeer peer({{Ok("")}, {"HTTP/1.0 500 Busy\r\n\r\n"}, {Ok("")}});
    CTestBuffer buffer;
    ASSERT_EQ(QVX_OK,
              buffer.InitializeTransport("cam1", "127.0.0.1", peer.Port(), 500, "/m", "user",
                                         "pass", StreamTestRecordEvent, 3, &m_events, "/proxy"));
    buffer.SetMonitorState(CMetaBuffer::kMonitoring);
    EXPECT_EQ(QVX_OK, buffer.QueueCommand("/command/a.cgi", "/command/b.cgi"));
    EXPECT_EQ(QVX_OK, buffer.QueueCommand("/command/c.cgi"));
    EXPECT_EQ(QVX_ERR_INVALID_PARAMETERS, buffer.QueueCommand(nullptr));
    EXPECT_EQ((std::vector<std::string>{"/proxy/command/a.cgi", "/proxy/command/b.cgi",
                                        "/proxy/command/c.cgi"}),
              buffer.QueuedCommands());

    buffer.SendQueuedCommand();  // a: taken
    buffer.SendQueuedCommand();  // b: refused, stays in front
    EXPECT_EQ((std::vector<std::string>{"/proxy/command/b.cgi", "/proxy/command/c.cgi"}),
              buffer.QueuedCommands());
    buffer.SendQueuedCommand();  // b again: taken
    EXPECT_EQ((std::vector<std::string>{"/proxy/command/c.cgi"}), buffer.QueuedCommands());

    std::vector<std::string> requests = peer.Requests();
    ASSERT_EQ(3u, requests.size());
    EXPECT_EQ("GET /proxy/command/a.cgi HTTP/1.0\r\nAuthorization: Basic dXNlcjpwYXNz\r\n\r\n",
              requests[0]);
    EXPECT_EQ(0, requests[1].rfind("GET /proxy/command/b.cgi ", 0));
    EXPECT_EQ(0, requests[2].rfind("GET /proxy/command/b.cgi ", 0));
}

TEST_F(MetaBufferTest, CommandQueueKeepsTheNewestTwentyAfterAFailedAttempt) {
    CTestBuffer buffer;
    Init(buffer, testkit::UnusedPort(), 300);
    for (int i = 0; i < 20; ++i) {
        buffer.QueueCommand(("/c" + std::to_string(i)).c_str());
    }
    buffer.SendQueuedCommand();
    std::vector<std::string> queued = buffer.QueuedCommands();
    ASSERT_EQ(20u, queued.size());
    EXPECT_EQ("/c0", queued.front());

    buffer.QueueCommand("/c20");
    buffer.SendQueuedCommand();
    queued = buffer.QueuedCommands();
    ASSERT_EQ(20u, queued.size());
    EXPECT_EQ("/c1", queued.front());
    EXPECT_EQ("/c20", queued.back());
}

}  // namespace
