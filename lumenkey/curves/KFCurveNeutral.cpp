// Operations that this curve refuses: it follows no dynamic curve and stores nothing of itself.
// None changes anything, and those with an answer give false.

#include "lumenkey/curves/KFCurve.h"

// --- Documents ---

void KFCurve::writeHeader(BXSerializerWriteStream&, bool) {}
void KFCurve::writeBody(BXSerializerWriteStream&, bool, bool, bool) {}
void KFCurve::markFactoriesForSerialization(BXSerializerWriteStream&, bool) {}
bool KFCurve::parseBegin(BXSerializerReadStream&) { return false; }
bool KFCurve::parseEnd(BXSerializerReadStream&) { return false; }
bool KFCurve::parseElement(BXSerializerReadStream&, BXStreamElement&) { return false; }

// --- Curves of dynamic channels ---

bool KFCurve::generateCurveFromDynamicCurve(Tempus const&, KFDynamicCurve*) { return false; }
