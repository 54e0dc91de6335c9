// Internal: not installed.
#pragma once

#include "lumenkey/foundation/BXSerializerStreams.h"

// Handles in documents. A document holds a handle, which is `scale` times the tangent that a keypoint stores,
// yet a product rounded to a double doesn't always give the tangent back when it is divided again. Where it
// doesn't, the document gets more digits than a double has, and so what was written reads back to the same
// tangent, bit for bit. For other readers it is a number like others.

/// An element with the handle of `tangent`; the tangent itself into a digest, which is to tell all of them
/// apart.
void KFWriteHandle(BXSerializerWriteStream& stream, std::uint32_t tag, double tangent, double scale);

/// The tangent of the handle that an element holds. False, and `*tangent` as it was, if that is no number.
bool KFReadHandle(BXStreamElement const& element, double scale, double* tangent);
