#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "common/temp_dir.h"
#include "platform/file_system.h"
#include "quorvex/quorvex.h"
#include "stream/meta_buffer.h"
#include "support/meta_file_logger.h"
#include "support/utf8_path.h"

struct CQuorvexInspector {
    static const CQuorvex& Of(const CQuorvex& q) { return q; }
    static std::string IniPath(const CQuorvex& q) { return q.m_iniPath; }
    static int SocketBufSize(const CQuorvex& q) { return q.m_socketBufSize; }
    static int DataTimeType(const CQuorvex& q) { return q.m_dataTimeType; }
    static std::string MetaCommand(const CQuorvex& q) { return q.m_getMetaCommand; }
    static std::string VersionCommand(const CQuorvex& q) { return q.m_getVersionCommand; }
    static std::string DateFormatCommand(const CQuorvex& q) { return q.m_getDateFormatCommand; }
    static std::string DmoCommand(const CQuorvex& q) { return q.m_setDmoCommand; }
    static std::string DsoCommand(const CQuorvex& q) { return q.m_setDsoCommand; }
    static int CoordScale(const CQuorvex& q) { return q.m_coordScale; }
    static int MinW(const CQuorvex& q) { return q.m_minObjectWidth; }
    static int FrameW(const CQuorvex& q) { return q.m_frameWidth; }
    static int MinH(const CQuorvex& q) { return q.m_minObjectHeight; }
    static int FrameH(const CQuorvex& q) { return q.m_frameHeight; }
    static CSaveMeta* SaveMeta(const CQuorvex& q) { return q.m_pSaveMeta; }
    static CMetaBuffer*& StreamClient(CQuorvex& q, int cam) { return q.m_pMetaBuffer[cam]; }
};

namespace {

using I = CQuorvexInspector;

const char* kDefaultMeta = "/metadata.cgi?format=binary&package=obj&time=on&ptzpos=on&sinterval=";
const char* kDefaultDmo =
    "/command/objectdetection.cgi?PositionMode=current&Od99Mode=mod&Od99Win1=on&Od99Win1Area=1,1,"
    "639,479&Od99Win1Mode=det&Od99MaxObjectSize=639,479&Od99MinObjectSize=";

// Quorvex.ini beside the test program, as the host's would be beside the host executable.
class FacadeWithIni : public ::testing::Test {
protected:
    void SetUp() override {
        m_iniPath = utf8path::ExecutableFolder() + "Quorvex.ini";
        plat::FsDelete(m_iniPath.c_str());
        ASSERT_EQ(1, CQuorvex::MetaLoggerInitialize(m_logDir.Path().c_str(), 512, 3, 4));
    }
    void TearDown() override { plat::FsDelete(m_iniPath.c_str()); }
    void WriteIni(const std::string& text) { testkit::WriteFile(m_iniPath, text); }
    std::string LogText() { return testkit::ReadFile(m_logDir.File("QuorvexLog.txt")); }
    static size_t Count(const std::string& text, const std::string& what) {
        size_t n = 0;
        for (size_t p = text.find(what); p != std::string::npos; p = text.find(what, p + 1)) {
            ++n;
        }
        return n;
    }

    std::string m_iniPath;
    testkit::CTempDir m_logDir;
};

}  // namespace

TEST_F(FacadeWithIni, MissingFileGivesEveryDefaultWithSevenWarnings) {
    CQuorvex q;
    EXPECT_EQ(m_iniPath, I::IniPath(q));
    EXPECT_EQ(8192, I::SocketBufSize(q));
    EXPECT_EQ(0, I::DataTimeType(q));
    EXPECT_EQ(kDefaultMeta, I::MetaCommand(q));
    EXPECT_EQ("/command/inquiry.cgi?inq=metadata", I::VersionCommand(q));
    EXPECT_EQ("/command/inquiry.cgi?inq=system", I::DateFormatCommand(q));
    EXPECT_EQ(kDefaultDmo, I::DmoCommand(q));
    EXPECT_EQ(201u, I::DsoCommand(q).size());
    EXPECT_EQ(7u, Count(LogText(),
                        "\tWarning\tCQuorvex::GetMyProfile\tNo INI file: " + m_iniPath + ".\n"));
    // Geometry starts at its fixed values.
    EXPECT_EQ(2, I::CoordScale(q));
    EXPECT_EQ(8, I::MinW(q));
    EXPECT_EQ(320, I::FrameW(q));
    EXPECT_EQ(8, I::MinH(q));
    EXPECT_EQ(240, I::FrameH(q));
}

TEST_F(FacadeWithIni, ReadsKeysOfTheSectionWithWindowsLineEnds) {
    WriteIni(
        "SocketBufSize=4096\r\n"
        "[MetaBuffer] ; camera settings\r\n"
        "GetVersionCommand=/v.cgi?x=1 \r\n"
        "[Other]\r\n"
        "SocketBufSize= 12x\r\n"
        "DataTimeType=2\r\n");
    CQuorvex q;
    EXPECT_EQ(12, I::SocketBufSize(q));  // found in a later section; the early line is ignored
    EXPECT_EQ("/v.cgi?x=1 ", I::VersionCommand(q));  // taken as it stands, blank kept
    EXPECT_EQ(2, I::DataTimeType(q));
    EXPECT_EQ(kDefaultMeta, I::MetaCommand(q));
}

TEST_F(FacadeWithIni, UnusableValuesFallBackToDefaults) {
    WriteIni(
        "[metabuffer]\nSocketBufSize=1\n[MetaBuffer]\nSocketBufSize=x12\nDataTimeType=\n"
        "GetMetaCommand=" +
        std::string(259, 'a') + "\nGetVersionCommand=" + std::string(258, 'b') +
        "\nGetDateFormatCommand=" + std::string(300, 'c') + "\n");
    CQuorvex q;
    EXPECT_EQ(8192, I::SocketBufSize(q));
    EXPECT_EQ(0, I::DataTimeType(q));
    EXPECT_EQ(kDefaultMeta, I::MetaCommand(q));
    EXPECT_EQ(std::string(258, 'b'), I::VersionCommand(q));
    EXPECT_EQ("/command/inquiry.cgi?inq=system", I::DateFormatCommand(q));
    std::string log = LogText();
    EXPECT_NE(std::string::npos, log.find("\tCQuorvex::GetMyProfileInt\tNot digit: x12.\n"));
    EXPECT_NE(std::string::npos, log.find("\tCQuorvex::GetMyProfileInt\tReturn default value for "
                                          "[MetaBuffer]DataTimeType=0.\n"));
    EXPECT_NE(std::string::npos, log.find("\tError\tCQuorvex::GetMyProfile\tToo long data.\n"));
}

TEST_F(FacadeWithIni, SetMaxResolutionRewritesDetectionCommandsOnlyForGenerationOne) {
    CQuorvex q;
    q.SetMaxResolution(640, 480);
    EXPECT_EQ(kDefaultDmo, I::DmoCommand(q));
    q.SetCameraGeneration(kCameraGenerationMod);
    q.SetMaxResolution(640, 480);
    const std::string expected =
        "/command/objectdetection.cgi?MODThreshold=30&DetectionResponse=5&DetAreaWin1=1,1,639,1,"
        "639,479,1,479&MODMaxObjectSize=639,479&MODMinObjectSize=";
    EXPECT_EQ(expected, I::DmoCommand(q));
    EXPECT_EQ(expected, I::DsoCommand(q));
}

TEST_F(FacadeWithIni, SmallSettersAndTheirResults) {
    CQuorvex q;
    EXPECT_EQ(1, q.SetMinObjectSize(7, 16, 640, 12, 480));
    EXPECT_EQ(16, I::MinW(q));
    EXPECT_EQ(640, I::FrameW(q));
    EXPECT_EQ(12, I::MinH(q));
    EXPECT_EQ(480, I::FrameH(q));
    EXPECT_EQ(-1, q.DeleteMetaData(0, 0, 100));
    EXPECT_EQ(1, q.SetMetaRetryCount(0));  // no stream client on slot 0

    EXPECT_EQ(-1001, q.SetSaveMetaPtr(nullptr));
    EXPECT_EQ(nullptr, I::SaveMeta(q));
    EXPECT_NE(std::string::npos, LogText().find("\tError\tCQuorvex::SetSaveMetaPtr\tNull ptr.\n"));
    auto* fake = reinterpret_cast<CSaveMeta*>(&q);  // only stored, never used here
    EXPECT_EQ(1, q.SetSaveMetaPtr(fake));
    EXPECT_EQ(fake, I::SaveMeta(q));
}

TEST_F(FacadeWithIni, RetryCountGoesToSlotZerosStreamClient) {
    CQuorvex q;
    CMetaBuffer* client = new CMetaBuffer();
    I::StreamClient(q, 0) = client;
    EXPECT_EQ(-1001, q.SetMetaRetryCount(0));
    EXPECT_EQ(-1001, q.SetMetaRetryCount(0x10000));  // only the low 16 bits count
    EXPECT_EQ(1, q.SetMetaRetryCount(0x10005));
    EXPECT_EQ(5, client->RetryCount());
    EXPECT_NE(std::string::npos,
              LogText().find("\tError\tCMetaBuffer::SetRetryCount\tEmpty retry count.\n"));
    I::StreamClient(q, 0) = nullptr;
    delete client;
}

TEST_F(FacadeWithIni, OutOfRangeSlotIsRejectedWithAnErrorLine) {
    CQuorvex q;
    q.ApiFinalize(2);
    q.ApiFinalize(-1);
    q.ApiFinalize(1);
    std::string log = LogText();
    EXPECT_NE(std::string::npos,
              log.find("\tError\tCQuorvex::ApiFinalize\tInvalid camera index 2.\n"));
    EXPECT_NE(std::string::npos, log.find("\tCQuorvex::ApiFinalize\tInvalid camera index -1.\n"));
    EXPECT_EQ(std::string::npos, log.find("Invalid camera index 1."));
}

TEST_F(FacadeWithIni, LoggerInitialisationLineAndLastMessage) {
    testkit::CTempDir other;
    EXPECT_EQ(-1001, CQuorvex::MetaLoggerInitialize(other.Path().c_str(), 512, 3, 5));
    ASSERT_EQ(1, CQuorvex::MetaLoggerInitialize(other.Path().c_str(), 512, 3, 3));
    std::string text = testkit::ReadFile(other.File("QuorvexLog.txt"));
    EXPECT_EQ(text.size() - text.find("\tInfo\tCQuorvex()\tLog initialized.\n"),
              std::strlen("\tInfo\tCQuorvex()\tLog initialized.\n"));
    CQuorvex q;
    char buf[8];
    std::memset(buf, 'x', sizeof(buf));
    EXPECT_EQ(1, q.GetLastErrMessage(buf, sizeof(buf)));
    EXPECT_EQ(7u, std::strlen(buf));  // "Return " of the INI fallback line, cut and terminated
    EXPECT_EQ(1, q.GetLastErrMessage(nullptr, 10));
}

TEST(ErrorTable, TextsOfKnownAndUnknownCodes) {
    EXPECT_STREQ("No error.", CQuorvex::GetErrorDesc(1));
    EXPECT_STREQ("End of record.", CQuorvex::GetErrorDesc(1000));
    EXPECT_STREQ("Now pausing.", CQuorvex::GetErrorDesc(1001));
    EXPECT_STREQ("Unknown error code.", CQuorvex::GetErrorDesc(0));
    EXPECT_STREQ("Unknown error code.", CQuorvex::GetErrorDesc(-1042));
    EXPECT_STREQ("Unknown error code.", CQuorvex::GetErrorDesc(-2000));
    EXPECT_STREQ("Null input.", CQuorvex::GetErrorDesc(-2101));
    EXPECT_STREQ("Null input.", CQuorvex::GetErrorDesc(-2201));
    EXPECT_STREQ("Unexpected data.", CQuorvex::GetErrorDesc(QVX_ERR_UNEXPECTED_DATA));
    EXPECT_STREQ("No filter setting.", CQuorvex::GetErrorDesc(-2001));
    // Every library code from -1001 to -1041 has its own text; the longest has 58 characters.
    size_t longest = 0;
    for (int code = -1041; code <= -1001; ++code) {
        const char* text = CQuorvex::GetErrorDesc(code);
        EXPECT_STRNE("Unknown error code.", text) << code;
        longest = std::max(longest, std::strlen(text));
    }
    for (int code = -2209; code <= -2201; ++code) {
        EXPECT_STRNE("Unknown error code.", CQuorvex::GetErrorDesc(code)) << code;
    }
    EXPECT_EQ(58u, longest);
}

TEST(ErrorTable, CopiesAreBoundedAndTerminated) {
    char buf[8];
    std::memset(buf, 'x', sizeof(buf));
    CQuorvex::GetMetaApiErrMsg(-1006, buf, sizeof(buf));
    EXPECT_STREQ("Timeout", buf);
    CQuorvex::GetMetaApiErrMsg(-1006, nullptr, 100);
    char one = 'x';
    CQuorvex::GetMetaApiErrMsg(-1006, &one, 1);
    EXPECT_EQ('\0', one);
    char untouched = 'x';
    CQuorvex::GetMetaApiErrMsg(-1006, &untouched, 0);
    EXPECT_EQ('x', untouched);
    char full[64];
    CQuorvex::GetMetaApiErrMsg(12345, full, sizeof(full));
    EXPECT_STREQ("Unknown error code.", full);
}
