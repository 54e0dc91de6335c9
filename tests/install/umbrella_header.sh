#!/bin/sh
# umbrella_header.sh SOURCE_DIR LIST: every public header (one path a line in LIST) stands in lumenkey/lumenkey.h,
# and nothing else does.
set -eu
source_dir=$1
list=$2
umbrella=lumenkey/lumenkey.h

wanted=$(sed "s|^$source_dir/||" "$list" | grep -vx "$umbrella" | LC_ALL=C sort)
found=$(sed -n 's/^#include "\(.*\)".*/\1/p' "$source_dir/$umbrella" | LC_ALL=C sort)
[ -n "$wanted" ] || { echo "no public header in $list" >&2; exit 1; }
[ "$wanted" = "$found" ] && exit 0

echo "$umbrella does not include the public headers:" >&2
for header in $wanted; do
    printf '%s\n' "$found" | grep -qxF "$header" || echo "  missing: $header" >&2
done
for header in $found; do
    printf '%s\n' "$wanted" | grep -qxF "$header" || echo "  not public: $header" >&2
done
exit 1
