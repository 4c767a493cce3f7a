#ifndef QUORVEX_SUPPORT_PATTERN_FORMATTER_H
#define QUORVEX_SUPPORT_PATTERN_FORMATTER_H

#include <cstddef>
#include <functional>
#include <string>

// The "%" pattern language shared by the date and the duration values: a "%" may be
// followed by flag characters ("#", "-", ".", digits) and a code letter. Output is bounded:
// no element is started once startLimit characters are written, and nothing is written
// past hardLimit.
class CPatternFormatter {
public:
    CPatternFormatter(size_t startLimit, size_t hardLimit);

    // Text written so far may grow through these; each stops at the hard limit.
    void Append(const char* text, size_t len);
    void Append(const std::string& text) { Append(text.data(), text.size()); }
    // printf of one integer with the pattern's flags in front of the conversion, e.g.
    // flags "3" and conversion "d" give "%3d".
    void AppendWithFlags(const std::string& flags, const char* conversion, long long value);
    void AppendFixed(const char* format, long long value);

    // Runs over the pattern; convert handles one code and returns false for a code it does
    // not know, which is then copied as it stands.
    using Converter = std::function<bool(char code, const std::string& flags, CPatternFormatter&)>;
    std::string Run(const char* pattern, const Converter& convert);

private:
    size_t m_startLimit;
    size_t m_hardLimit;
    std::string m_out;
};

#endif  // QUORVEX_SUPPORT_PATTERN_FORMATTER_H
