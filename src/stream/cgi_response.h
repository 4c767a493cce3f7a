#ifndef QUORVEX_STREAM_CGI_RESPONSE_H
#define QUORVEX_STREAM_CGI_RESPONSE_H

#include <cstddef>
#include <string_view>

// Reading a camera's answer to a one-shot CGI request, kept apart from the socket so that
// it can be checked against any byte sequence. Every look-up stays within the bytes given.
namespace cgi {

enum class EOutcome {
    kOk,
    kHttpError,             // status other than 2xx (or a status line cut short)
    kIllegalContentLength,  // header present but no number, negative, or absurdly large
    kNoSeparator,           // a body was announced but the header end is missing
    kLengthMismatch,        // the body does not end exactly where the data ends
};

struct SResponse {
    EOutcome outcome = EOutcome::kOk;
    // The three characters of the status code as received, "" when there is no status line
    // or it was cut short.
    char status[4] = {};
    bool hasStatus = false;
    // The announced body length (0 without the header) and where the body starts; with a
    // length of 0 the body is taken as the whole response.
    size_t contentLength = 0;
    size_t bodyOffset = 0;
};

void ParseResponse(std::string_view response, SResponse* out);

// The body of a parsed response: the announced bytes, or everything when none were.
std::string_view BodyOf(std::string_view response, const SResponse& parsed);

// The library's result code for an HTTP status: QVX_OK for 2xx, else the error it maps to.
int StatusResult(const SResponse& response);

// "DateFormat=" of an inquiry body: 1 with the format (0 ymd, 1 mdy, 2 dmy) found, 0 when
// the key is absent, -1 when its value is none of the known ones.
int FindDateFormat(std::string_view body, int* dateFormat);

struct SVersion {
    int major = 0;
    int minor = 0;
    int revision = 0;
};

// A "major.minor.revision" value of one or two digits per number after key: 1 found,
// 0 key absent, -1 the value is malformed or cut short.
int FindVersion(std::string_view body, std::string_view key, SVersion* version);

}  // namespace cgi

#endif  // QUORVEX_STREAM_CGI_RESPONSE_H
