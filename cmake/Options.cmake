# Every target links kest_options, which sets the language standard, the warnings and the rules for Qt.
add_library(kest_options INTERFACE)
target_compile_features(kest_options INTERFACE cxx_std_20)
target_compile_options(kest_options INTERFACE -Wall -Wextra -Wpedantic -Wshadow -Wnon-virtual-dtor -Woverloaded-virtual
                                              -Werror)
# With optimisation, GCC 12 wrongly warns that joined std::strings overlap and overrun.
target_compile_options(kest_options INTERFACE $<$<CXX_COMPILER_ID:GNU>:-Wno-restrict> $<$<CXX_COMPILER_ID:GNU>:-Wno-array-bounds>)
target_compile_definitions(
    kest_options
    INTERFACE QT_NO_CAST_FROM_ASCII QT_NO_CAST_TO_ASCII QT_NO_URL_CAST_FROM_STRING QT_NO_CAST_FROM_BYTEARRAY
              QT_NO_FOREACH QT_NO_NARROWING_CONVERSIONS_IN_CONNECT
              QT_DISABLE_DEPRECATED_BEFORE=0x060400 KEST_VERSION="${PROJECT_VERSION}")

find_program(MOLD mold)
if(MOLD)
    target_link_options(kest_options INTERFACE -fuse-ld=mold)
endif()

set(KEST_SANITIZE "" CACHE STRING "Sanitizers to build with, as -fsanitize takes them")
if(KEST_SANITIZE)
    add_compile_options(-fsanitize=${KEST_SANITIZE} -fno-omit-frame-pointer -fno-sanitize-recover=all)
    add_link_options(-fsanitize=${KEST_SANITIZE})
endif()

if(KEST_FUZZ)
    add_compile_options(-fsanitize=fuzzer-no-link)
    add_link_options(-fsanitize=fuzzer-no-link)
endif()
