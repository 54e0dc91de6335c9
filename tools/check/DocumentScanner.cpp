#include "tools/check/DocumentScanner.h"

#include "lumenkey/foundation/BXDocumentDepth.h"
#include "lumenkey/foundation/BXParserBlock.h"
#include "tools/import/InputError.h"
#include "tools/output/TextForms.h"

#include <cerrno>
#include <cstdio>
#include <exception>
#include <expat.h>
#include <filesystem>
#include <memory>
#include <new>

namespace lumenkey::tools {

/// One scan, as its parser calls it.
class DocumentScanner::Run {
public:
    explicit Run(DocumentScanner& scanner)
        : _scanner(scanner), _parser(XML_ParserCreate(nullptr), &XML_ParserFree) {
        if (!_parser) {
            throw std::bad_alloc();
        }
        XML_SetUserData(_parser.get(), this);
        XML_SetElementHandler(
            _parser.get(),
            [](void* self, char const* name, char const** pairs) {
                guard(self, [&](Run& run) { run.start(name, pairs); });
            },
            [](void* self, char const*) { guard(self, [](Run& run) { run.end(); }); });
        XML_SetCharacterDataHandler(_parser.get(), [](void* self, char const* text, int size) {
            guard(self, [&](Run& run) {
                run._scanner.text(run.place(), {text, static_cast<std::size_t>(size)});
            });
        });
        XML_SetStartDoctypeDeclHandler(
            _parser.get(), [](void* self, char const*, char const*, char const*, int) {
                guard(self, [](Run& run) {
                    run._scanner.fault(run.place(), "a document type declaration, which is refused");
                    run.stop();
                });
            });
    }

    void run(std::string const& file, ReadingProgress const& progress) {
        std::unique_ptr<std::FILE, int (*)(std::FILE*)> const stream(std::fopen(file.c_str(), "rbe"),
                                                                     &std::fclose);
        if (!stream) {
            throw InputError{file, 1, 1, systemErrorText(errno)};
        }
        std::error_code unknown;
        auto const size = static_cast<double>(std::filesystem::file_size(file, unknown));
        for (bool isLast = false; !isLast && !_isStopped;) {
            feedBlock(*stream, file, &isLast);
            if (progress && !unknown) {
                progress(static_cast<double>(_fed) / size);
            }
        }
        rethrow();
    }

    void runText(std::string_view text, ReadingProgress const& progress) {
        auto const size = static_cast<double>(text.size());
        for (bool isLast = false; !isLast && !_isStopped;) {
            std::string_view const part = text.substr(0, _block);
            text.remove_prefix(part.size());
            isLast = text.empty();
            lookForMark(part);
            endBlock(XML_Parse(_parser.get(), part.data(), static_cast<int>(part.size()), isLast),
                     part.size());
            if (progress) {
                progress(1 - static_cast<double>(text.size()) / size);
            }
        }
        rethrow();
    }

private:
    void rethrow() const {
        if (_thrown) {
            std::rethrow_exception(_thrown);
        }
    }

    /// Of as many bytes.
    void endBlock(XML_Status status, std::size_t size) {
        if (_isStopped) {
            return;
        }
        _fed += size;
        _block = BXNextParserBlock(_fed, XML_GetCurrentByteIndex(_parser.get()));
        if (status != XML_STATUS_OK || _block == 0) {
            _isStopped = true;
            _scanner.fault(place(), status != XML_STATUS_OK ? XML_ErrorString(XML_GetErrorCode(_parser.get()))
                                                            : BXTokenTooLong());
        }
    }

    /// Nothing may be thrown through the parser, which is written in C.
    template <class Work> static void guard(void* self, Work const& work) {
        auto& run = *static_cast<Run*>(self);
        if (run._isStopped) {
            return;
        }
        try {
            work(run);
        } catch (...) {
            run._thrown = std::current_exception();
            run.stop();
        }
    }

    void stop() {
        _isStopped = true;
        XML_StopParser(_parser.get(), XML_FALSE);
    }

    TextPlace place() const {
        std::uint64_t const line = XML_GetCurrentLineNumber(_parser.get());
        return {line, BXParserColumn(line, XML_GetCurrentColumnNumber(_parser.get()), _hasMark)};
    }

    void start(char const* name, char const** pairs) {
        bool const isTooDeep = ++_depth > kGreatestDepth;
        if (isTooDeep || BXHasTooManyAttributes(pairs)) {
            _scanner.fault(place(), isTooDeep ? BXTooDeepText() : BXTooManyAttributesText());
            stop();
            return;
        }
        Attributes attributes;
        for (char const** pair = pairs; *pair != nullptr; pair += 2) {
            attributes.emplace(pair[0], pair[1]);
        }
        _scanner.start(place(), name, attributes);
    }

    void end() {
        --_depth;
        _scanner.end();
    }

    void feedBlock(std::FILE& stream, std::string const& file, bool* isLast) {
        void* const room = XML_GetBuffer(_parser.get(), static_cast<int>(_block));
        if (room == nullptr) {
            throw std::bad_alloc();
        }
        std::size_t const got = std::fread(room, 1, _block, &stream);
        if (std::ferror(&stream) != 0) {
            throw InputError{file, 1, 1, systemErrorText(errno)};
        }
        *isLast = got < _block;
        lookForMark({static_cast<char const*>(room), got});
        endBlock(XML_ParseBuffer(_parser.get(), static_cast<int>(got), *isLast), got);
    }

    void lookForMark(std::string_view block) { _hasMark = _fed == 0 ? BXStartsWithMark(block) : _hasMark; }

    DocumentScanner& _scanner;
    std::unique_ptr<XML_ParserStruct, void (*)(XML_Parser)> _parser;
    std::uint64_t _block = kFirstParserBlock;
    std::uint64_t _fed = 0;
    bool _hasMark = false;
    std::size_t _depth = 0;
    bool _isStopped = false;
    std::exception_ptr _thrown;
};

void DocumentScanner::scan(std::string const& file, ReadingProgress const& progress) {
    Run(*this).run(file, progress);
}

void DocumentScanner::scanText(std::string_view text, ReadingProgress const& progress) {
    Run(*this).runText(text, progress);
}

std::string_view attributeOf(Attributes const& attributes, std::string_view name) {
    auto const found = attributes.find(name);
    return found == attributes.end() ? std::string_view() : found->second;
}

} // namespace lumenkey::tools
