#include "platform/file_system.h"

#include <gtest/gtest.h>

#include "common/temp_dir.h"

TEST(FileSystem, CreatesDirectoriesOneLevelAtATime) {
    testkit::CTempDir dir;
    std::string sub = dir.File("2026");
    EXPECT_TRUE(plat::FsCreateDirectory(sub.c_str()));
    EXPECT_TRUE(plat::FsIsDirectory(sub.c_str()));
    EXPECT_FALSE(plat::FsCreateDirectory(sub.c_str()));
    EXPECT_EQ(plat::kFsErrAlreadyExists, plat::FsLastError());
    EXPECT_FALSE(plat::FsCreateDirectory(dir.File("a/b/c").c_str()));
    EXPECT_EQ(plat::kFsErrNotFound, plat::FsLastError());
}

TEST(FileSystem, OpensWritesRenamesAndDeletesUtf8Paths) {
    testkit::CTempDir dir;
    std::string path = dir.File("Kamera-\xC3\xBC\xE6\x97\xA5.dat");
    std::FILE* f = plat::FsOpen(path.c_str(), "wb");
    ASSERT_NE(nullptr, f);
    ASSERT_EQ(10u, std::fwrite("0123456789", 1, 10, f));
    EXPECT_EQ(10, plat::FsFileLength(f));
    EXPECT_TRUE(plat::FsSeek(f, 4, SEEK_SET));
    EXPECT_EQ(4, plat::FsTell(f));
    EXPECT_TRUE(plat::FsFlush(f));
    std::fclose(f);
    EXPECT_TRUE(plat::FsExists(path.c_str()));
    EXPECT_FALSE(plat::FsIsDirectory(path.c_str()));

    std::string moved = dir.File("moved.dat");
    EXPECT_TRUE(plat::FsRename(path.c_str(), moved.c_str()));
    EXPECT_FALSE(plat::FsExists(path.c_str()));
    EXPECT_EQ("0123456789", testkit::ReadFile(moved));
    EXPECT_TRUE(plat::FsDelete(moved.c_str()));
    EXPECT_FALSE(plat::FsDelete(moved.c_str()));
    EXPECT_EQ(plat::kFsErrNotFound, plat::FsLastError());
    EXPECT_EQ(nullptr, plat::FsOpen(dir.File("none/x").c_str(), "rb"));
    EXPECT_EQ(nullptr, plat::FsOpen(nullptr, "rb"));
    EXPECT_EQ(-1, plat::FsFileLength(nullptr));
}

TEST(FileSystem, ReportsFreeBytesAndOwnExecutable) {
    testkit::CTempDir dir;
    uint64_t freeBytes = 0;
    ASSERT_TRUE(plat::FsFreeBytes(dir.Path().c_str(), &freeBytes));
    EXPECT_GT(freeBytes, 0u);
    EXPECT_FALSE(plat::FsFreeBytes(dir.File("missing").c_str(), &freeBytes));
    std::string exe = plat::FsExecutablePath();
    ASSERT_FALSE(exe.empty());
    EXPECT_TRUE(plat::FsExists(exe.c_str()));
    EXPECT_EQ("test_platform", exe.substr(exe.rfind('/') + 1));
}
