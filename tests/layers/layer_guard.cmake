# A layer sees its own headers and those below it, never those above: with the include
# directories the layer compiles with, a source including one of its own headers must compile and
# a source including a header of any other layer listed must fail for want of that header.
# Usage: cmake -DCXX=<compiler> -DSTD=<standard flag> -DINCLUDES=<dir|dir...> -DWORK=<folder>
#              -DOWN=<header> -DFOREIGN=<header|header...> -P layer_guard.cmake
string(REPLACE "|" ";" includes "${INCLUDES}")
string(REPLACE "|" ";" foreign "${FOREIGN}")
set(flags ${STD} -fsyntax-only)
foreach(dir IN LISTS includes)
    list(APPEND flags "-I${dir}")
endforeach()
file(MAKE_DIRECTORY "${WORK}")

# Compiles a source holding only `#include "<header>"`; sets `ok` and `errors` in the caller.
function(compile_include header)
    string(MAKE_C_IDENTIFIER "${header}" name)
    set(source "${WORK}/${name}.cpp")
    file(WRITE "${source}" "#include \"${header}\"\n")
    execute_process(COMMAND "${CXX}" ${flags} "${source}"
        RESULT_VARIABLE result ERROR_VARIABLE errors OUTPUT_QUIET)
    if(result EQUAL 0)
        set(ok TRUE PARENT_SCOPE)
    else()
        set(ok FALSE PARENT_SCOPE)
    endif()
    set(errors "${errors}" PARENT_SCOPE)
endfunction()

compile_include("${OWN}")
if(NOT ok)
    message(FATAL_ERROR "The layer's own header ${OWN} does not compile:\n${errors}")
endif()
foreach(header IN LISTS foreign)
    compile_include("${header}")
    if(ok)
        message(FATAL_ERROR "${header} compiles with the layer's include directories")
    endif()
    # GCC: "<header>: No such file or directory"; Clang: "'<header>' file not found".
    if(NOT errors MATCHES "${header}(: No such file|' file not found)")
        message(FATAL_ERROR "${header} failed for another reason than being out of reach:\n"
            "${errors}")
    endif()
    message(STATUS "out of reach: ${header}")
endforeach()
