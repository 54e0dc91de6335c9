#pragma once

// For the readers of files only.

#include "tools/import/InputError.h"

#include <cstddef>
#include <string>
#include <string_view>

namespace lumenkey::tools {

/// A place in the text of an input file, and what can be read there. Only errors count lines, so reading is
/// quick.
class MotionScanner {
public:
    /// Both are kept by reference and outlive the scanner.
    MotionScanner(std::string_view text, std::string const& file) : _text(text), _file(file) {}

    std::size_t position() const { return _position; }
    std::size_t size() const { return _text.size(); }
    bool atEnd() const { return _position >= _text.size(); }
    std::string_view rest() const { return _text.substr(_position); }

    /// Spaces, tabs and carriage returns.
    void skipBlanks();
    /// These and line ends.
    void skipSpace();

    /// The next word within the line or on later ones; a brace is a word of its own. Empty at the end of the
    /// text.
    std::string_view word();
    /// The same, without moving on.
    std::string_view peekWord();
    /// The rest of the line up to a brace, without the space around it.
    std::string_view restOfLine();
    /// Everything up to the next blank or line end; empty at a line end.
    std::string_view field();

    /// Reads the next field, or the next word, as a finite number; fails for anything else.
    double number() { return numberFromToken(field()); }
    double numberBeforeBrace() { return numberFromToken(word()); }
    /// All of `text` as a finite number; fails at its `position` for anything else.
    double numberFrom(std::string_view text, std::size_t position) const;

    /// Both fail unless it comes next. Letters are compared without case.
    void expectWord(std::string_view expected);
    /// The label of a line, such as `Frames:`; blanks may stand before the colon.
    void expectLabel(std::string_view label);

    [[noreturn]] void fail(std::size_t position, std::string const& what) const;
    /// At the start of the last word, field or number read.
    [[noreturn]] void failAtToken(std::string const& what) const { fail(_token, what); }
    /// The place where the last word, field or number starts.
    std::size_t tokenPosition() const { return _token; }
    unsigned lineAt(std::size_t position) const;

private:
    std::string_view take(std::size_t end);
    double numberFromToken(std::string_view text) const { return numberFrom(text, _token); }

    std::string_view _text;
    std::string const& _file;
    std::size_t _position = 0;
    std::size_t _token = 0;
};

} // namespace lumenkey::tools
