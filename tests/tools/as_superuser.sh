#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
# as_superuser.sh COMMAND...: becomes the command, as the superuser or, for other users, as that of a
# user namespace of its own, to whom the user's files then belong. What runs under an emulator needs
# this to change its root: an emulator has threads, and a process with threads can't enter a user
# namespace.
if [ "$(id -u)" -ne 0 ] && unshare --map-root-user true 2>/dev/null; then
    exec unshare --map-root-user "$@"
fi
exec "$@" # which says itself what it lacks
