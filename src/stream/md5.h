#ifndef QUORVEX_STREAM_MD5_H
#define QUORVEX_STREAM_MD5_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

// MD5 message digest (RFC 1321). Used only for HTTP Digest authentication, where the
// camera dictates the algorithm; it is not meant as a security primitive otherwise.
class CMd5 {
public:
    static constexpr size_t kDigestBytes = 16;

    CMd5();

    void Update(const void* data, size_t len);
    // Completes the digest; the object is reset afterwards and may be reused.
    void Final(uint8_t digest[kDigestBytes]);

    // The 32 lowercase hexadecimal digits of the digest of a text.
    static std::string Hex(std::string_view text);

private:
    void Reset();
    void Transform(const uint8_t block[64]);

    uint32_t m_state[4];
    uint64_t m_bitCount;
    uint8_t m_buffer[64];
    size_t m_buffered;
};

#endif  // QUORVEX_STREAM_MD5_H
