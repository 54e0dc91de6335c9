#include "lumenkey/foundation/BXBlockWriter.h"

void BXBlockWriter::flush() {
    give(_block.get(), _used);
    _used = 0;
}

void BXBlockWriter::appendLong(std::string_view text) {
    flush();
    if (text.size() >= kBlock) {
        give(text.data(), text.size());
    } else {
        append(text);
    }
}

void BXBlockWriter::give(char const* bytes, std::size_t size) {
    if (_isGood && size != 0) {
        _isGood = _sink.write(bytes, size);
    }
}
