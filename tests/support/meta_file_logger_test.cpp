#include "support/meta_file_logger.h"

#include <gtest/gtest.h>

#include "common/temp_dir.h"

TEST(MetaFileLoggerSmoke, ConfiguresAndWrites) {
    testkit::CTempDir dir;
    ASSERT_EQ(1, CMetaFileLogger::Instance().Configure(dir.Path().c_str(), 512, 3, 3));
    EXPECT_EQ(1, CMetaFileLogger::Instance().Print(kLogInfo, "Tag", "hello %d", 5));
    EXPECT_NE(std::string::npos,
              testkit::ReadFile(dir.File("QuorvexLog.txt")).find("\tInfo\tTag\thello 5\n"));
}
