// The transport against the camera simulator: the inquiry, commands, HTTP errors and the
// switch to Digest authentication as a camera really answers them.
#include <gtest/gtest.h>

#include <mutex>
#include <string>
#include <utility>
#include <vector>

#include "camera_simulator.h"
#include "common/temp_dir.h"
#include "quorvex/error_codes.h"
#include "stream/meta_buffer.h"
#include "support/meta_file_logger.h"

namespace {

using Events = std::vector<std::pair<int, std::string>>;

struct SRecorder {
    std::mutex mutex;
    Events events;
};

}  // namespace

extern "C" void StreamCamsimRecordEvent(int, void* user, META_DATA*, int status, const char* text,
                                        const char*, bool) {
    SRecorder* recorder = static_cast<SRecorder*>(user);
    std::lock_guard<std::mutex> lock(recorder->mutex);
    recorder->events.emplace_back(status, text == nullptr ? "" : text);
}

namespace {

constexpr char kDatePath[] = "/command/inquiry.cgi?inq=system";
constexpr char kVersionPath[] = "/command/inquiry.cgi?inq=metadata";

class CSimBuffer : public CMetaBuffer {
public:
    using CMetaBuffer::ReconnectRequested;
    using CMetaBuffer::SetMonitorState;
    using CMetaBuffer::SwitchToDigest;
};

class CameraInquiryTest : public ::testing::Test {
protected:
    void SetUp() override {
        ASSERT_EQ(1, CMetaFileLogger::Instance().Configure(m_dir.Path().c_str(), 1024, 2, 4));
    }

    // A monitoring buffer for the simulator, with the simulator's own credentials unless
    // others are given.
    void Connect(CSimBuffer& buffer, camsim::CCameraSimulator& sim,
                 const char* password = "admin") {
        ASSERT_NE(0, sim.Start());
        ASSERT_EQ(QVX_OK, buffer.InitializeTransport("sim", "127.0.0.1", sim.Port(), 500,
                                                     "/metadata.cgi?type=obj", "admin", password,
                                                     StreamCamsimRecordEvent, 0, &m_recorder, ""));
        buffer.SetInquiryPaths(kDatePath, kVersionPath);
        buffer.SetMonitorState(CMetaBuffer::kMonitoring);
    }

    Events TakeEvents() {
        std::lock_guard<std::mutex> lock(m_recorder.mutex);
        return std::exchange(m_recorder.events, {});
    }

    testkit::CTempDir m_dir;
    SRecorder m_recorder;
};

TEST_F(CameraInquiryTest, QueuedCommandsReachTheCamera) {
    camsim::CCameraSimulator sim;
    CSimBuffer buffer;
    Connect(buffer, sim);
    buffer.QueueCommand("/command/objectdetection.cgi?MODThreshold=30", "/command/b.cgi");
    buffer.SendQueuedCommand();
    buffer.SendQueuedCommand();
    EXPECT_TRUE(buffer.QueuedCommands().empty());
    std::vector<camsim::SRequest> requests = sim.Requests();
    ASSERT_EQ(2u, requests.size());
    EXPECT_EQ("/command/objectdetection.cgi?MODThreshold=30", requests[0].path);
    EXPECT_EQ("/command/b.cgi", requests[1].path);
    EXPECT_EQ("Basic YWRtaW46YWRtaW4=", requests[1].authorization);
    EXPECT_TRUE(TakeEvents().empty());
}

TEST_F(CameraInquiryTest, CameraErrorsBecomeResultsAndEvents) {
    struct SCase {
        camsim::EFault fault;
        int result;
        const char* text;
    };
    const SCase cases[] = {
        {camsim::EFault::kStatus404, QVX_ERR_INVALID_COMMAND, "HTTP error:404"},
        {camsim::EFault::kStatus500, QVX_ERR_INVALID_PARAMETERS, "HTTP error:500"},
        {camsim::EFault::kStatus503, QVX_ERR_SERVICE_UNAVAILABLE, "Service Unavailable Error"},
        {camsim::EFault::kStatus301, QVX_ERR_HTTP, "HTTP error:301"},
        {camsim::EFault::kShortBody, QVX_ERR_UNEXPECTED_DATA, "Content-Length not match"},
        {camsim::EFault::kWrongContentLength, QVX_ERR_UNEXPECTED_DATA, "Content-Length not match"},
    };
    for (const SCase& c : cases) {
        camsim::SSimulatorConfig config;
        config.cgiFault = c.fault;
        camsim::CCameraSimulator sim(config);
        CSimBuffer buffer;
        Connect(buffer, sim);
        EXPECT_EQ(c.result, buffer.GetCameraInfo()) << c.text;
        EXPECT_EQ((Events{{c.result, c.text}}), TakeEvents());
        // The inquiry stops at the first failing request.
        EXPECT_EQ(1u, sim.Requests().size()) << c.text;
    }
}

TEST_F(CameraInquiryTest, AnswersTheStreamsDigestChallenge) {
    camsim::SSimulatorConfig config;
    config.digest = true;
    config.user = "viewer";
    config.password = "s3cret";
    camsim::CCameraSimulator sim(config);
    CSimBuffer buffer;
    Connect(buffer, sim);
    buffer.SetDigestCredentials("viewer", "s3cret");

    // The Basic stream request is refused with a challenge.
    plat::SocketHandle s = buffer.Connect(500);
    ASSERT_NE(plat::kInvalidSocket, s);
    const std::string basic = buffer.StreamRequest();
    ASSERT_EQ(static_cast<long>(basic.size()),
              buffer.SendAll(s, basic.data(), static_cast<long>(basic.size())));
    char answer[2048] = {};
    const long n = buffer.recv_n(500, s, answer, sizeof(answer) - 1, 0);
    CMetaBuffer::CloseSocket(s);
    ASSERT_GT(n, 0);
    ASSERT_EQ(0, std::string(answer).rfind("HTTP/1.0 401", 0)) << answer;

    buffer.SwitchToDigest(std::string_view(answer, static_cast<size_t>(n)));
    EXPECT_TRUE(buffer.ReconnectRequested());
    s = buffer.Connect(500);
    ASSERT_NE(plat::kInvalidSocket, s);
    const std::string digest = buffer.StreamRequest();
    ASSERT_EQ(static_cast<long>(digest.size()),
              buffer.SendAll(s, digest.data(), static_cast<long>(digest.size())));
    char status[16] = {};
    EXPECT_EQ(15, buffer.recv_n(500, s, status, 15, 0));
    CMetaBuffer::CloseSocket(s);
    EXPECT_STREQ("HTTP/1.0 200 OK", status);
    EXPECT_EQ(1, sim.DigestAccepted());
}

}  // namespace
