#include "tools/import/MotionReaders.h"

#include "tools/import/MotionTime.h"
#include "tools/output/TextForms.h"

#include <algorithm>
#include <charconv>
#include <limits>

namespace lumenkey::tools {

namespace {

class FramesReader {
public:
    FramesReader(MotionScanner& scanner, Motion& motion, ReadingProgress const& progress)
        : _scanner(scanner), _motion(motion), _progress(progress) {}

    void read() {
        readFrameCount();
        checkFrameCount();
        readFrameTime();
        _motion.values.reserve(_motion.frameCount * _motion.channels.size());
        for (_frame = 0; _frame < _motion.frameCount && !_motion.channels.empty(); ++_frame) {
            readFrame();
            if (_progress && _frame % 64 == 0) {
                _progress(static_cast<double>(_scanner.position()) / static_cast<double>(_scanner.size()));
            }
        }
        _scanner.skipSpace();
        if (!_scanner.atEnd()) {
            _scanner.fail(_scanner.position(), "more stands here, after the last of " +
                                                   std::to_string(_motion.frameCount) + " frames");
        }
        if (!_endsWithLineEnd) {
            _scanner.fail(_scanner.position(), "the last line has no end: the file may be cut off");
        }
    }

private:
    void readFrameCount() {
        _scanner.expectLabel("Frames");
        std::string_view const text = _scanner.field();
        _countPosition = _scanner.tokenPosition();
        auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), _motion.frameCount);
        if (error == std::errc::result_out_of_range) {
            failForCount();
        }
        if (error != std::errc{} || end != text.data() + text.size()) {
            _scanner.failAtToken(text.empty() ? "the count of frames is missing"
                                              : quoted(text) + " is not a count of frames");
        }
        endLine("the count of frames");
    }

    void readFrameTime() {
        _scanner.expectLabel("Frame Time");
        _motion.frameTimeText = _scanner.field();
        std::size_t const position = _scanner.tokenPosition();
        if (_motion.frameTimeText.empty()) {
            _scanner.failAtToken("the time of a frame is missing");
        }
        endLine("the time of a frame");
        FrameDuration const frame = frameDurationFromText(_motion.frameTimeText);
        if (!frame.fault.empty()) {
            _scanner.fail(position, frame.fault);
        }
        _motion.frameDuration = frame.duration;
        int64_t const mostFrames = std::numeric_limits<int64_t>::max() / frame.duration.value;
        if (_motion.frameCount > static_cast<std::size_t>(mostFrames)) {
            _scanner.fail(position, "frames this long and many go beyond exact time");
        }
    }

    /// Nothing but the line end may follow.
    void endLine(std::string const& what) {
        _scanner.skipBlanks();
        if (_scanner.atEnd()) {
            _scanner.fail(_scanner.position(), "the file ends after " + what);
        }
        if (_scanner.rest().front() != '\n') {
            _scanner.fail(_scanner.position(), "more stands here, after " + what);
        }
        _scanner.skipSpace();
        _endsWithLineEnd = true;
    }

    /// A number takes at least one byte and one behind it, so the text tells how many frames it can hold: no
    /// memory is asked for on the word of a count alone.
    void checkFrameCount() {
        std::size_t const bytesOfFrame = std::max<std::size_t>(2 * _motion.channels.size(), 1);
        if (_motion.frameCount > _scanner.size() / bytesOfFrame) {
            failForCount();
        }
    }

    [[noreturn]] void failForCount() {
        _scanner.fail(_countPosition, "the file is too short for that many frames");
    }

    void readFrame() {
        _scanner.skipSpace();
        if (_scanner.atEnd()) {
            _scanner.fail(_scanner.position(), "the file ends after " + std::to_string(_frame) + " of " +
                                                   std::to_string(_motion.frameCount) + " frames");
        }
        std::size_t const wanted = _motion.channels.size();
        for (std::size_t i = 0; i < wanted; ++i) {
            _scanner.skipBlanks();
            if (_scanner.atEnd() || _scanner.rest().front() == '\n') {
                failForWidth(std::to_string(i), "are there");
            }
            _motion.values.push_back(_scanner.number());
        }
        _scanner.skipBlanks();
        _endsWithLineEnd = !_scanner.atEnd();
        if (_endsWithLineEnd && _scanner.rest().front() != '\n') {
            failForWidth("more", "stand here");
        }
    }

    [[noreturn]] void failForWidth(std::string const& count, std::string const& verb) {
        _scanner.fail(_scanner.position(), "frame " + std::to_string(_frame) + " has " +
                                               std::to_string(_motion.channels.size()) + " numbers, but " +
                                               count + " " + verb);
    }

    MotionScanner& _scanner;
    Motion& _motion;
    ReadingProgress const& _progress;
    std::size_t _frame = 0;
    std::size_t _countPosition = 0;
    bool _endsWithLineEnd = false;
};

} // namespace

void readMotionFrames(MotionScanner& scanner, Motion& motion, ReadingProgress const& progress) {
    FramesReader(scanner, motion, progress).read();
}

} // namespace lumenkey::tools
