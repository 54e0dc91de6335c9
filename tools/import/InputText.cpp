#include "tools/import/InputText.h"

#include "tools/import/DocumentFile.h"
#include "tools/import/InputError.h"
#include "tools/import/MotionScanner.h"
#include "tools/output/TextForms.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace lumenkey::tools {

namespace {

constexpr std::string_view kByteOrderMark = "\xEF\xBB\xBF";

class OpenFile {
public:
    explicit OpenFile(std::string const& file)
        : _file(file), _descriptor(::open(file.c_str(), O_RDONLY | O_CLOEXEC)) {
        if (_descriptor < 0) {
            failBecauseOf(errno);
        }
    }
    ~OpenFile() {
        if (_descriptor >= 0) {
            ::close(_descriptor);
        }
    }
    OpenFile(OpenFile const&) = delete;
    OpenFile& operator=(OpenFile const&) = delete;

    std::string readAll() {
        struct stat status {};
        if (::fstat(_descriptor, &status) != 0) {
            failBecauseOf(errno);
        }
        if (S_ISDIR(status.st_mode)) {
            failBecauseOf(EISDIR);
        }
        std::string text;
        std::size_t const expected = S_ISREG(status.st_mode) ? static_cast<std::size_t>(status.st_size) : 0;
        checkSize(expected);
        // One byte more, so that a read at the end tells that nothing follows without another growth.
        text.resize(expected + 1);
        std::size_t filled = 0;
        while (std::size_t const count = readSome(text.data() + filled, text.size() - filled)) {
            // Else a zero byte ends it all; what comes from a device may never end otherwise.
            bool const mayGoOn = std::memchr(text.data() + filled, 0, count) == nullptr ||
                                 looksLikeDocument(std::string_view(text.data(), filled + count));
            filled += count;
            checkSize(filled);
            if (!mayGoOn) {
                break;
            }
            if (filled == text.size()) {
                text.resize(filled + std::max<std::size_t>(filled / 2, 65'536));
            }
        }
        text.resize(filled);
        return text;
    }

private:
    std::size_t readSome(char* target, std::size_t room) {
        ssize_t count = 0;
        do {
            count = ::read(_descriptor, target, room);
        } while (count < 0 && errno == EINTR);
        if (count < 0) {
            failBecauseOf(errno);
        }
        return static_cast<std::size_t>(count);
    }

    void checkSize(std::size_t size) const {
        if (size > kLargestInput) {
            throw InputError{_file, 1, 1, "the file is larger than 2 GiB"};
        }
    }

    [[noreturn]] void failBecauseOf(int error) const {
        throw InputError{_file, 1, 1, systemErrorText(error)};
    }

    std::string const& _file;
    int _descriptor;
};

} // namespace

std::string readInputText(std::string const& file) { return OpenFile(file).readAll(); }

std::string_view checkedInputText(std::string_view text, std::string const& file) {
    if (text.starts_with(kByteOrderMark)) {
        text.remove_prefix(kByteOrderMark.size());
    }
    MotionScanner const scanner(text, file);
    std::size_t const zero = text.find('\0');
    if (zero != std::string_view::npos) {
        scanner.fail(zero, "a zero byte: this is no text");
    }
    if (text.empty()) {
        scanner.fail(0, "the file is empty");
    }
    return text;
}

} // namespace lumenkey::tools
