#include "tools/output/SafeOutputFile.h"

#include "tools/output/StandardOutput.h"
#include "tools/output/TextForms.h"

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <filesystem>
#include <iterator>
#include <optional>
#include <string_view>
#include <sys/stat.h>
#include <sys/xattr.h>
#include <system_error>
#include <unistd.h>
#include <vector>

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

fs::path directoryOf(fs::path const& path) {
    return path.has_parent_path() ? path.parent_path() : fs::path(".");
}

/// Of an attribute of a file; nothing where it has none such.
std::optional<std::vector<char>> attributeOf(char const* file, char const* name) {
    ssize_t const size = ::getxattr(file, name, nullptr, 0);
    std::vector<char> value(size > 0 ? static_cast<std::size_t>(size) : 0);
    if (size < 0 || ::getxattr(file, name, value.data(), value.size()) != size) {
        return std::nullopt;
    }
    return value;
}

/// What a directory with a list for new files gives to one that anybody might read and write: of the owner,
/// of the group or the mask over it, of others. Nothing without such a list, which consists of a number of four
/// bytes, and eight bytes for each entry: what it is of, what it allows, and for whom.
std::optional<mode_t> permissionsByList(fs::path const& directory) {
    constexpr std::size_t start = 4;
    constexpr std::size_t entry = 8;
    std::optional<std::vector<char>> const list = attributeOf(directory.c_str(), "system.posix_acl_default");
    if (!list) {
        return std::nullopt;
    }
    mode_t byKind[0x21] = {};
    bool hasMask = false;
    for (std::size_t at = start; at + entry <= list->size(); at += entry) {
        auto const kind = static_cast<unsigned char>((*list)[at]);
        if (kind < std::size(byKind)) {
            byKind[kind] = static_cast<mode_t>((*list)[at + 2] & 06);
            hasMask |= kind == 0x10;
        }
    }
    return byKind[0x01] << 6 | byKind[hasMask ? 0x10 : 0x04] << 3 | byKind[0x20];
}

/// What a new file gets: nothing else tells it but setting it, so this is for one thread.
mode_t permissionsOfNewFiles(fs::path const& directory) {
    if (std::optional<mode_t> const byList = permissionsByList(directory)) {
        return *byList;
    }
    mode_t const mask = ::umask(0);
    ::umask(mask);
    return 0666 & ~mask;
}

/// What the file at `path` is; nothing where there is none. Throws `std::system_error`, and `OutputError` of
/// `name` for what is none.
std::optional<struct stat> replacedFile(fs::path const& path, std::string const& name) {
    struct stat status {};
    if (::stat(path.c_str(), &status) != 0) {
        if (errno == ENOENT) {
            return std::nullopt;
        }
        throw std::system_error(errno, std::generic_category());
    }
    if (S_ISDIR(status.st_mode)) {
        throw std::system_error(EISDIR, std::generic_category());
    }
    if (!S_ISREG(status.st_mode)) {
        throw OutputError{name, "it is no plain file, which could be replaced as a whole"};
    }
    return status;
}

/// The list of those who may read and write a file.
constexpr char const* kAccessList = "system.posix_acl_access";

/// Gives a new file those extended attributes of the one that it replaces that may be set.
void takeOverAttributes(int descriptor, char const* replaced) {
    ssize_t const size = ::listxattr(replaced, nullptr, 0);
    std::vector<char> names(size > 0 ? static_cast<std::size_t>(size) : 0);
    if (names.empty() || ::listxattr(replaced, names.data(), names.size()) != size) {
        return;
    }
    for (char const* name = names.data(); name < names.data() + names.size(); name += std::strlen(name) + 1) {
        if (std::string_view(name) == kAccessList) {
            continue;
        }
        if (std::optional<std::vector<char>> const value = attributeOf(replaced, name)) {
            static_cast<void>(::fsetxattr(descriptor, name, value->data(), value->size(), 0));
        }
    }
}

/// Gives a new file the permissions of the one that it replaces, with its list or without any, also where the
/// directory has one for new files: either way others than before could read and write it. 0, or the number
/// of the error.
int takeOverAccess(int descriptor, mode_t permissions, char const* replaced) {
    bool const hasNone =
        ::fremovexattr(descriptor, kAccessList) == 0 || errno == ENODATA || errno == EOPNOTSUPP;
    if (!hasNone || ::fchmod(descriptor, permissions) != 0) {
        return errno;
    }
    std::optional<std::vector<char>> const list = attributeOf(replaced, kAccessList);
    return list && ::fsetxattr(descriptor, kAccessList, list->data(), list->size(), 0) != 0 ? errno : 0;
}

/// Gives a new file the owner, the group and the permissions of the one that it replaces. Where the owner or
/// the group can't be had, what runs a file as them goes too. 0, or the number of the error.
int takeOver(int descriptor, std::optional<struct stat> const& replaced, fs::path const& file) {
    if (!replaced) {
        return ::fchmod(descriptor, permissionsOfNewFiles(directoryOf(file))) != 0 ? errno : 0;
    }
    takeOverAttributes(descriptor, file.c_str());
    // Each for itself: a group of one's own can be given where the owner can't.
    bool const hasGroup = ::fchown(descriptor, static_cast<uid_t>(-1), replaced->st_gid) == 0;
    bool const hasOwner = ::fchown(descriptor, replaced->st_uid, static_cast<gid_t>(-1)) == 0;
    auto const kept = ~static_cast<mode_t>((hasOwner ? 0 : S_ISUID) | (hasGroup ? 0 : S_ISGID));
    return takeOverAccess(descriptor, replaced->st_mode & 07777 & kept, file.c_str());
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

} // namespace

SafeOutputFile::SafeOutputFile(std::string const& target) : _name(target) {
    try {
        fs::path const real = followLinks(target);
        std::optional<struct stat> const replaced = replacedFile(real, _name);
        _target = real.string();
        // Not made of the target's name, which may be as long as a name can be.
        _temporary = (directoryOf(real) / ".lumenkey-XXXXXX").string();
        _descriptor = _temporaryName.makeFile(_temporary);
        if (_descriptor < 0) {
            _temporary.clear();
            fail(errno);
        }
        if (int const error = takeOver(_descriptor, replaced, real)) {
            fail(error);
        }
    } catch (std::system_error const& error) {
        fail(error.code().value());
    } catch (...) { // without memory, when the temporary may be there
        discard();
        throw;
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
    forgetTemporary();
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
        forgetTemporary();
    }
}

void SafeOutputFile::forgetTemporary() noexcept {
    _temporary.clear();
    _temporaryName = {};
}

} // namespace lumenkey::tools
