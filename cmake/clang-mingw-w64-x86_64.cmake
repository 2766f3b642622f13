# Cross-compiling for 64-bit Windows with Clang instead of GCC, against the
# same MinGW-w64 headers and libraries (GCC's C++ library among them).
set(CMAKE_SYSTEM_NAME Windows)
set(CMAKE_SYSTEM_PROCESSOR x86_64)
set(TOOLCHAIN_PREFIX x86_64-w64-mingw32)
set(CMAKE_C_COMPILER clang)
set(CMAKE_CXX_COMPILER clang++)
set(CMAKE_C_COMPILER_TARGET ${TOOLCHAIN_PREFIX})
set(CMAKE_CXX_COMPILER_TARGET ${TOOLCHAIN_PREFIX})
set(CMAKE_RC_COMPILER ${TOOLCHAIN_PREFIX}-windres)
set(CMAKE_FIND_ROOT_PATH /usr/${TOOLCHAIN_PREFIX})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)

# Clang looks for GCC's C++ library in a folder named by GCC's version alone;
# Debian names it by version and thread model (12-posix). Ask GCC where it is.
execute_process(COMMAND ${TOOLCHAIN_PREFIX}-g++-posix -print-file-name=libstdc++.a
  OUTPUT_VARIABLE QBR_GCC_LIBSTDCXX OUTPUT_STRIP_TRAILING_WHITESPACE)
get_filename_component(QBR_GCC_DIR "${QBR_GCC_LIBSTDCXX}" DIRECTORY)
set(QBR_GCC_CXX_INCLUDE ${QBR_GCC_DIR}/include/c++)
set(CMAKE_CXX_STANDARD_INCLUDE_DIRECTORIES
  ${QBR_GCC_CXX_INCLUDE} ${QBR_GCC_CXX_INCLUDE}/${TOOLCHAIN_PREFIX} ${QBR_GCC_CXX_INCLUDE}/backward)
# The posix thread model's C++ library needs winpthread.
string(APPEND CMAKE_EXE_LINKER_FLAGS_INIT " -L${QBR_GCC_DIR} -pthread")
