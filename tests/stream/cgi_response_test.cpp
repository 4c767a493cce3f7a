#include "stream/cgi_response.h"

#include <gtest/gtest.h>

#include <string>

#include "quorvex/error_codes.h"

namespace {

cgi::SResponse Parse(std::string_view text) {
    cgi::SResponse r;
    cgi::ParseResponse(text, &r);
    return r;
}

}  // namespace

TEST(CgiResponse, StatusClassesMapToResultCodes) {
    struct SCase {
        const char* response;
        int result;
        const char* status;
    };
    const SCase cases[] = {
        {"HTTP/1.0 200 OK\r\n\r\n", QVX_OK, "200"},
        {"HTTP/1.1 204 No Content\r\n\r\n", QVX_OK, "204"},
        {"HTTP/1.0 401 Unauthorized\r\n\r\n", QVX_ERR_INVALID_COMMAND, "401"},
        {"HTTP/1.0 502 Bad Gateway\r\n\r\n", QVX_ERR_INVALID_PARAMETERS, "502"},
        {"HTTP/1.0 1xx\r\n\r\n", QVX_ERR_HTTP, "1xx"},
    };
    for (const SCase& c : cases) {
        cgi::SResponse r = Parse(c.response);
        EXPECT_TRUE(r.hasStatus) << c.response;
        EXPECT_STREQ(c.status, r.status) << c.response;
        EXPECT_EQ(c.result, cgi::StatusResult(r)) << c.response;
        EXPECT_EQ(c.result == QVX_OK, r.outcome == cgi::EOutcome::kOk) << c.response;
    }
}

TEST(CgiResponse, StatusLineCutShortIsAnErrorNotAReadBeyondTheData) {
    // The code would lie beyond the bytes received.
    for (const char* text : {"HTTP/1.", "HTTP/1.0 ", "HTTP/1.0 20", "xxHTTP/1.1 4"}) {
        cgi::SResponse r = Parse(std::string_view(text));
        EXPECT_EQ(cgi::EOutcome::kHttpError, r.outcome) << text;
        EXPECT_STREQ("", r.status) << text;
        EXPECT_EQ(QVX_ERR_HTTP, cgi::StatusResult(r)) << text;
    }
    // A view that stops inside a longer buffer: the bytes after it must not count.
    const std::string full = "HTTP/1.0 200 OK";
    EXPECT_EQ(cgi::EOutcome::kHttpError, Parse(std::string_view(full).substr(0, 11)).outcome);
}

TEST(CgiResponse, WithoutStatusOrLengthTheWholeAnswerIsTheBody) {
    const std::string text = "DateFormat=ymd\r\n";
    cgi::SResponse r = Parse(text);
    EXPECT_EQ(cgi::EOutcome::kOk, r.outcome);
    EXPECT_FALSE(r.hasStatus);
    EXPECT_EQ(0u, r.contentLength);
    EXPECT_EQ(text, cgi::BodyOf(text, r));
}

TEST(CgiResponse, BodyMustEndExactlyWhereTheDataEnds) {
    const std::string ok = "HTTP/1.0 200 OK\r\nContent-Length: 5\r\n\r\nhello";
    cgi::SResponse r = Parse(ok);
    ASSERT_EQ(cgi::EOutcome::kOk, r.outcome);
    EXPECT_EQ(5u, r.contentLength);
    EXPECT_EQ("hello", cgi::BodyOf(ok, r));

    EXPECT_EQ(cgi::EOutcome::kLengthMismatch,
              Parse("HTTP/1.0 200 OK\r\nContent-Length: 6\r\n\r\nhello").outcome);
    EXPECT_EQ(cgi::EOutcome::kLengthMismatch,
              Parse("HTTP/1.0 200 OK\r\nContent-Length: 4\r\n\r\nhello").outcome);
    EXPECT_EQ(cgi::EOutcome::kNoSeparator,
              Parse("HTTP/1.0 200 OK\r\nContent-Length: 5\r\nhello").outcome);
    // Length 0 announced: no separator needed.
    EXPECT_EQ(cgi::EOutcome::kOk, Parse("HTTP/1.0 200 OK\r\nContent-Length: 0\r\n").outcome);
}

TEST(CgiResponse, IllegalContentLengthValues) {
    const char* bad[] = {
        "Content-Length: abc\r\n\r\n",
        "Content-Length: -5\r\n\r\nhello",
        "Content-Length: 99999999999999999999\r\n\r\n",
        "Content-Length: 2147483648\r\n\r\n",
        "Content-Length:\r\n\r\n",
        // No carriage return after the header: its end is not in the data.
        "Content-Length: 5",
        "Content-Length:",
    };
    for (const char* text : bad) {
        EXPECT_EQ(cgi::EOutcome::kIllegalContentLength, Parse(text).outcome) << text;
    }
    // Blanks before the number and a plus sign are accepted, as a scanf would.
    EXPECT_EQ(3u, Parse("Content-Length:\t +3\r\n\r\nabc").contentLength);
}

TEST(CgiInquiry, DateFormatNamesAndDigits) {
    struct SCase {
        const char* body;
        int found;
        int format;
    };
    const SCase cases[] = {
        {"DateFormat=ymd\r\n", 1, 0},  {"DateFormat=0", 1, 0},
        {"x\r\nDateFormat=mdy", 1, 1}, {"DateFormat=1\r\n", 1, 1},
        {"DateFormat=dmy\r\n", 1, 2},  {"DateFormat=2", 1, 2},
        {"DateFormat=xyz", -1, 7},     {"DateFormat=dm", -1, 7},
        {"DateFormat=", -1, 7},        {"Other=1", 0, 7},
    };
    for (const SCase& c : cases) {
        int format = 7;
        EXPECT_EQ(c.found, cgi::FindDateFormat(c.body, &format)) << c.body;
        EXPECT_EQ(c.format, format) << c.body;
    }
}

TEST(CgiInquiry, VersionNumbersOfOneOrTwoDigits) {
    cgi::SVersion v;
    ASSERT_EQ(1, cgi::FindVersion("MovingObjectDetectionVersion=1.10.2\r\n",
                                  "MovingObjectDetectionVersion=", &v));
    EXPECT_EQ(1, v.major);
    EXPECT_EQ(10, v.minor);
    EXPECT_EQ(2, v.revision);
    ASSERT_EQ(1, cgi::FindVersion("a\r\nV=12.3.45", "V=", &v));
    EXPECT_EQ(12, v.major);
    EXPECT_EQ(3, v.minor);
    EXPECT_EQ(45, v.revision);
    // The revision takes a second character only when it is a digit.
    ASSERT_EQ(1, cgi::FindVersion("V=2.0.7b", "V=", &v));
    EXPECT_EQ(7, v.revision);

    cgi::SVersion untouched{9, 9, 9};
    EXPECT_EQ(0, cgi::FindVersion("Other=1.2.3", "V=", &untouched));
    for (const char* bad :
         {"V=", "V=1", "V=1.", "V=1.2", "V=1.2.", "V=123.4.5", "V=a.b.c", "V=1.2x.3"}) {
        EXPECT_EQ(-1, cgi::FindVersion(bad, "V=", &untouched)) << bad;
    }
    EXPECT_EQ(9, untouched.major);
    EXPECT_EQ(9, untouched.revision);
}
