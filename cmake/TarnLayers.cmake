# The layers of src/: each folder is a library that sees its own headers and those of the layers
# it links, nothing else. A layer's include root under the build folder holds a single link named
# after its folder; the root is PUBLIC, so a layer's dependents see "<folder>/..." too. There is
# no include root over all of src/, so an include that goes the wrong way finds no file and the
# build fails.

# Gives `target` the include root of src/<folder> with the given scope (PUBLIC for a library).
function(tarn_layer_root target scope folder)
    set(root "${PROJECT_BINARY_DIR}/layers/${folder}")
    set(link "${root}/${folder}")
    file(MAKE_DIRECTORY "${root}")
    file(CREATE_LINK "${PROJECT_SOURCE_DIR}/src/${folder}" "${link}" RESULT result SYMBOLIC)
    if(NOT result STREQUAL "0" AND WIN32 AND NOT IS_DIRECTORY "${link}")
        # Windows makes symbolic links only with developer mode or rights; a junction needs none.
        file(TO_NATIVE_PATH "${link}" native_link)
        file(TO_NATIVE_PATH "${PROJECT_SOURCE_DIR}/src/${folder}" native_folder)
        execute_process(COMMAND cmd /c mklink /J "${native_link}" "${native_folder}"
            RESULT_VARIABLE result OUTPUT_QUIET)
    endif()
    if(NOT IS_DIRECTORY "${link}")
        message(FATAL_ERROR "Cannot link ${link} to src/${folder}: ${result}")
    endif()
    target_include_directories(${target} ${scope} "${root}")
endfunction()

# A static library of the *.cpp files of src/<folder> (plus `extra` sources) with its include root.
function(tarn_layer target folder)
    file(GLOB sources CONFIGURE_DEPENDS "${PROJECT_SOURCE_DIR}/src/${folder}/*.cpp")
    add_library(${target} STATIC ${sources} ${ARGN})
    tarn_layer_root(${target} PUBLIC ${folder})
endfunction()
