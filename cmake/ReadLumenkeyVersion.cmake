# Sets LUMENKEY_VERSION (MAJOR.MINOR.PATCH) and LUMENKEY_ABI_VERSION from the macros of lumenkey/version.h,
# the one place where they stand. A change of that file configures the build anew.
function(read_lumenkey_version header)
    file(READ "${header}" text)
    foreach(part IN ITEMS VERSION_MAJOR VERSION_MINOR VERSION_PATCH ABI_VERSION)
        if(NOT text MATCHES "#define LUMENKEY_${part} ([0-9]+)\n")
            message(FATAL_ERROR "${header}: no line '#define LUMENKEY_${part} NUMBER'")
        endif()
        set(${part} "${CMAKE_MATCH_1}")
    endforeach()
    set(LUMENKEY_VERSION "${VERSION_MAJOR}.${VERSION_MINOR}.${VERSION_PATCH}" PARENT_SCOPE)
    set(LUMENKEY_ABI_VERSION "${ABI_VERSION}" PARENT_SCOPE)
    set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS "${header}")
endfunction()
