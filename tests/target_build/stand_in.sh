#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
# Stands in for the SDK's compiler driver, as $QNX_HOST/usr/bin/q++: the ARM compiler for Linux, with
# everything by which CMake recognises the driver. Files in $QNX_HOST/stand-in change it:
#   version   the compiler's version, for CMake's test program
#   known     patterns of the known options, one a line; any other is an error
#   ignored   known options without effect
#   added     words added to each link, as a driver's configuration may do
# Each call writes its words, one a line, to a file in $QNX_HOST/calls.
set -eu
state=$QNX_HOST/stand-in

printf '%s\n' "$@" >"$(mktemp "$QNX_HOST/calls/XXXXXX")"

if [ "$*" = -V ]; then
    printf 'cc: targets available in %s:\n\tgcc_ntoarmv7le_gpp\n' "$QNX_HOST/etc/qcc" >&2
    exit 0
fi

# is FILE WORD: whether a pattern in the file matches the word.
is() {
    while IFS= read -r pattern; do
        # shellcheck disable=SC2254 # meant as a pattern
        case $2 in $pattern) return 0 ;; esac
    done <"$state/$1"
    return 1
}

variant=
links=yes
for word in "$@"; do
    shift
    case $word in
    -*)
        if ! is known "$word"; then
            echo "cc1plus: error: unrecognized command line option '$word'" >&2
            exit 1
        fi
        ;;
    esac
    case $word in
    -c | -E) links= ;;
    esac
    case $word in
    -V*) variant=${word#-V} ;;
    -lang-c++) ;;
    CMakeCXXCompilerId.cpp)
        IFS=. read -r major minor patch <"$state/version"
        set -- "$@" -U__GNUC__ -U__GNUC_MINOR__ -U__GNUC_PATCHLEVEL__ "-D__GNUC__=$major" \
            "-D__GNUC_MINOR__=$minor" "-D__GNUC_PATCHLEVEL__=$patch" "$word"
        ;;
    *)
        is ignored "$word" && continue
        case $word in
        -Bstatic | -Bdynamic) word=-Wl,$word ;; # options of the SDK's driver
        esac
        set -- "$@" "$word"
        ;;
    esac
done
if [ -n "$links" ]; then
    while IFS= read -r word; do
        set -- "$@" "$word"
    done <"$state/added"
fi
if [ -z "$variant" ]; then
    echo "q++: no -V, and the SDK's default may be another processor" >&2
    exit 1
fi
exec arm-linux-gnueabihf-g++ -D__QNXNTO__ "$@"
