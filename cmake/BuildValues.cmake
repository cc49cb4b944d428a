# cmake -P: writes HEADER with the values of KpBuildInfo. It is rewritten only if a value other
# than the time differs, so that a build without changes rebuilds nothing. SOURCE_DATE_EPOCH in the
# environment sets the time.

execute_process(COMMAND git rev-parse --verify HEAD WORKING_DIRECTORY ${SOURCE_DIR} OUTPUT_VARIABLE revision
                OUTPUT_STRIP_TRAILING_WHITESPACE ERROR_QUIET RESULT_VARIABLE failed)
if(failed OR NOT EXISTS ${SOURCE_DIR}/.git OR NOT revision MATCHES "^[0-9a-f]+$")
    string(REPEAT "0" 40 revision)
endif()
string(TIMESTAMP time "%Y-%b-%d %H:%M:%S" UTC)
string(REGEX REPLACE "([\\\"])" "\\\\\\1" COMMENTS "${COMMENTS}")
string(REPLACE "." ";" parts ${VERSION})
list(GET parts 0 major)
list(GET parts 1 minor)
list(GET parts 2 patch)

set(text "#pragma once

// Made by the build.

namespace kplib::build {

inline constexpr int major = ${major}, minor = ${minor}, patch = ${patch}, build = ${BUILD_NUMBER};
inline constexpr bool isSnapshot = ${SNAPSHOT};
inline constexpr const char* revision = \"${revision}\";
inline constexpr const char* productName = \"kplib ${major}\";
inline constexpr const char* comments = \"${COMMENTS}\";
inline constexpr const char* copyright = \"Copyright the kplib authors\";
inline constexpr const char* company = \"kplib\";
")
set(timed "${text}inline constexpr const char* time = \"${time}\";

}  // namespace kplib::build
")

set(old "")
if(EXISTS ${HEADER})
    file(READ ${HEADER} old)
endif()
string(FIND "${old}" "${text}" same)
if(same EQUAL -1 OR (DEFINED ENV{SOURCE_DATE_EPOCH} AND NOT old STREQUAL timed))
    file(WRITE ${HEADER} "${timed}")
endif()
