# The version stands in one place, the exported header: NIB_VERSION_TEXT.
file(STRINGS ${CMAKE_CURRENT_LIST_DIR}/../include/nib/version.h lines
    REGEX "^#define NIB_VERSION_(MAJOR|MINOR|PATCH) [0-9]+")
set(NIB_VERSION_TEXT)
foreach(line IN LISTS lines)
    string(REGEX REPLACE "^#define [A-Z_]+ ([0-9]+).*" "\\1" number "${line}")
    list(APPEND NIB_VERSION_TEXT ${number})
endforeach()
list(JOIN NIB_VERSION_TEXT "." NIB_VERSION_TEXT)
if(NOT NIB_VERSION_TEXT MATCHES "^[0-9]+\\.[0-9]+\\.[0-9]+$")
    message(FATAL_ERROR "include/nib/version.h does not tell the version: '${NIB_VERSION_TEXT}'")
endif()
