// Feeds arbitrary bytes to the reader of CGI answers and to the inquiry look-ups that run
// on the body it yields. Every look-up must stay within the bytes given (the sanitizers
// catch any read beyond), and what it reports must describe those bytes.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string_view>

#include "quorvex/error_codes.h"
#include "stream/cgi_response.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    const std::string_view response(reinterpret_cast<const char*>(data), size);
    cgi::SResponse parsed;
    cgi::ParseResponse(response, &parsed);

    if (parsed.outcome == cgi::EOutcome::kOk) {
        if (cgi::StatusResult(parsed) != QVX_OK) {
            std::abort();
        }
        if (parsed.contentLength > 0 &&
            (parsed.bodyOffset > size || size - parsed.bodyOffset != parsed.contentLength)) {
            std::abort();
        }
    } else if (parsed.outcome == cgi::EOutcome::kHttpError && cgi::StatusResult(parsed) == QVX_OK) {
        std::abort();
    }

    const std::string_view body = cgi::BodyOf(response, parsed);
    if (body.data() < response.data() || body.data() + body.size() > response.data() + size) {
        std::abort();
    }
    int dateFormat = -1;
    if (cgi::FindDateFormat(body, &dateFormat) == 1 && (dateFormat < 0 || dateFormat > 2)) {
        std::abort();
    }
    cgi::SVersion version;
    if (cgi::FindVersion(body, "MovingObjectDetectionVersion=", &version) == 1 &&
        (version.major < 0 || version.major > 99 || version.minor < 0 || version.minor > 99 ||
         version.revision < 0 || version.revision > 99)) {
        std::abort();
    }
    return 0;
}
