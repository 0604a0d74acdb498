#pragma once

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>

namespace support {

// A directory of its own for one test case, removed with everything in it.
class TempDir {
public:
    TempDir()
    {
        std::string pattern = (std::filesystem::temp_directory_path() / "mewlo-test-XXXXXX").string();
        _path = ::mkdtemp(pattern.data()) != nullptr ? pattern : std::string();
    }
    ~TempDir()
    {
        std::error_code ignored;
        if (!_path.empty())
            std::filesystem::remove_all(_path, ignored);
    }
    TempDir(const TempDir&) = delete;
    TempDir& operator=(const TempDir&) = delete;

    [[nodiscard]] const std::string& path() const { return _path; }
    [[nodiscard]] std::string file(const std::string& name) const { return _path + "/" + name; }

private:
    std::string _path;
};

// Gives the process a home of its own, so that keys, preferences and recordings of the user stay untouched.
inline void useHome(const TempDir& home)
{
    for (const char* name : {"HOME", "XDG_RUNTIME_DIR", "XDG_CONFIG_HOME", "XDG_DATA_HOME", "XDG_STATE_HOME",
             "MEWLO_DEVICE_ROOT", "MEWLO_CARD_ROOT", "MEWLO_PRIVATE_ROOT"}) {
        std::filesystem::create_directories(home.file(name));
        std::filesystem::permissions(home.file(name), std::filesystem::perms::owner_all);
        ::setenv(name, home.file(name).c_str(), 1);
    }
}

inline void writeFile(const std::string& path, const std::string& content)
{
    std::filesystem::create_directories(std::filesystem::path(path).parent_path());
    std::ofstream(path, std::ios::binary) << content;
}

inline std::string readFile(const std::string& path)
{
    std::ostringstream content;
    content << std::ifstream(path, std::ios::binary).rdbuf();
    return content.str();
}

}
