#ifndef QUORVEX_TESTS_COMMON_TEMP_DIR_H
#define QUORVEX_TESTS_COMMON_TEMP_DIR_H

#include <string>

namespace testkit {

// A fresh folder under the system's temporary directory, removed with its contents
// when the object goes.
class CTempDir {
public:
    CTempDir();
    ~CTempDir();
    CTempDir(const CTempDir&) = delete;
    CTempDir& operator=(const CTempDir&) = delete;

    const std::string& Path() const { return m_path; }
    // Path of a name inside the folder.
    std::string File(const std::string& name) const;

private:
    std::string m_path;
};

// Whole content of a file, or empty when it cannot be read.
std::string ReadFile(const std::string& path);
void WriteFile(const std::string& path, const std::string& content);

}  // namespace testkit

#endif  // QUORVEX_TESTS_COMMON_TEMP_DIR_H
