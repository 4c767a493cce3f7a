#include "stream/base64.h"

#include <cstdint>

namespace base64 {

namespace {

constexpr char kAlphabet[] = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";

void EncodeGroup(const uint8_t* in, size_t count, char* out) {
    uint32_t group = static_cast<uint32_t>(in[0]) << 16;
    if (count > 1) {
        group |= static_cast<uint32_t>(in[1]) << 8;
    }
    if (count > 2) {
        group |= in[2];
    }
    out[0] = kAlphabet[(group >> 18) & 0x3f];
    out[1] = kAlphabet[(group >> 12) & 0x3f];
    out[2] = count > 1 ? kAlphabet[(group >> 6) & 0x3f] : '=';
    out[3] = count > 2 ? kAlphabet[group & 0x3f] : '=';
}

}  // namespace

bool Encode(const void* data, size_t len, char* out, size_t outSize) {
    if (out == nullptr || outSize == 0) {
        return false;
    }
    if (EncodedLength(len) + 1 > outSize || (len > 0 && data == nullptr)) {
        out[0] = '\0';
        return false;
    }
    const uint8_t* in = static_cast<const uint8_t*>(data);
    size_t pos = 0;
    for (size_t i = 0; i < len; i += 3) {
        EncodeGroup(in + i, len - i < 3 ? len - i : 3, out + pos);
        pos += 4;
    }
    out[pos] = '\0';
    return true;
}

std::string Encode(std::string_view bytes) {
    std::string out(EncodedLength(bytes.size()) + 1, '\0');
    Encode(bytes.data(), bytes.size(), out.data(), out.size());
    out.resize(out.size() - 1);
    return out;
}

}  // namespace base64
