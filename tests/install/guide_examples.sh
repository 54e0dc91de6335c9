#!/bin/sh
# guide_examples.sh SOURCE_DIR: the code in docs/host-guide.md is that of examples/host.cpp, piece by piece.
set -eu
cd "$1"
pieces=$(sed -n 's/^<!-- \[\([a-z]*\)\] -->$/\1/p' docs/host-guide.md)
[ -n "$pieces" ]
for piece in $pieces; do
    in_source=$(awk -v mark="// [$piece]" '
        { text = $0; sub(/^ */, "", text) }
        text == mark { inside = !inside; next }
        inside { if (!seen) { seen = 1; match($0, /^ */); indent = RLENGTH } print substr($0, $0 == "" ? 1 : indent + 1) }
    ' examples/host.cpp)
    in_guide=$(awk -v mark="<!-- [$piece] -->" '
        $0 == mark { found = 1; next }
        found && $0 == "```cpp" { inside = 1; next }
        inside && $0 == "```" { exit }
        inside
    ' docs/host-guide.md)
    if [ "$in_source" != "$in_guide" ] || [ -z "$in_source" ]; then
        echo "docs/host-guide.md and examples/host.cpp differ in the piece $piece" >&2
        exit 1
    fi
done
