# The system is touched in src/platform only: no other source includes a POSIX or Win32 header.
# Usage: cmake -DSRC=<src folder> -P system_headers.cmake
file(GLOB_RECURSE sources "${SRC}/*.cpp" "${SRC}/*.hpp")
set(found "")
foreach(source IN LISTS sources)
    if(source MATCHES "/src/platform/")
        continue()
    endif()
    file(STRINGS "${source}" hits
        REGEX "^#include <((unistd|fcntl|signal|windows|io|spawn|pthread)\\.h|sys/.*|csignal)>")
    if(hits)
        list(APPEND found "${source}: ${hits}")
    endif()
endforeach()
if(found)
    list(JOIN found "\n" found)
    message(FATAL_ERROR "System headers outside src/platform:\n${found}")
endif()
