// The camera client against the camera simulator: two independent implementations of the
// same HTTP conversation checking each other over real loopback sockets.
#include <gtest/gtest.h>

#include <string>

#include "camsim/camera_simulator.h"
#include "stream/meta_buffer.h"

namespace {

class CMonitoredBuffer : public CMetaBuffer {
public:
    void Starting() { SetMonitorState(kStarting); }
};

struct SEvents {
    int lastCode = 0;
    std::string lastText;
};

void OnEvent(int, void* user, META_DATA*, int status, const char* text, const char*, bool) {
    auto* events = static_cast<SEvents*>(user);
    events->lastCode = status;
    events->lastText = text != nullptr ? text : "";
}

}  // namespace

TEST(CameraClientAgainstSimulator, InquiryLearnsDateFormatAndVersions) {
    camsim::SSimulatorConfig cfg;
    cfg.dateFormat = "dmy";
    cfg.dmoVersion = "1.10.2";
    cfg.dsoVersion = "12.3.45";
    cfg.user = "viewer";
    cfg.password = "p:w";
    camsim::CCameraSimulator sim(cfg);
    uint16_t port = sim.Start();
    ASSERT_NE(0, port);

    CMonitoredBuffer client;
    SEvents events;
    ASSERT_EQ(1, client.InitializeTransport("Gate", "127.0.0.1", port, 2000, "/metadata.cgi",
                                            "viewer", "p:w", OnEvent, 0, &events, ""));
    client.SetInquiryPaths("/command/inquiry.cgi?inq=system", "/command/inquiry.cgi?inq=metadata");
    client.Starting();
    ASSERT_EQ(1, client.GetCameraInfo());
    EXPECT_EQ(2, client.DateFormat());
    EXPECT_EQ(1, client.DmoRevision().m_major);
    EXPECT_EQ(10, client.DmoRevision().m_minor);
    EXPECT_EQ(2, client.DmoRevision().m_revision);
    EXPECT_EQ(12, client.DsoRevision().m_major);
    EXPECT_EQ(45, client.DsoRevision().m_revision);

    // The simulator saw the credentials the client encoded.
    auto requests = sim.Requests();
    ASSERT_EQ(2u, requests.size());
    EXPECT_EQ("Basic dmlld2VyOnA6dw==", requests[0].authorization);

    char* body = nullptr;
    unsigned length = 0;
    ASSERT_EQ(1, client.RequestCGI(2000, "/command/objectdetection.cgi?Od99Mode=mod", "viewer",
                                   "p:w", &body, &length));
    EXPECT_EQ(4u, length);
    EXPECT_EQ("OK\r\n", std::string(body, length));
    CMetaBuffer::FreeResponse(body);

    body = nullptr;
    EXPECT_EQ(-1011, client.RequestCGI(2000, "/command/x.cgi", "viewer", "wrong", &body, &length));
    CMetaBuffer::FreeResponse(body);
    EXPECT_EQ(-1011, events.lastCode);
    EXPECT_EQ("HTTP error:401", events.lastText);
}

TEST(CameraClientAgainstSimulator, FaultyAnswersBecomeErrorCodes) {
    struct {
        camsim::EFault fault;
        int expected;
    } cases[] = {{camsim::EFault::kStatus503, -1025},
                 {camsim::EFault::kStatus500, -1001},
                 {camsim::EFault::kStatus301, -1026},
                 {camsim::EFault::kWrongContentLength, -1027},
                 {camsim::EFault::kShortBody, -1027}};
    for (const auto& c : cases) {
        camsim::SSimulatorConfig cfg;
        cfg.cgiFault = c.fault;
        camsim::CCameraSimulator sim(cfg);
        uint16_t port = sim.Start();
        CMonitoredBuffer client;
        ASSERT_EQ(1, client.InitializeTransport("Gate", "127.0.0.1", port, 1000, "/metadata.cgi",
                                                "admin", "admin", nullptr, 0, nullptr, ""));
        client.Starting();
        client.SetInquiryPaths("/command/inquiry.cgi?inq=system",
                               "/command/inquiry.cgi?inq=metadata");
        EXPECT_EQ(c.expected, client.GetCameraInfo()) << camsim::FaultName(c.fault);
    }
}
