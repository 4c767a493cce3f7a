#include "stream/cgi_response.h"

#include <cstdint>

#include "quorvex/error_codes.h"

namespace cgi {

namespace {

constexpr std::string_view kStatusMarker = "HTTP/1.";
// "HTTP/1.x " precedes the three digits of the code.
constexpr size_t kStatusOffset = 9;
constexpr std::string_view kContentLength = "Content-Length:";
constexpr std::string_view kHeaderEnd = "\r\n\r\n";
// No camera answer comes anywhere near this; a larger value is a corrupt header.
constexpr int64_t kMaxContentLength = 0x7fffffff;

bool IsDigit(char c) {
    return c >= '0' && c <= '9';
}

// The number after "Content-Length:"; false when there is none or it is not plausible.
bool ScanContentLength(std::string_view text, size_t* length) {
    size_t pos = 0;
    while (pos < text.size() && (text[pos] == ' ' || text[pos] == '\t')) {
        ++pos;
    }
    bool negative = false;
    if (pos < text.size() && (text[pos] == '+' || text[pos] == '-')) {
        negative = text[pos] == '-';
        ++pos;
    }
    if (pos >= text.size() || !IsDigit(text[pos])) {
        return false;
    }
    int64_t value = 0;
    while (pos < text.size() && IsDigit(text[pos])) {
        value = value * 10 + (text[pos] - '0');
        if (value > kMaxContentLength) {
            return false;
        }
        ++pos;
    }
    if (negative && value != 0) {
        return false;
    }
    *length = static_cast<size_t>(value);
    return true;
}

}  // namespace

void ParseResponse(std::string_view response, SResponse* out) {
    *out = SResponse{};
    size_t marker = response.find(kStatusMarker);
    if (marker != std::string_view::npos) {
        out->hasStatus = true;
        size_t code = marker + kStatusOffset;
        if (code + 3 > response.size()) {
            out->outcome = EOutcome::kHttpError;
            return;
        }
        for (size_t i = 0; i < 3; ++i) {
            out->status[i] = response[code + i];
        }
        if (out->status[0] != '2') {
            out->outcome = EOutcome::kHttpError;
            return;
        }
    }

    size_t header = response.find(kContentLength);
    if (header != std::string_view::npos) {
        size_t valueStart = header + kContentLength.size();
        size_t cr = response.find('\r', valueStart);
        if (cr == std::string_view::npos ||
            !ScanContentLength(response.substr(valueStart, cr - valueStart), &out->contentLength)) {
            out->outcome = EOutcome::kIllegalContentLength;
            return;
        }
    }
    if (out->contentLength == 0) {
        return;
    }
    size_t end = response.find(kHeaderEnd);
    if (end == std::string_view::npos) {
        out->outcome = EOutcome::kNoSeparator;
        return;
    }
    out->bodyOffset = end + kHeaderEnd.size();
    if (response.size() - out->bodyOffset != out->contentLength) {
        out->outcome = EOutcome::kLengthMismatch;
    }
}

std::string_view BodyOf(std::string_view response, const SResponse& parsed) {
    if (parsed.outcome != EOutcome::kOk || parsed.contentLength == 0) {
        return response;
    }
    return response.substr(parsed.bodyOffset, parsed.contentLength);
}

int StatusResult(const SResponse& response) {
    if (!response.hasStatus || response.status[0] == '2') {
        return QVX_OK;
    }
    switch (response.status[0]) {
        case '4':
            return QVX_ERR_INVALID_COMMAND;
        case '5':
            return std::string_view(response.status) == "503" ? QVX_ERR_SERVICE_UNAVAILABLE
                                                              : QVX_ERR_INVALID_PARAMETERS;
        default:
            return QVX_ERR_HTTP;
    }
}

int FindDateFormat(std::string_view body, int* dateFormat) {
    constexpr std::string_view kKey = "DateFormat=";
    size_t at = body.find(kKey);
    if (at == std::string_view::npos) {
        return 0;
    }
    std::string_view value = body.substr(at + kKey.size());
    struct SName {
        std::string_view name;
        std::string_view digit;
        int format;
    };
    static constexpr SName kNames[] = {{"ymd", "0", 0}, {"mdy", "1", 1}, {"dmy", "2", 2}};
    for (const SName& name : kNames) {
        if (value.substr(0, 3) == name.name || value.substr(0, 1) == name.digit) {
            *dateFormat = name.format;
            return 1;
        }
    }
    return -1;
}

int FindVersion(std::string_view body, std::string_view key, SVersion* version) {
    size_t at = body.find(key);
    if (at == std::string_view::npos) {
        return 0;
    }
    std::string_view text = body.substr(at + key.size());
    size_t pos = 0;
    auto digitAt = [&text](size_t i) { return i < text.size() && IsDigit(text[i]); };
    // Major and minor: one digit, or two when the dot does not follow the first.
    int parts[2] = {0, 0};
    for (int& part : parts) {
        if (!digitAt(pos)) {
            return -1;
        }
        part = text[pos] - '0';
        if (pos + 1 < text.size() && text[pos + 1] != '.') {
            if (!digitAt(pos + 1)) {
                return -1;
            }
            part = part * 10 + (text[pos + 1] - '0');
            ++pos;
        }
        if (pos + 1 >= text.size() || text[pos + 1] != '.') {
            return -1;
        }
        pos += 2;
    }
    if (!digitAt(pos)) {
        return -1;
    }
    int revision = text[pos] - '0';
    if (digitAt(pos + 1)) {
        revision = revision * 10 + (text[pos + 1] - '0');
    }
    version->major = parts[0];
    version->minor = parts[1];
    version->revision = revision;
    return 1;
}

}  // namespace cgi
