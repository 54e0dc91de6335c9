#include "tools/output/SafeOutputFile.h"

#include "tools/output/StandardOutput.h"
#include "tools/output/TextForms.h"

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <sys/stat.h>
#include <system_error>
#include <unistd.h>

namespace lumenkey::tools {

namespace {

namespace fs = std::filesystem;

/// As many links as the system itself follows.
constexpr int kMostLinks = 40;

/// The file that `path` leads to, which need not exist. Throws `std::system_error`.
fs::path followLinks(fs::path path) {
    for (int i = 0; i < kMostLinks; ++i) {
        std::error_code none;
        if (!fs::is_symlink(fs::symlink_status(path, none))) {
            return path;
        }
        path = path.parent_path() / fs::read_symlink(path);
    }
    throw std::system_error(ELOOP, std::generic_category());
}

/// What a new file gets: nothing else tells it but setting it, so this is for one thread.
mode_t permissionsOfNewFiles() {
    mode_t const mask = ::umask(0);
    ::umask(mask);
    return 0666 & ~mask;
}

/// The permissions that the replacement of `path` gets. Throws `std::system_error`.
mode_t permissionsFor(fs::path const& path) {
    struct stat status {};
    if (::stat(path.c_str(), &status) != 0) {
        if (errno == ENOENT) {
            return permissionsOfNewFiles();
        }
        throw std::system_error(errno, std::generic_category());
    }
    if (!S_ISREG(status.st_mode)) {
        throw std::system_error(S_ISDIR(status.st_mode) ? EISDIR : EINVAL, std::generic_category());
    }
    return status.st_mode & 07777;
}

int synchronizeDirectory(fs::path const& directory) {
    int const descriptor = ::open(directory.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (descriptor < 0) {
        return errno;
    }
    // Some file systems have no such thing as bringing a directory to the disk, and say so by EINVAL.
    int const error = ::fsync(descriptor) != 0 && errno != EINVAL ? errno : 0;
    ::close(descriptor);
    return error;
}

fs::path directoryOf(fs::path const& path) {
    return path.has_parent_path() ? path.parent_path() : fs::path(".");
}

} // namespace

SafeOutputFile::SafeOutputFile(std::string const& target) : _name(target) {
    try {
        fs::path const real = followLinks(target);
        mode_t const permissions = permissionsFor(real);
        _target = real.string();
        // Not made of the target's name, which may be as long as a name can be.
        _temporary = (directoryOf(real) / ".lumenkey-XXXXXX").string();
        _descriptor = ::mkostemp(_temporary.data(), O_CLOEXEC);
        if (_descriptor < 0) {
            _temporary.clear();
            fail(errno);
        }
        if (::fchmod(_descriptor, permissions) != 0) {
            fail(errno);
        }
    } catch (std::system_error const& error) {
        fail(error.code().value());
    }
}

void SafeOutputFile::fail(int error) {
    discard();
    throw OutputError{_name, systemErrorText(error)};
}

void SafeOutputFile::write(std::string_view text) {
    if (int const error = writeFully(_descriptor, text)) {
        fail(error);
    }
}

void SafeOutputFile::close() {
    if (::fsync(_descriptor) != 0) {
        fail(errno);
    }
    int const descriptor = _descriptor;
    _descriptor = -1;
    if (::close(descriptor) != 0 || std::rename(_temporary.c_str(), _target.c_str()) != 0) {
        fail(errno);
    }
    _temporary.clear();
    if (int const error = synchronizeDirectory(directoryOf(_target))) {
        fail(error);
    }
}

void SafeOutputFile::discard() noexcept {
    if (_descriptor >= 0) {
        ::close(_descriptor);
        _descriptor = -1;
    }
    if (!_temporary.empty()) {
        ::unlink(_temporary.c_str());
        _temporary.clear();
    }
}

} // namespace lumenkey::tools
