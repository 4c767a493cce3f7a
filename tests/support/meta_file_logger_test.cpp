#include "support/meta_file_logger.h"

#include <gtest/gtest.h>

#include <regex>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "common/temp_dir.h"
#include "platform/file_system.h"

namespace {

CMetaFileLogger& Log() {
    return CMetaFileLogger::Instance();
}

std::vector<std::string> Lines(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream in(text);
    std::string line;
    while (std::getline(in, line)) {
        lines.push_back(line);
    }
    return lines;
}

}  // namespace

// Must run before anything configures the process-wide log.
TEST(MetaFileLoggerUnconfigured, RefusesEveryLineAndCreatesNoFile) {
    testkit::CTempDir dir;
    EXPECT_EQ(-1013, Log().Print(kLogError, "Tag", "before configuration"));
    char buf[64] = "unchanged";
    Log().GetLastLine(buf, sizeof(buf));
    EXPECT_STREQ("", buf);
    EXPECT_FALSE(plat::FsExists(dir.File("QuorvexLog.txt").c_str()));
}

TEST(MetaFileLogger, ConfigureValidatesInOrder) {
    testkit::CTempDir dir;
    EXPECT_EQ(-1001, Log().Configure(dir.Path().c_str(), 512, 3, 5));
    EXPECT_EQ(-1001, Log().Configure(dir.Path().c_str(), 512, 3, 0));
    // The level is stored before the size and count are checked.
    EXPECT_EQ(-1001, Log().Configure(dir.Path().c_str(), 0, 3, 4));
    EXPECT_EQ(4, Log().Level());
    EXPECT_EQ(-1001, Log().Configure(dir.Path().c_str(), 512, 0, 2));
    EXPECT_EQ(2, Log().Level());
    EXPECT_EQ(-1014, Log().Configure("", 512, 3, 3));
    EXPECT_EQ(-1014, Log().Configure(dir.File("missing/sub").c_str(), 512, 3, 3));
    EXPECT_EQ(1, Log().Configure(dir.Path().c_str(), 512, 3, 3));
    // Configuration leaves an empty file behind, which the first line appends to.
    EXPECT_TRUE(plat::FsExists(dir.File("QuorvexLog.txt").c_str()));
}

TEST(MetaFileLogger, WritesTabSeparatedLineWithLocalTime) {
    testkit::CTempDir dir;
    ASSERT_EQ(1, Log().Configure(dir.Path().c_str(), 512, 3, 3));
    EXPECT_EQ(1, Log().Print(kLogInfo, "CQuorvex()", "Log initialized."));
    EXPECT_EQ(1, Log().Print(kLogError, "A::B", "code %d, %s", -1006, "Timeout"));
    EXPECT_EQ(1, Log().Print(kLogWarning, "W", "w"));
    std::string text = testkit::ReadFile(dir.File("QuorvexLog.txt"));
    std::regex expected(
        "\\d{2}-\\d{2}-\\d{4}\\t\\d{2}:\\d{2}:\\d{2}\\tInfo\\tCQuorvex\\(\\)\\tLog "
        "initialized\\.\\n"
        "\\d{2}-\\d{2}-\\d{4}\\t\\d{2}:\\d{2}:\\d{2}\\tError\\tA::B\\tcode -1006, Timeout\\n"
        "\\d{2}-\\d{2}-\\d{4}\\t\\d{2}:\\d{2}:\\d{2}\\tWarning\\tW\\tw\\n");
    EXPECT_TRUE(std::regex_match(text, expected)) << text;
}

TEST(MetaFileLogger, DirectoryWithAndWithoutSeparatorNameTheSameFile) {
    testkit::CTempDir dir;
    ASSERT_EQ(1, Log().Configure(dir.Path().c_str(), 512, 3, 3));
    Log().Print(kLogInfo, "T", "first");
    ASSERT_EQ(1, Log().Configure((dir.Path() + "/").c_str(), 512, 3, 3));
    Log().Print(kLogInfo, "T", "second");
    EXPECT_EQ(2u, Lines(testkit::ReadFile(dir.File("QuorvexLog.txt"))).size());
}

TEST(MetaFileLogger, LevelFilterKeepsPreviousLastLine) {
    testkit::CTempDir dir;
    ASSERT_EQ(1, Log().Configure(dir.Path().c_str(), 512, 3, 3));
    EXPECT_EQ(1, Log().Print(kLogInfo, "T", "kept"));
    EXPECT_EQ(1, Log().Print(kLogDebug, "T", "filtered"));
    EXPECT_EQ(-1001, Log().Print(0, "T", "bad level"));
    EXPECT_EQ(-1001, Log().Print(6, "T", "bad level"));
    char buf[1024];
    Log().GetLastLine(buf, sizeof(buf));
    EXPECT_STREQ("kept", buf);
    EXPECT_EQ(1u, Lines(testkit::ReadFile(dir.File("QuorvexLog.txt"))).size());

    char small[4] = {'x', 'x', 'x', 'x'};
    Log().GetLastLine(small, sizeof(small));
    EXPECT_STREQ("kep", small);
}

TEST(MetaFileLogger, MessageIsCutAt1023CharactersHeaderNotCounted) {
    testkit::CTempDir dir;
    ASSERT_EQ(1, Log().Configure(dir.Path().c_str(), 512, 3, 3));
    std::string longText(3000, 'm');
    EXPECT_EQ(1, Log().Print(kLogInfo, "SomeTag", "%s", longText.c_str()));
    std::vector<std::string> lines = Lines(testkit::ReadFile(dir.File("QuorvexLog.txt")));
    ASSERT_EQ(1u, lines.size());
    size_t body = lines[0].rfind('\t') + 1;
    EXPECT_EQ(1023u, lines[0].size() - body);
    char buf[2048];
    Log().GetLastLine(buf, sizeof(buf));
    EXPECT_EQ(1023u, std::string(buf).size());
}

TEST(MetaFileLogger, RotatesIntoNumberedGenerationsDroppingTheOldest) {
    testkit::CTempDir dir;
    ASSERT_EQ(1, Log().Configure(dir.Path().c_str(), 1, 2, 3));
    std::string payload(200, 'p');
    int rotations = 0;
    std::string previousFirst;
    // Each line is ~240 bytes: a 1 KB file rotates after its fifth line.
    for (int i = 0; i < 15; ++i) {
        ASSERT_EQ(1, Log().Print(kLogInfo, "Rot", "%02d %s", i, payload.c_str()));
        if (testkit::ReadFile(dir.File("QuorvexLog.txt")).empty()) {
            ++rotations;
        }
    }
    EXPECT_EQ(3, rotations);
    EXPECT_TRUE(plat::FsExists(dir.File("QuorvexLog.txt").c_str()));
    EXPECT_TRUE(plat::FsExists(dir.File("QuorvexLog1.txt").c_str()));
    EXPECT_TRUE(plat::FsExists(dir.File("QuorvexLog2.txt").c_str()));
    EXPECT_FALSE(plat::FsExists(dir.File("QuorvexLog3.txt").c_str()));
    // Generation 1 is the newest full file, generation 2 the one before it.
    EXPECT_NE(std::string::npos, testkit::ReadFile(dir.File("QuorvexLog1.txt")).find("\t14 "));
    EXPECT_NE(std::string::npos, testkit::ReadFile(dir.File("QuorvexLog2.txt")).find("\t09 "));
    EXPECT_EQ(std::string::npos, testkit::ReadFile(dir.File("QuorvexLog2.txt")).find("\t04 "));
}

TEST(MetaFileLogger, LinesFromSeveralThreadsNeverInterleave) {
    testkit::CTempDir dir;
    ASSERT_EQ(1, Log().Configure(dir.Path().c_str(), 100000, 3, 3));
    constexpr int kThreads = 4;
    constexpr int kLinesEach = 300;
    std::vector<std::thread> threads;
    for (int t = 0; t < kThreads; ++t) {
        threads.emplace_back([t] {
            std::string body(100, static_cast<char>('a' + t));
            for (int i = 0; i < kLinesEach; ++i) {
                Log().Print(kLogInfo, "Thread", "%d:%s", t, body.c_str());
            }
        });
    }
    for (auto& th : threads) {
        th.join();
    }
    std::vector<std::string> lines = Lines(testkit::ReadFile(dir.File("QuorvexLog.txt")));
    ASSERT_EQ(static_cast<size_t>(kThreads * kLinesEach), lines.size());
    std::regex whole("[^\\t]+\\t[^\\t]+\\tInfo\\tThread\\t([0-3]):([a-d]{100})");
    for (const std::string& line : lines) {
        std::smatch m;
        ASSERT_TRUE(std::regex_match(line, m, whole)) << line;
        EXPECT_EQ(std::string(100, static_cast<char>('a' + (m[1].str()[0] - '0'))), m[2].str());
    }
}
