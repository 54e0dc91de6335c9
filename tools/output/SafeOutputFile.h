#pragma once

#include "tools/output/OutputSink.h"
#include "tools/output/TemporaryFiles.h"

#include <string>

namespace lumenkey::tools {

/// Replaces a file as a whole or not at all. What is written goes to a temporary beside the target; `close`
/// brings it to the disk and puts it in the target's place by a rename, `discard` and destruction throw it
/// away.
///
/// An existing file gives its permissions to the new one, lists of who may do what and other attributes
/// included, and its owner and group where that is allowed (else without what runs it as them). Whether it
/// may be replaced is its directory's matter, also where it is write-protected itself. A symbolic link stays,
/// and the file it leads to is replaced. A target that is neither missing nor a plain file is refused.
///
/// Failures throw `OutputError`; the target is untouched then, and the temporary gone. Only a failure to
/// bring the renamed entry itself to the disk is told after the replacement. The temporary is a
/// `TemporaryName`, so that a signal doesn't leave it behind either.
class SafeOutputFile : public OutputSink {
public:
    explicit SafeOutputFile(std::string const& target);
    ~SafeOutputFile() override { discard(); }
    SafeOutputFile(SafeOutputFile const&) = delete;
    SafeOutputFile& operator=(SafeOutputFile const&) = delete;

    void write(std::string_view text) override;
    void close();
    void discard() noexcept;

private:
    [[noreturn]] void fail(int error);
    void forgetTemporary() noexcept;

    /// As the caller named it, for messages.
    std::string _name;
    /// Where it is once symbolic links are followed.
    std::string _target;
    std::string _temporary;
    TemporaryName _temporaryName;
    int _descriptor = -1;
};

} // namespace lumenkey::tools
