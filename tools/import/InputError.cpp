#include "tools/import/InputError.h"

#include "tools/output/TextForms.h"

namespace lumenkey::tools {

std::string InputError::text() const {
    return printableText(file) + ":" + std::to_string(line) + ":" + std::to_string(column) + ": " +
           printableText(what);
}

} // namespace lumenkey::tools
