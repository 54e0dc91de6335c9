#pragma once

// Small documents for the tests of the program.

#include <string>

namespace lumenkey::tools::samples {

/// A folder, a percentage, a number, a progress and a point are the classes 1 to 5. The body begins in line 3.
inline std::string documentOf(std::string const& body, std::string const& version = "5.13") {
    return "<kfml version=\"" + version +
           "\">\n<factory id=\"1\" uuid=\"E7BF3809-2290-11D7-98E5-00039389B702\"/>"
           "<factory id=\"2\" uuid=\"27F3EE8B-2292-11D7-925A-00039389B702\"/>"
           "<factory id=\"3\" uuid=\"FDC1944B-2291-11D7-B1C3-00039389B702\"/>"
           "<factory id=\"4\" uuid=\"9DE2E4A6-6865-4D59-B31D-BEF26E4AFFAB\"/>"
           "<factory id=\"5\" uuid=\"5FDD789A-8EB4-4217-AB8A-8774AE4F08E9\"/>\n" +
           body + "</kfml>";
}

} // namespace lumenkey::tools::samples
