#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
# as_superuser.sh COMMAND...: runs COMMAND as root. An ordinary user becomes root of a new user
# namespace, where the user's files belong to root. A program under an emulator needs this to change
# its root: an emulator has threads, and a process with threads can't enter a user namespace.
if [ "$(id -u)" -ne 0 ] && unshare --map-root-user true 2>/dev/null; then
    exec unshare --map-root-user "$@"
fi
exec "$@" # the command itself reports what it lacks
