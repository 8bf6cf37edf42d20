# What every target of the project is compiled with.
add_library(zorvatouch_options INTERFACE)
target_include_directories(zorvatouch_options INTERFACE ${CMAKE_SOURCE_DIR})

# Results are exact to the bit: every floating-point operation is rounded once, in the order written. Contraction into
# fused operations and -ffast-math would change gestures from one machine to the next. Tests watch over this.
# ZORVA_FP_CONTRACT exists for .ci/determinism alone, which proves that the comparison would notice.
set(ZORVA_FP_CONTRACT off CACHE STRING "Leave this alone")
mark_as_advanced(ZORVA_FP_CONTRACT)
target_compile_options(zorvatouch_options INTERFACE -ffp-contract=${ZORVA_FP_CONTRACT})

target_compile_options(zorvatouch_options INTERFACE
    -Wall -Wextra -Wpedantic -Wconversion -Wsign-conversion -Wshadow -Wnon-virtual-dtor -Woverloaded-virtual
    -Wdouble-promotion -Wimplicit-fallthrough)
if(CMAKE_CXX_COMPILER_ID MATCHES "Clang")
    # Which lock guards what: Host/Interface/ThreadAnnotations.h.
    target_compile_options(zorvatouch_options INTERFACE -Wthread-safety)
endif()
if(ZORVA_WERROR)
    target_compile_options(zorvatouch_options INTERFACE -Werror)
endif()

if(ZORVA_SANITIZE STREQUAL "address")
    set(zorva_sanitizers address,undefined)
    if(CMAKE_CXX_COMPILER_ID MATCHES "Clang")
        string(APPEND zorva_sanitizers ,float-cast-overflow)
    endif()
elseif(ZORVA_SANITIZE STREQUAL "thread")
    set(zorva_sanitizers thread)
elseif(ZORVA_SANITIZE)
    message(FATAL_ERROR "ZORVA_SANITIZE is empty, address or thread, not ${ZORVA_SANITIZE}")
endif()
if(zorva_sanitizers)
    add_compile_options(-fsanitize=${zorva_sanitizers} -fno-sanitize-recover=all -fno-omit-frame-pointer)
    add_link_options(-fsanitize=${zorva_sanitizers})
    if(CMAKE_C_COMPILER_ID MATCHES "Clang")
        # Programs in C load libraries in C++, which find the sanitizer's runtime in the program.
        set(ZORVA_C_LINK_OPTIONS -fsanitize-link-c++-runtime -lstdc++)
    endif()
endif()
if(ZORVA_FUZZ)
    add_compile_options(-fsanitize=fuzzer-no-link
        -fsanitize-coverage-ignorelist=${CMAKE_SOURCE_DIR}/Fuzz/coverage-ignore.txt
        -fprofile-instr-generate=/dev/null -fcoverage-mapping) # LLVM_PROFILE_FILE names another file
    add_link_options(-fsanitize=fuzzer-no-link -fprofile-instr-generate)
endif()
