#include "facade/ini_profile.h"

#include <gtest/gtest.h>

#include <string>

#include "common/temp_dir.h"

TEST(IniProfile, ResultCodesOfTheReader) {
    testkit::CTempDir dir;
    std::string ini = dir.File("x.ini");
    testkit::WriteFile(ini, "[S]\nEmpty=\nKey=value\nLong=" + std::string(40, 'l') + "\n");
    char out[16];
    EXPECT_EQ(-1001,
              CIniProfile::GetMyProfile(nullptr, "Key", nullptr, out, sizeof(out), ini.c_str()));
    EXPECT_EQ(-1001,
              CIniProfile::GetMyProfile("S", nullptr, nullptr, out, sizeof(out), ini.c_str()));
    EXPECT_EQ(-1001, CIniProfile::GetMyProfile("", "Key", nullptr, out, sizeof(out), ini.c_str()));
    EXPECT_EQ(-1001, CIniProfile::GetMyProfile("S", "", nullptr, out, sizeof(out), ini.c_str()));
    EXPECT_EQ(-1001, CIniProfile::GetMyProfile("S", "Key", nullptr, out, 0, ini.c_str()));
    EXPECT_EQ(-1004, CIniProfile::GetMyProfile("S", "Key", nullptr, out, sizeof(out),
                                               dir.File("none.ini").c_str()));
    EXPECT_EQ(-1007, CIniProfile::GetMyProfile("T", "Key", nullptr, out, sizeof(out), ini.c_str()));
    EXPECT_EQ(-1007, CIniProfile::GetMyProfile("S", "Ke", nullptr, out, sizeof(out), ini.c_str()));
    EXPECT_EQ(-1028,
              CIniProfile::GetMyProfile("S", "Empty", nullptr, out, sizeof(out), ini.c_str()));
    EXPECT_EQ(-1002,
              CIniProfile::GetMyProfile("S", "Long", nullptr, out, sizeof(out), ini.c_str()));
    ASSERT_EQ(1, CIniProfile::GetMyProfile("S", "Key", nullptr, out, sizeof(out), ini.c_str()));
    EXPECT_STREQ("value", out);

    // The string form reports a too-long value as a full buffer and hands out the default.
    EXPECT_EQ(15u,
              CIniProfile::GetMyProfileString("S", "Long", "dflt", out, sizeof(out), ini.c_str()));
    EXPECT_STREQ("dflt", out);
    EXPECT_EQ(5u,
              CIniProfile::GetMyProfileString("S", "Key", "dflt", out, sizeof(out), ini.c_str()));
    // A default longer than the buffer is cut, never written past it.
    char tiny[4];
    EXPECT_EQ(3u, CIniProfile::GetMyProfileString("S", "Nope", "default", tiny, sizeof(tiny),
                                                  ini.c_str()));
    EXPECT_STREQ("def", tiny);
}

TEST(IniProfile, IntegerValues) {
    testkit::CTempDir dir;
    std::string ini = dir.File("x.ini");
    testkit::WriteFile(ini, "[S]\nA= 12x\nB=-7\nC=+3\nD=x12\nE=99999999999\nF=1234567890123456\n");
    EXPECT_EQ(12, CIniProfile::GetMyProfileInt("S", "A", 1, ini.c_str()));
    EXPECT_EQ(-7, CIniProfile::GetMyProfileInt("S", "B", 1, ini.c_str()));
    EXPECT_EQ(3, CIniProfile::GetMyProfileInt("S", "C", 1, ini.c_str()));
    EXPECT_EQ(1, CIniProfile::GetMyProfileInt("S", "D", 1, ini.c_str()));
    EXPECT_EQ(1, CIniProfile::GetMyProfileInt("S", "E", 1, ini.c_str()));  // beyond 32 bits
    EXPECT_EQ(1, CIniProfile::GetMyProfileInt("S", "F", 1, ini.c_str()));  // over 15 characters
    EXPECT_EQ(1, CIniProfile::GetMyProfileInt("S", "G", 1, ini.c_str()));
}
