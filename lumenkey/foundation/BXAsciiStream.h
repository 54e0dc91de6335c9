#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXStream.h"
#include "lumenkey/foundation/BXString.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

/// Bytes as text of letters, digits, "+", "/" and "=" (Base64, RFC 4648), for what documents hold as text,
/// and back.
///
///     BXAsciiStream out;                       BXAsciiStream in;
///     out.write(bytes, size);                  if (in.open(text)) {
///     out.close();                                 size = in.read(bytes, text.size());
///     text = out.getString();                      in.close();
///                                              }
///
/// Four characters stand for three bytes, so the bytes are never more than the characters. One object belongs
/// to one thread at a time, and does one of the two at a time.
class LUMENKEY_API BXAsciiStream final : public BXStream {
public:
    /// Adds bytes to the text. False, with nothing added, once it is closed and while a text is open, and for
    /// want of memory.
    bool write(void const* bytes, std::size_t size) override;
    /// The text of all that was written, whole once the stream is closed.
    BXString getString() const;

    /// Begins to read a text; what was written before is gone. False, with nothing to read, for a text that
    /// no writer gives. White space doesn't count.
    bool open(BXString const& text);
    /// How many of the next bytes were written at `out`: fewer than `size` only at the end.
    std::size_t read(void* out, std::size_t size);

    /// Ends the text that is being written, or the reading of one. Further calls do nothing.
    void close();

private:
    enum class State { Writing, Written, Reading };

    void append(std::uint8_t const* bytes, std::size_t count);
    bool decode(std::string_view text);

    State _state = State::Writing;
    std::string _text;
    /// Bytes that don't make a group yet.
    std::uint8_t _rest[3] = {};
    std::size_t _restSize = 0;
    BXData _bytes;
    std::size_t _position = 0;
};
