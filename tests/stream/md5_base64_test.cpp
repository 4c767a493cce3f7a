#include <gtest/gtest.h>

#include <string>

#include "stream/base64.h"
#include "stream/md5.h"

namespace {

struct SVector {
    const char* input;
    const char* expected;
};

}  // namespace

TEST(Md5, MatchesTheReferenceSuite) {
    const SVector suite[] = {
        {"", "d41d8cd98f00b204e9800998ecf8427e"},
        {"a", "0cc175b9c0f1b6a831c399e269772661"},
        {"abc", "900150983cd24fb0d6963f7d28e17f72"},
        {"message digest", "f96b697d7cb7938d525a2f31aaf161d0"},
        {"abcdefghijklmnopqrstuvwxyz", "c3fcd3d76192e4007dfb496cca67e13b"},
        {"ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789",
         "d174ab98d277d9f5a5611c2c9f419d9f"},
        {"1234567890123456789012345678901234567890123456789012345678901234567890123456789"
         "0",
         "57edf4a22be3c955ac49da2e2107b67a"},
    };
    for (const SVector& v : suite) {
        EXPECT_EQ(v.expected, CMd5::Hex(v.input)) << '"' << v.input << '"';
    }
}

// The padding step differs on either side of 56 bytes within a block and at block ends.
TEST(Md5, PaddingBoundaries) {
    const SVector lengths[] = {
        {"55", "ef1772b6dff9a122358552954ad0df65"}, {"56", "3b0c8ac703f828b04c6c197006d17218"},
        {"63", "b06521f39153d618550606be297466d5"}, {"64", "014842d480b571495a4a0363793f7367"},
        {"65", "c743a45e0d2e6a95cb859adae0248435"}, {"1000", "cabe45dcc9ae5b66ba86600cca6b8ba8"},
    };
    for (const SVector& v : lengths) {
        EXPECT_EQ(v.expected, CMd5::Hex(std::string(std::stoul(v.input), 'a'))) << v.input;
    }
}

TEST(Md5, PiecewiseUpdatesEqualOneShotAndObjectIsReusable) {
    const std::string text(1000, 'a');
    CMd5 md5;
    // Odd piece sizes straddle the 64-byte blocks in every position.
    size_t pos = 0;
    for (size_t piece = 1; pos < text.size(); piece = piece % 70 + 1) {
        size_t take = std::min(piece, text.size() - pos);
        md5.Update(text.data() + pos, take);
        pos += take;
    }
    uint8_t digest[CMd5::kDigestBytes];
    md5.Final(digest);
    EXPECT_EQ(0xca, digest[0]);
    EXPECT_EQ(0xa8, digest[15]);

    md5.Update("abc", 3);
    md5.Final(digest);
    EXPECT_EQ(0x90, digest[0]);
    EXPECT_EQ(0x72, digest[15]);
}

TEST(Base64, MatchesTheReferenceVectors) {
    const SVector vectors[] = {{"", ""},
                               {"f", "Zg=="},
                               {"fo", "Zm8="},
                               {"foo", "Zm9v"},
                               {"foob", "Zm9vYg=="},
                               {"fooba", "Zm9vYmE="},
                               {"foobar", "Zm9vYmFy"}};
    for (const SVector& v : vectors) {
        EXPECT_EQ(v.expected, base64::Encode(v.input)) << v.input;
    }
    // The last two letters of the alphabet and bytes above 0x7f.
    EXPECT_EQ("+/+/", base64::Encode(std::string("\xfb\xff\xbf")));
    EXPECT_EQ("+/8=", base64::Encode(std::string("\xfb\xff")));
    EXPECT_EQ("QWxhZGRpbjpvcGVuIHNlc2FtZQ==", base64::Encode("Aladdin:open sesame"));
}

TEST(Base64, RefusesAnOutputFieldThatCannotHoldTheTerminator) {
    char out[9];
    // "foobar" needs 8 characters and the terminator.
    EXPECT_TRUE(base64::Encode("foobar", 6, out, 9));
    EXPECT_STREQ("Zm9vYmFy", out);
    EXPECT_FALSE(base64::Encode("foobar", 6, out, 8));
    EXPECT_STREQ("", out);
    EXPECT_FALSE(base64::Encode("f", 1, out, 0));
}
