#include "tools/import/MotionFile.h"

#include "tools/import/MotionReaders.h"

namespace lumenkey::tools {

Motion readMotionText(std::string_view text, std::string const& file, ReadingProgress const& progress) {
    text = checkedInputText(text, file);
    MotionScanner scanner(text, file);
    Motion motion;
    motion.file = file;
    readMotionHierarchy(scanner, motion);
    readMotionFrames(scanner, motion, progress);
    return motion;
}

Motion readMotionFile(std::string const& file, ReadingProgress const& progress) {
    return readMotionText(readInputText(file), file, progress);
}

} // namespace lumenkey::tools
