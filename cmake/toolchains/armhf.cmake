# SPDX-License-Identifier: Apache-2.0
# 32-bit ARM Linux, hard float: the unit's processor on a development host, run by qemu.
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR arm)
set(CMAKE_CXX_COMPILER arm-linux-gnueabihf-g++)
set(CMAKE_CXX_FLAGS_INIT -Wno-psabi) # a note on an ABI change that predates this project
set(CMAKE_CROSSCOMPILING_EMULATOR /usr/bin/qemu-arm-static)
