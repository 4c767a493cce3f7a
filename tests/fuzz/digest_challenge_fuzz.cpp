// Feeds arbitrary bytes, as a camera's 401 answer, to the challenge reader and the
// Authorization line builder. The line must always be complete and well formed, whatever
// the challenge held.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <string_view>

#include "stream/http_digest.h"

namespace {

bool IsLowerHex(const std::string& text) {
    for (char c : text) {
        if (!((c >= '0' && c <= '9') || (c >= 'a' && c <= 'f'))) {
            return false;
        }
    }
    return true;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    const std::string_view text(reinterpret_cast<const char*>(data), size);

    SDigestChallenge challenge;
    CHttpDigest::ParseChallenge(text, &challenge);
    // Everything taken from the challenge is a piece of the text itself.
    for (const std::string* field : {&challenge.scheme, &challenge.realm, &challenge.nonce,
                                     &challenge.opaque, &challenge.qop}) {
        if (field->size() > size) {
            std::abort();
        }
    }

    CHttpDigest digest;
    digest.method = "GET";
    digest.uri = "/meta.cgi";
    const std::string line = digest.BuildAuthorization(text, "user", "pass");
    if (line.rfind("Authorization: Digest username=\"user\"", 0) != 0 || line.size() < 2 ||
        line.compare(line.size() - 2, 2, "\r\n") != 0) {
        std::abort();
    }
    if (digest.response.size() != 32 || !IsLowerHex(digest.response) ||
        digest.realm != challenge.realm || digest.nonce != challenge.nonce) {
        std::abort();
    }
    return 0;
}
