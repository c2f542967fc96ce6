# Shared part of the cross toolchains: Debian's cross compiler for NAS_TRIPLET, the
# target's libraries from the multiarch packages (/usr/lib/<triplet>) and from the
# cross toolchain's own tree (/usr/<triplet>, where the static libresolv is), and the
# target's programs run by qemu-user when the build or the tests need them.
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_CXX_COMPILER ${NAS_TRIPLET}-g++)
set(CMAKE_C_COMPILER ${NAS_TRIPLET}-gcc)
set(CMAKE_LIBRARY_ARCHITECTURE ${NAS_TRIPLET})

set(CMAKE_FIND_ROOT_PATH /usr/${NAS_TRIPLET} /)
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

set(CMAKE_CROSSCOMPILING_EMULATOR ${NAS_QEMU};-L;/usr/${NAS_TRIPLET})
