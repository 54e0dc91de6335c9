#include "tools/export/DocumentWriter.h"

#include "lumenkey/Channels/KFFactories.h"
#include "lumenkey/foundation/BXStream.h"
#include "lumenkey/foundation/BXXMLWriteStream.h"
#include "lumenkey/persistence/KFCompoundMarks.h"

#include <exception>
#include <string_view>

namespace lumenkey::tools {

namespace {

std::size_t countOf(std::string_view word, std::string_view text) {
    std::size_t count = 0;
    for (std::size_t at = 0; (at = text.find(word, at)) != std::string_view::npos; at += word.size()) {
        ++count;
    }
    return count;
}

/// Hands the library's text on. Nothing may be thrown through the library: it is kept until the library has
/// returned.
class SinkStream : public BXStream {
public:
    SinkStream(OutputSink& sink, std::size_t count, ReadingProgress const& progress)
        : _sink(sink), _count(count), _progress(progress) {}

    bool write(void const* bytes, std::size_t size) override {
        if (_thrown) {
            return false;
        }
        try {
            std::string_view const text(static_cast<char const*>(bytes), size);
            _sink.write(text);
            tellProgress(text);
        } catch (...) {
            _thrown = std::current_exception();
        }
        return !_thrown;
    }

    void rethrow() const {
        if (_thrown) {
            std::rethrow_exception(_thrown);
        }
    }

private:
    /// One that is cut by the end of a block isn't counted: a bar has forty places.
    void tellProgress(std::string_view text) {
        if (_progress && _count > 0) {
            _written += countOf("<keypoint", text) + countOf("<parameter", text);
            _progress(static_cast<double>(_written) / static_cast<double>(_count));
        }
    }

    OutputSink& _sink;
    std::size_t _count;
    std::size_t _written = 0;
    ReadingProgress const& _progress;
    std::exception_ptr _thrown;
};

} // namespace

void writeDocument(KFChannelBase& top, OutputSink& out, std::size_t count, ReadingProgress const& progress) {
    SinkStream sink(out, count, progress);
    BXXMLWriteStream stream(sink, kWrittenMajor, kWrittenMinor);
    top.markFactoriesForSerialization(stream, false);
    KFCompoundMarks(stream).markBelow(top);
    KFFactories::getInstance().saveFactories(stream);
    top.writeHeader(stream, true);
    top.writeBody(stream, true, true, true);
    stream.endElement();
    bool const isWhole = stream.close();
    sink.rethrow();
    if (!isWhole) {
        throw OutputError{"the document", stream.failure()};
    }
}

} // namespace lumenkey::tools
