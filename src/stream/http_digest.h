#ifndef QUORVEX_STREAM_HTTP_DIGEST_H
#define QUORVEX_STREAM_HTTP_DIGEST_H

#include <cstdint>
#include <string>
#include <string_view>

// What a camera's "WWW-Authenticate" challenge offers; fields are empty when absent.
struct SDigestChallenge {
    std::string scheme;
    std::string realm;
    std::string qop;
    std::string nonce;
    std::string opaque;
    bool stale = false;
};

// The HTTP Digest context of one camera connection and the computation of its
// "Authorization:" line (RFC 2617, MD5, qop auth). The stream client sets method and uri
// before each computation; every other field is refilled from each new challenge.
class CHttpDigest {
public:
    // The client nonce sent with every line; cameras accept any value, and a fixed one keeps
    // the request reproducible.
    static constexpr const char* kClientNonce = "7f31c08a5be94d26";

    std::string method;
    std::string scheme;
    std::string username;
    std::string realm;
    std::string nonce;
    std::string uri;
    std::string qop;
    uint32_t nonceCount = 0;
    std::string cnonce;
    std::string response;
    std::string opaque;
    std::string entityBody;

    // Reads the challenge out of a 401 response, computes the response and returns the
    // complete "Authorization: Digest ..." line followed by "\r\n".
    std::string BuildAuthorization(std::string_view response401, std::string_view user,
                                   std::string_view password);

    // The response value for the current context.
    std::string ComputeResponse(std::string_view password) const;

    static void ParseChallenge(std::string_view text, SDigestChallenge* challenge);

    // A header's value as received. The name matches regardless of case at the start of
    // the text or of a line, followed by ":" or " :"; the value skips leading blanks and ends
    // at the next CRLF or the end of the text.
    static bool FindHeader(std::string_view text, std::string_view name, std::string_view* value);

    // A parameter of a challenge's list ("name=value" entries separated by "," or ", "),
    // name matched regardless of case. Quoted values lose their quotes; a quote doubled
    // inside them is kept as it is; an unterminated quote gives an empty value.
    static bool FindParameter(std::string_view list, std::string_view name, std::string* value);
};

#endif  // QUORVEX_STREAM_HTTP_DIGEST_H
