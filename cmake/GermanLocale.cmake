# Makes a locale with a decimal comma inside the build tree, from the definitions that Debian's
# package locales brings, so that nothing on the machine has to be changed. Tests find it by
# LOCPATH=${GERMAN_LOCALE_PATH} and LC_ALL=de_DE.UTF-8.
find_program(LOCALEDEF localedef REQUIRED)
mark_as_advanced(LOCALEDEF)
if(NOT EXISTS /usr/share/i18n/locales/de_DE)
    message(FATAL_ERROR "The tests need the locale definitions of Debian's package locales (./dev install-deps)")
endif()

set(GERMAN_LOCALE_PATH "${PROJECT_BINARY_DIR}/locale")
add_custom_command(
    OUTPUT "${GERMAN_LOCALE_PATH}/de_DE.UTF-8/LC_NUMERIC"
    COMMAND "${CMAKE_COMMAND}" -E make_directory "${GERMAN_LOCALE_PATH}"
    COMMAND "${LOCALEDEF}" -i de_DE -f UTF-8 "${GERMAN_LOCALE_PATH}/de_DE.UTF-8"
    COMMENT "Making a locale with a decimal comma"
    VERBATIM)
add_custom_target(german_locale DEPENDS "${GERMAN_LOCALE_PATH}/de_DE.UTF-8/LC_NUMERIC")
