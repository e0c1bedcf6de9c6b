#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
# hole_in_full_memory.sh FOLDER NAME COMMAND...: runs COMMAND while FOLDER is a memory file system
# without room, and the file NAME in it a hole of 179 bytes. No other process sees it, unless this one
# is in a changed root, where mounts can't be made private.
if [ "$1" != --inside ]; then
    for way in --mount '--mount --propagation unchanged' '--map-root-user --mount'; do
        # shellcheck disable=SC2086  # words
        unshare $way true 2>/dev/null && exec unshare $way /bin/sh "$0" --inside "$@"
    done
    echo "$0: a mount is not possible here" >&2
    exit 125
fi
folder=$2
file=$2/$3
shift 3
mount -t tmpfs -o size=4096 tmpfs "$folder" || exit 125
head -c 4096 /dev/zero >"$folder/full" && : >"$file" && truncate -s 179 "$file" || exit 125
"$@"
status=$?
umount -l "$folder"
exit $status
