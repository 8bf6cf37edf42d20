# Optimized builds use the hardening that Debian's own packages are built with. A flag that the packager sets or
# turns off (dpkg-buildflags, CFLAGS, LDFLAGS) is left as it is. Tests/Binaries checks the result.
include(CheckCXXCompilerFlag)
include(CheckPIESupported)
check_pie_supported(LANGUAGES C CXX)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)

# zorva_harden(PATTERN OFF FLAG...): adds the flags unless the packager's flags match PATTERN or the compiler lacks
# one. OFF undoes them, for the benchmark that shows their cost; all of these are in ZORVA_NO_HARDENING.
set(ZORVA_NO_HARDENING "")
function(zorva_harden pattern off)
    if("${CMAKE_C_FLAGS} ${CMAKE_CXX_FLAGS}" MATCHES "${pattern}")
        return()
    endif()
    string(MAKE_C_IDENTIFIER "zorva_has_${ARGN}" has)
    check_cxx_compiler_flag("${ARGN}" ${has})
    if(${has})
        add_compile_options(${ARGN})
        set(ZORVA_NO_HARDENING ${ZORVA_NO_HARDENING} ${off} PARENT_SCOPE)
    endif()
endfunction()

if(CMAKE_BUILD_TYPE MATCHES "^(Release|RelWithDebInfo|MinSizeRel)$" AND NOT ZORVA_SANITIZE)
    zorva_harden("_FORTIFY_SOURCE" -U_FORTIFY_SOURCE -U_FORTIFY_SOURCE -D_FORTIFY_SOURCE=2)
    zorva_harden("stack-protector" -fno-stack-protector -fstack-protector-strong)
    zorva_harden("stack-clash" -fno-stack-clash-protection -fstack-clash-protection)
    zorva_harden("cf-protection" -fcf-protection=none -fcf-protection) # x86: IBT and shadow stack
    zorva_harden("branch-protection" -mbranch-protection=none -mbranch-protection=standard) # arm64: BTI and PAC
    if(NOT "${CMAKE_EXE_LINKER_FLAGS}" MATCHES "norelro|lazy")
        add_link_options(-Wl,-z,relro -Wl,-z,now)
    endif()
endif()
