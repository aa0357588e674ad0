# Flags that every target shares.
set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)
set(CMAKE_RUNTIME_OUTPUT_DIRECTORY "${CMAKE_BINARY_DIR}/bin")
set(CMAKE_LIBRARY_OUTPUT_DIRECTORY "${CMAKE_BINARY_DIR}/lib")
# Programs find the shared library beside them in the build tree and in an installed tree alike.
set(CMAKE_BUILD_RPATH_USE_ORIGIN ON)

if(NOT CMAKE_BUILD_TYPE)
    set(CMAKE_BUILD_TYPE Release)
endif()

add_compile_options(-Wall -Wextra -Werror)
# Nothing reads errno after a call of <cmath>: square roots and roundings are one instruction then, not a call.
add_compile_options(-fno-math-errno)
if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU")
    # At -O3 g++ 12 follows the inline room of short strings into sizes that only the heap form has, and reports
    # writes that cannot happen. clang and the sanitizers watch the same code.
    add_compile_options(-Wno-array-bounds -Wno-stringop-overflow -Wno-stringop-overread)
endif()
# Line tables are enough for sanitizer reports and gdb backtraces, and halve what the linker has to move.
string(REPLACE "-g" "-gline-tables-only" _clang_debug "${CMAKE_CXX_FLAGS_DEBUG}")
if(CMAKE_CXX_COMPILER_ID MATCHES "Clang")
    set(CMAKE_CXX_FLAGS_DEBUG "${_clang_debug}")
else()
    set(CMAKE_CXX_FLAGS_DEBUG "-g1")
endif()

if(CMAKE_CXX_COMPILER_ID MATCHES "Clang")
    # A member marked QSL_GUARDED_BY is touched with its lock held.
    add_compile_options(-Wthread-safety)
    # Lets ccache serve objects that were built with a precompiled header.
    add_compile_options("SHELL:-Xclang -fno-pch-timestamp")
endif()

if(QORVEX_SANITIZE)
    add_compile_options(-fsanitize=${QORVEX_SANITIZE} -fno-omit-frame-pointer -O1)
    add_link_options(-fsanitize=${QORVEX_SANITIZE})
    if(QORVEX_SANITIZE MATCHES "undefined")
        add_compile_options(-fno-sanitize-recover=undefined -fno-sanitize=vptr)
    endif()
endif()

# A Release build is linked so that what runs until a page's first frame stands together: 13 page faults for code
# instead of 46, which is 0.2 to 0.3 ms of 6. All others link with what is fastest.
find_program(QORVEX_LLD ld.lld)
find_program(QORVEX_MOLD mold)
if(QORVEX_LLD AND CMAKE_BUILD_TYPE STREQUAL "Release" AND NOT QORVEX_SANITIZE)
    add_compile_options(-ffunction-sections)
    set(_first_frame_order ${CMAKE_SOURCE_DIR}/cmake/first_frame.order)
    set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${_first_frame_order})
    add_link_options(-fuse-ld=lld -Wl,--gc-sections -Wl,--symbol-ordering-file=${_first_frame_order}
        -Wl,--no-warn-symbol-ordering)
elseif(QORVEX_MOLD)
    add_link_options(-fuse-ld=mold)
endif()

# Symbols are found when a program is loaded, not on the first call of each inside some frame of a game; and
# what the loader has written stays read-only.
add_link_options(-Wl,-z,relro,-z,now)

find_package(Threads REQUIRED)

# qorvex_uses_rapidjson(TARGET...): its stack adds to a null pointer before its first push.
function(qorvex_uses_rapidjson)
    if(QORVEX_SANITIZE MATCHES "undefined")
        foreach(target ${ARGN})
            target_compile_options(${target} PRIVATE "-fsanitize-ignorelist=${CMAKE_SOURCE_DIR}/cmake/rapidjson_ignore.txt")
        endforeach()
    endif()
endfunction()
