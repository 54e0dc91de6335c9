#include "lumenkey/foundation/BXXMLReadStream.h"

#include "lumenkey/foundation/BXByteSource.h"
#include "lumenkey/foundation/BXDocumentReader.h"
#include "lumenkey/foundation/BXParserBlock.h"

#include <algorithm>
#include <exception>
#include <new>
#include <optional>
#include <string_view>
#include <utility>

#include <expat.h>

namespace {

constexpr std::uint64_t kUsualSizeLimit = std::uint64_t{4} << 30;

struct FreeParser {
    void operator()(XML_Parser parser) const noexcept { XML_ParserFree(parser); }
};
using Parser = std::unique_ptr<XML_ParserStruct, FreeParser>;

} // namespace

class BXXMLReadStream::Reading {
public:
    Reading(BXSerializerReadStream& stream, std::unique_ptr<BXByteSource> source)
        : reader(stream), _source(std::move(source)) {}

    bool parse();

    BXDocumentReader reader;
    std::uint64_t sizeLimit = kUsualSizeLimit;
    std::function<void(std::uint64_t)> progress;
    std::optional<BXReadFailure> failure;

private:
    enum class State { Fresh, Parsing, Done };

    void run();
    bool feed(std::uint64_t* size, bool* isLast);
    void failHere(std::string reason);
    void failByParser();

    /// Does what a callback is for, and stops the parser if that gives a problem, which is noted at once: a
    /// stopped parser has already gone on. Nothing may be thrown through the parser, which is written in C.
    template <typename Call> void guarded(Call const& call) noexcept {
        try {
            call();
            if (!reader.problem().empty() && !failure) {
                stop(reader.problem());
            }
        } catch (...) {
            _thrown = std::current_exception();
            XML_StopParser(_parser.get(), XML_FALSE);
        }
    }

    void stop(std::string reason) {
        failHere(std::move(reason));
        XML_StopParser(_parser.get(), XML_FALSE);
    }

    static void onStart(void* self, XML_Char const* name, XML_Char const** attributes) {
        auto& reading = *static_cast<Reading*>(self);
        reading.guarded([&] { reading.reader.start(name, attributes); });
    }
    static void onEnd(void* self, XML_Char const*) {
        auto& reading = *static_cast<Reading*>(self);
        reading.guarded([&] { reading.reader.end(); });
    }
    static void onText(void* self, XML_Char const* text, int size) {
        auto& reading = *static_cast<Reading*>(self);
        reading.guarded([&] { reading.reader.text(std::string_view(text, static_cast<std::size_t>(size))); });
    }
    static void onDocumentType(void* self, XML_Char const*, XML_Char const*, XML_Char const*, int) {
        auto& reading = *static_cast<Reading*>(self);
        reading.guarded([&] { reading.stop("a document type declaration is not allowed"); });
    }

    std::unique_ptr<BXByteSource> _source;
    Parser _parser;
    std::uint64_t _fed = 0;
    bool _hasMark = false;
    std::exception_ptr _thrown;
    State _state = State::Fresh;
};

bool BXXMLReadStream::Reading::parse() {
    if (_state != State::Fresh) {
        return _state == State::Done && !failure;
    }
    _state = State::Parsing;
    run();
    if (!_thrown) {
        reader.finish();
        if (!failure && !reader.problem().empty()) {
            failHere(reader.problem());
        }
    }
    _parser.reset();
    _state = State::Done;
    if (_thrown) {
        failure = BXReadFailure{0, 0, "a handler threw"};
        std::rethrow_exception(std::exchange(_thrown, nullptr));
    }
    return !failure;
}

void BXXMLReadStream::Reading::run() {
    if (!reader.problem().empty()) {
        failure = BXReadFailure{0, 0, reader.problem()};
        return;
    }
    if (std::string reason = _source->open(); !reason.empty()) {
        failure = BXReadFailure{0, 0, std::move(reason)};
        return;
    }
    _parser.reset(XML_ParserCreate(nullptr));
    if (!_parser) {
        throw std::bad_alloc();
    }
    XML_SetUserData(_parser.get(), this);
    XML_SetElementHandler(_parser.get(), onStart, onEnd);
    XML_SetCharacterDataHandler(_parser.get(), onText);
    XML_SetStartDoctypeDeclHandler(_parser.get(), onDocumentType);

    std::uint64_t block = kFirstParserBlock;
    bool isLast = false;
    while (!isLast && feed(&block, &isLast)) {
        block = BXNextParserBlock(_fed, XML_GetCurrentByteIndex(_parser.get()));
        if (block == 0) {
            failHere(BXTokenTooLong());
            return;
        }
    }
}

/// Gives the parser the next block of a size. False at a failure, which it notes.
bool BXXMLReadStream::Reading::feed(std::uint64_t* size, bool* isLast) {
    void* const room = XML_GetBuffer(_parser.get(), static_cast<int>(*size));
    if (room == nullptr) {
        failByParser();
        return false;
    }
    std::optional<std::size_t> const got = _source->read(room, static_cast<std::size_t>(*size));
    if (!got) {
        failure = BXReadFailure{0, 0, _source->problem()};
        return false;
    }
    if (*got > sizeLimit - std::min(_fed, sizeLimit)) {
        failHere("the document is larger than " + std::to_string(sizeLimit) + " bytes");
        return false;
    }
    if (_fed == 0) {
        _hasMark = BXStartsWithMark({static_cast<char const*>(room), *got});
    }
    _fed += *got;
    *isLast = *got < *size;
    if (XML_ParseBuffer(_parser.get(), static_cast<int>(*got), *isLast) != XML_STATUS_OK) {
        failByParser();
        return false;
    }
    if (progress) {
        progress(_fed);
    }
    return true;
}

void BXXMLReadStream::Reading::failHere(std::string reason) {
    failure = BXReadFailure{0, 0, std::move(reason)};
    if (_parser) {
        failure->line = XML_GetCurrentLineNumber(_parser.get());
        failure->column = BXParserColumn(failure->line, XML_GetCurrentColumnNumber(_parser.get()), _hasMark);
    }
}

void BXXMLReadStream::Reading::failByParser() {
    if (!failure && !_thrown) {
        failHere(XML_ErrorString(XML_GetErrorCode(_parser.get())));
    }
}

BXXMLReadStream::BXXMLReadStream(BXData const& data)
    : BXXMLReadStream(std::span<std::uint8_t const>(data.data(), data.size())) {}
BXXMLReadStream::BXXMLReadStream(std::span<std::uint8_t const> bytes)
    : _reading(std::make_unique<Reading>(*this, std::make_unique<BXMemorySource>(bytes))) {}
BXXMLReadStream::BXXMLReadStream(BXURL const& url)
    : _reading(std::make_unique<Reading>(*this, std::make_unique<BXFileSource>(url.path().str()))) {}
BXXMLReadStream::~BXXMLReadStream() = default;

void BXXMLReadStream::setSizeLimit(std::uint64_t bytes) { _reading->sizeLimit = bytes; }
void BXXMLReadStream::setProgress(std::function<void(std::uint64_t)> progress) {
    _reading->progress = std::move(progress);
}
bool BXXMLReadStream::parse() { return _reading->parse(); }
BXReadFailure const* BXXMLReadStream::failure() const {
    return _reading->failure ? &*_reading->failure : nullptr;
}

void BXXMLReadStream::pushScope(BXScope const* scope) { _reading->reader.pushScope(scope); }
void BXXMLReadStream::pushHandler(BXSerializer* handler) { _reading->reader.pushHandler(handler); }
void BXXMLReadStream::skipElement() { _reading->reader.skipElement(); }
bool BXXMLReadStream::allowsNode() { return _reading->reader.allowsNode(); }
