#ifndef QUORVEX_STREAM_BASE64_H
#define QUORVEX_STREAM_BASE64_H

#include <cstddef>
#include <string>
#include <string_view>

// Standard Base64 (RFC 4648 alphabet, "=" padding), as HTTP Basic authentication needs it.
namespace base64 {

// Characters of the encoded form of len bytes, without a terminator.
constexpr size_t EncodedLength(size_t len) {
    return (len + 2) / 3 * 4;
}

// Encodes into out and terminates it. False, with out left an empty text when it has
// room for one, when the encoded form and its terminator do not fit in outSize bytes.
bool Encode(const void* data, size_t len, char* out, size_t outSize);

std::string Encode(std::string_view bytes);

}  // namespace base64

#endif  // QUORVEX_STREAM_BASE64_H
