// Where every program of tests starts. With LUMENKEY_TEST_LOCALE set the tests run under the locale of the
// environment, which must have a decimal comma: text that goes in or out of the library may not notice it.

#include <clocale>
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <locale>
#include <stdexcept>

#include <gtest/gtest.h>

namespace {

bool useLocaleWithDecimalComma() {
    if (std::setlocale(LC_ALL, "") == nullptr) {
        return false;
    }
    try {
        std::locale::global(std::locale(""));
    } catch (std::runtime_error const&) {
        return false;
    }
    return std::strcmp(std::localeconv()->decimal_point, ",") == 0;
}

} // namespace

int main(int argc, char** argv) {
    ::testing::InitGoogleTest(&argc, argv);
    if (std::getenv("LUMENKEY_TEST_LOCALE") != nullptr && !useLocaleWithDecimalComma()) {
        std::cerr
            << "LUMENKEY_TEST_LOCALE is set, but the environment gives no locale with a decimal comma\n";
        return EXIT_FAILURE;
    }
    return RUN_ALL_TESTS();
}
