#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXSerializer.h"

#include <cstddef>

/// Takes bytes, one after the other.
class LUMENKEY_API BXStream {
public:
    virtual ~BXStream();

    /// Takes all of them, or answers false; then how many were taken is open, and the stream is of no further
    /// use.
    virtual bool write(void const* bytes, std::size_t size) = 0;
};

/// Keeps the bytes in memory. One object belongs to one thread at a time.
class LUMENKEY_API BXBufferWriteStream final : public BXStream {
public:
    /// Bytes to set aside at once, and the least to set aside when those are full; below 0 counts as 0. A
    /// large buffer grows by half of itself, so that n bytes cost O(n) whatever the sizes.
    BXBufferWriteStream(int first, int growth);

    /// False, with nothing taken, where there is no memory for them.
    bool write(void const* bytes, std::size_t size) override;

    std::size_t size() const noexcept { return _data.size(); }
    /// All bytes so far.
    BXData copyData() const { return _data; }
    /// The same without the copy; the stream is empty then.
    BXData takeData() noexcept;

private:
    BXData _data;
    std::size_t _growth;
};
