#ifndef QUORVEX_TOOLS_CAMSIM_SIM_MD5_H
#define QUORVEX_TOOLS_CAMSIM_SIM_MD5_H

#include <string>

namespace camsim {

// The simulator's own MD5 (RFC 1321) and Base64, kept apart from the library's so that a
// fault in one cannot hide the same fault in the other.
std::string Md5Hex(const std::string& text);
std::string Base64(const std::string& bytes);

}  // namespace camsim

#endif  // QUORVEX_TOOLS_CAMSIM_SIM_MD5_H
