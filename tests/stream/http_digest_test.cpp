#include "stream/http_digest.h"

#include <gtest/gtest.h>

#include <string>

namespace {

const char* const kChallenge =
    "HTTP/1.0 401 Unauthorized\r\n"
    "Server: cam\r\n"
    "WWW-Authenticate: Digest realm=\"testrealm@host.com\", qop=\"auth,auth-int\", "
    "nonce=\"dcd98b7102dd2f0e8b11d0f600bfb0c093\", "
    "opaque=\"5ccc069c403ebaf9f0171e9517f40e41\"\r\n"
    "\r\n";

}  // namespace

TEST(HttpDigestResponse, ReferenceComputation) {
    CHttpDigest digest;
    digest.method = "GET";
    digest.uri = "/dir/index.html";
    digest.username = "Mufasa";
    digest.realm = "testrealm@host.com";
    digest.nonce = "dcd98b7102dd2f0e8b11d0f600bfb0c093";
    digest.nonceCount = 1;
    digest.cnonce = "0a4f113b";
    digest.qop = "auth";
    // The worked example of RFC 2617, section 3.5.
    EXPECT_EQ("6629fae49393a05397450978507c4ef1", digest.ComputeResponse("Circle Of Life"));
    // Without qop the older form joins HA1, nonce and HA2 only.
    digest.qop.clear();
    EXPECT_EQ("670fd8c2df070c60b045671b8b24ff02", digest.ComputeResponse("Circle Of Life"));
}

TEST(HttpDigestLine, BuiltFromTheChallengeWithFixedClientNonce) {
    CHttpDigest digest;
    digest.method = "GET";
    digest.uri = "/dir/index.html";
    std::string line = digest.BuildAuthorization(kChallenge, "Mufasa", "Circle Of Life");
    // Expected response computed independently with qop auth, nc 00000001 and the client
    // nonce 7f31c08a5be94d26; several qop offers still give qop=auth.
    EXPECT_EQ(
        "Authorization: Digest username=\"Mufasa\", realm=\"testrealm@host.com\", "
        "nonce=\"dcd98b7102dd2f0e8b11d0f600bfb0c093\", uri=\"/dir/index.html\", qop=auth, "
        "nc=00000001, cnonce=\"7f31c08a5be94d26\", "
        "response=\"5969367a8fa33696253bdfb8856f8fd8\", "
        "opaque=\"5ccc069c403ebaf9f0171e9517f40e41\"\r\n",
        line);
    EXPECT_EQ("5969367a8fa33696253bdfb8856f8fd8", digest.response);
}

TEST(HttpDigestLine, LowerCaseHeaderAndMissingOpaque) {
    CHttpDigest digest;
    digest.method = "GET";
    digest.uri = "/image/meta.cgi?a=1";
    // A previous challenge's opaque must not survive a new one without it.
    digest.opaque = "stale-opaque";
    std::string line = digest.BuildAuthorization(
        "HTTP/1.1 401 Unauthorized\r\nwww-authenticate: Digest REALM=\"Quorvex "
        "Camera\",nonce=N0nce=="
        "\r\n\r\n",
        "admin", "se cret");
    EXPECT_NE(std::string::npos, line.find("realm=\"Quorvex Camera\", nonce=\"N0nce==\""));
    EXPECT_NE(std::string::npos, line.find("response=\"1a2ef4ba28731e7b81fbf7f62113c417\""));
    EXPECT_NE(std::string::npos, line.find("opaque=\"\"\r\n"));
}

TEST(HttpDigestChallenge, FieldsAndStaleFlag) {
    SDigestChallenge c;
    CHttpDigest::ParseChallenge(kChallenge, &c);
    EXPECT_EQ("Digest", c.scheme);
    EXPECT_EQ("testrealm@host.com", c.realm);
    EXPECT_EQ("auth,auth-int", c.qop);
    EXPECT_EQ("dcd98b7102dd2f0e8b11d0f600bfb0c093", c.nonce);
    EXPECT_FALSE(c.stale);

    CHttpDigest::ParseChallenge("WWW-Authenticate: Digest nonce=\"n\", stale=true\r\n", &c);
    EXPECT_TRUE(c.stale);
    EXPECT_EQ("n", c.nonce);
    EXPECT_EQ("", c.realm);
    CHttpDigest::ParseChallenge("WWW-Authenticate: Digest nonce=\"n\", stale=TRUE\r\n", &c);
    EXPECT_FALSE(c.stale);
    CHttpDigest::ParseChallenge("WWW-Authenticate: Digest stale=\"true\"", &c);
    EXPECT_TRUE(c.stale);

    // No blank between scheme and parameters, or no header at all: nothing is taken.
    CHttpDigest::ParseChallenge("WWW-Authenticate: Digest\r\n", &c);
    EXPECT_EQ("", c.scheme);
    CHttpDigest::ParseChallenge("HTTP/1.0 401\r\nX-Other: Digest realm=\"r\"\r\n", &c);
    EXPECT_EQ("", c.scheme);
    EXPECT_EQ("", c.realm);
}

TEST(HttpDigestHeaderLookup, NamePositionsAndValueBounds) {
    std::string_view value;
    EXPECT_TRUE(CHttpDigest::FindHeader("Www-Authenticate:  \tBasic x\r\nNext: y",
                                        "WWW-Authenticate", &value));
    EXPECT_EQ("Basic x", value);
    EXPECT_TRUE(CHttpDigest::FindHeader("HTTP/1.0 401\r\nWWW-Authenticate : Digest a=b",
                                        "www-authenticate", &value));
    EXPECT_EQ("Digest a=b", value);
    // Only at the start of a line: a longer name that ends the same way is another header.
    EXPECT_FALSE(
        CHttpDigest::FindHeader("X-WWW-Authenticate: Digest a=b\r\n", "WWW-Authenticate", &value));
    EXPECT_FALSE(CHttpDigest::FindHeader("WWW-Authenticate", "WWW-Authenticate", &value));
    // A name at the very end of the text gives an empty value, not a read beyond it.
    EXPECT_TRUE(CHttpDigest::FindHeader("x\nWWW-Authenticate:", "WWW-Authenticate", &value));
    EXPECT_EQ("", value);
}

TEST(HttpDigestParameterLookup, QuotingAndSeparators) {
    std::string v;
    EXPECT_TRUE(CHttpDigest::FindParameter("realm=\"a\"\"b\", nonce=x", "realm", &v));
    EXPECT_EQ("a\"\"b", v);
    EXPECT_TRUE(CHttpDigest::FindParameter("realm=\"a\",nonce=x,qop=auth", "NONCE", &v));
    EXPECT_EQ("x", v);
    EXPECT_TRUE(CHttpDigest::FindParameter("realm=\"a\", Nonce=\"Mixed,Case\"", "nonce", &v));
    EXPECT_EQ("Mixed,Case", v);
    v = "previous";
    EXPECT_TRUE(CHttpDigest::FindParameter("nonce=\"unterminated", "nonce", &v));
    EXPECT_EQ("", v);
    // "xnonce=" is not the key "nonce=".
    EXPECT_FALSE(CHttpDigest::FindParameter("xnonce=1", "nonce", &v));
    EXPECT_TRUE(CHttpDigest::FindParameter("a=1, nonce=", "nonce", &v));
    EXPECT_EQ("", v);
}
