#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
# Stands in for the SDK's compiler driver, as $QNX_HOST/usr/bin/q++: the ARM compiler for Linux, with what
# CMake knows the driver by. Files in $QNX_HOST/stand-in make another driver of it:
#   version   of the compiler, for CMake's program that asks
#   unknown   options that end it, one a line, as an older compiler does not know them
#   ignored   options that it accepts and does nothing for
# Each call leaves its words, one a line, in a file in $QNX_HOST/calls.
set -eu
state=$QNX_HOST/stand-in

printf '%s\n' "$@" >"$(mktemp "$QNX_HOST/calls/XXXXXX")"

if [ "$*" = -V ]; then
    printf 'cc: targets available in %s:\n\tgcc_ntoarmv7le_gpp\n' "$QNX_HOST/etc/qcc" >&2
    exit 0
fi

# is FILE WORD: whether the word, or what it has before a "=", stands in the file.
is() {
    grep -qxF -e "${2%%=*}" "$state/$1"
}

variant=
for word in "$@"; do
    shift
    if is unknown "$word"; then
        echo "cc1plus: error: unrecognized command line option '$word'" >&2
        exit 1
    fi
    case $word in
    -V*) variant=${word#-V} ;;
    -lang-c++) ;;
    CMakeCXXCompilerId.cpp)
        IFS=. read -r major minor patch <"$state/version"
        set -- "$@" -U__GNUC__ -U__GNUC_MINOR__ -U__GNUC_PATCHLEVEL__ "-D__GNUC__=$major" \
            "-D__GNUC_MINOR__=$minor" "-D__GNUC_PATCHLEVEL__=$patch" "$word"
        ;;
    *) is ignored "$word" || set -- "$@" "$word" ;;
    esac
done
if [ -z "$variant" ]; then
    echo "q++: no -V, and the SDK's default may be another processor" >&2
    exit 1
fi
exec arm-linux-gnueabihf-g++ -D__QNXNTO__ "$@"
