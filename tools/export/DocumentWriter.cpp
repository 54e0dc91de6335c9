#include "tools/export/DocumentWriter.h"

#include "lumenkey/Channels/KFFactories.h"
#include "lumenkey/foundation/BXStream.h"
#include "lumenkey/foundation/BXXMLWriteStream.h"

#include <exception>

namespace lumenkey::tools {

namespace {

/// Hands the library's text on. Nothing may be thrown through the library: it is kept until the library has
/// returned.
class SinkStream : public BXStream {
public:
    explicit SinkStream(OutputSink& sink) : _sink(sink) {}

    bool write(void const* bytes, std::size_t size) override {
        if (_thrown) {
            return false;
        }
        try {
            _sink.write({static_cast<char const*>(bytes), size});
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
    OutputSink& _sink;
    std::exception_ptr _thrown;
};

} // namespace

void writeDocument(KFChannelBase& top, OutputSink& out) {
    SinkStream sink(out);
    BXXMLWriteStream stream(sink, kWrittenMajor, kWrittenMinor);
    top.markFactoriesForSerialization(stream, false);
    KFFactories::getInstance().saveFactories(stream);
    top.writeHeader(stream, true);
    top.writeBody(stream, true, true, true);
    stream.endElement();
    bool const isWhole = stream.close();
    sink.rethrow();
    if (!isWhole) {
        throw OutputError{"the document", "something in it has no form as text"};
    }
}

} // namespace lumenkey::tools
