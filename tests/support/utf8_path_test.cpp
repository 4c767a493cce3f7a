#include "support/utf8_path.h"

#include <gtest/gtest.h>

TEST(Utf8Path, SplitsAndJoinsAgain) {
    utf8path::SPathParts p = utf8path::SplitPath("/var/log/QuorvexLog.txt");
    EXPECT_EQ("", p.drive);
    EXPECT_EQ("/var/log/", p.folder);
    EXPECT_EQ("QuorvexLog", p.stem);
    EXPECT_EQ(".txt", p.ext);
    p.stem += "2";
    EXPECT_EQ("/var/log/QuorvexLog2.txt", utf8path::JoinPath(p));

    p = utf8path::SplitPath("archive.tar.gz");
    EXPECT_EQ("", p.folder);
    EXPECT_EQ("archive.tar", p.stem);
    EXPECT_EQ(".gz", p.ext);

    p = utf8path::SplitPath("/data/.hidden");
    EXPECT_EQ(".hidden", p.stem);
    EXPECT_EQ("", p.ext);

    p = utf8path::SplitPath("/data/dir.d/file");
    EXPECT_EQ("/data/dir.d/", p.folder);
    EXPECT_EQ("file", p.stem);
    EXPECT_EQ("", p.ext);

    EXPECT_EQ("a/b", utf8path::JoinPath({"", "a", "b", ""}));
    EXPECT_EQ("a/b.ini", utf8path::JoinPath({"", "a/", "b", "ini"}));
    EXPECT_EQ("/x/", utf8path::WithTrailingSeparator("/x"));
    EXPECT_EQ("/x/", utf8path::WithTrailingSeparator("/x/"));
    EXPECT_EQ("", utf8path::WithTrailingSeparator(""));
}
