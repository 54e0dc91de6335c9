#pragma once

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>
#include <string_view>

namespace lumenkey::tools {

/// A folder of its own for a test, gone afterwards.
class TestFolder {
public:
    TestFolder() {
        std::string path = (std::filesystem::temp_directory_path() / "lumenkey-test-XXXXXX").string();
        _path = ::mkdtemp(path.data());
    }
    ~TestFolder() {
        std::error_code ignored;
        std::filesystem::permissions(_path, std::filesystem::perms::owner_all, ignored);
        std::filesystem::remove_all(_path, ignored);
    }
    TestFolder(TestFolder const&) = delete;
    TestFolder& operator=(TestFolder const&) = delete;

    std::filesystem::path path() const { return _path; }
    std::string file(std::string_view name) const { return (_path / name).string(); }
    std::string write(std::string_view name, std::string_view content) const {
        std::ofstream(_path / name, std::ios::binary) << content;
        return file(name);
    }
    std::size_t entryCount() const {
        return static_cast<std::size_t>(
            std::distance(std::filesystem::directory_iterator(_path), std::filesystem::directory_iterator()));
    }

private:
    std::filesystem::path _path;
};

inline std::string contentOf(std::string const& file) {
    std::ifstream stream(file, std::ios::binary);
    std::ostringstream content;
    content << stream.rdbuf();
    return content.str();
}

} // namespace lumenkey::tools
