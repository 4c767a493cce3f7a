#include "support/pattern_formatter.h"

#include <cstdio>
#include <cstring>

namespace {

bool IsFlag(char c) {
    return c == '#' || c == '-' || c == '.' || (c >= '0' && c <= '9');
}

// Bytes of a UTF-8 sequence starting with lead (1 for anything that is not a lead byte).
size_t SequenceLength(unsigned char lead) {
    if (lead >= 0xF0 && lead < 0xF8) {
        return 4;
    }
    if (lead >= 0xE0) {
        return lead < 0xF0 ? 3 : 1;
    }
    if (lead >= 0xC0) {
        return 2;
    }
    return 1;
}

// A width or precision never needs more than three digits: the output is bounded far below
// that, and a huge width would have the C library pad for nothing.
constexpr int kMaxDigitRun = 3;

std::string BoundedFlags(const std::string& flags) {
    std::string out;
    int run = 0;
    for (char c : flags) {
        run = (c >= '0' && c <= '9') ? run + 1 : 0;
        if (run <= kMaxDigitRun) {
            out += c;
        }
    }
    return out;
}

}  // namespace

CPatternFormatter::CPatternFormatter(size_t startLimit, size_t hardLimit)
    : m_startLimit(startLimit), m_hardLimit(hardLimit) {}

void CPatternFormatter::Append(const char* text, size_t len) {
    if (m_out.size() >= m_hardLimit) {
        return;
    }
    m_out.append(text, std::min(len, m_hardLimit - m_out.size()));
}

void CPatternFormatter::AppendWithFlags(const std::string& flags, const char* conversion,
                                        long long value) {
    std::string format = "%" + BoundedFlags(flags) + "ll" + conversion;
    char buf[1024];
    // '#' has no meaning for decimal conversions; the C library ignores it.
    int n = std::snprintf(buf, sizeof(buf), format.c_str(), value);
    if (n > 0) {
        Append(buf, std::min(static_cast<size_t>(n), sizeof(buf) - 1));
    }
}

void CPatternFormatter::AppendFixed(const char* format, long long value) {
    char buf[32];
    int n = std::snprintf(buf, sizeof(buf), format, value);
    if (n > 0) {
        Append(buf, std::min(static_cast<size_t>(n), sizeof(buf) - 1));
    }
}

std::string CPatternFormatter::Run(const char* pattern, const Converter& convert) {
    m_out.clear();
    if (pattern == nullptr) {
        return m_out;
    }
    const char* p = pattern;
    while (*p != '\0' && m_out.size() < m_startLimit) {
        if (*p != '%') {
            size_t len = SequenceLength(static_cast<unsigned char>(*p));
            size_t avail = std::strlen(p);
            len = std::min(len, avail);
            Append(p, len);
            p += len;
            continue;
        }
        const char* start = p++;
        std::string flags;
        while (IsFlag(*p)) {
            flags += *p++;
        }
        if (*p == '\0') {
            Append(start, static_cast<size_t>(p - start));
            break;
        }
        char code = *p++;
        if (code == '%') {
            Append("%", 1);
        } else if (!convert(code, flags, *this)) {
            Append(start, static_cast<size_t>(p - start));
        }
    }
    return m_out;
}
