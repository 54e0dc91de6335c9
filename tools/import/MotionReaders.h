#pragma once

// The two halves of `readMotionText`; for it only.

#include "tools/import/MotionFile.h"
#include "tools/import/MotionScanner.h"

namespace lumenkey::tools {

/// Reads from HIERARCHY through the word MOTION.
void readMotionHierarchy(MotionScanner& scanner, Motion& motion);

/// Reads the rest of the file.
void readMotionFrames(MotionScanner& scanner, Motion& motion, ReadingProgress const& progress);

} // namespace lumenkey::tools
