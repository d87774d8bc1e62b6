#!/usr/bin/env bash
# The engine is built by a Windows compiler and calls every operation of the
# module's interfaces by its slot in the table of virtual operations, laid out
# the Windows way: one destructor slot, overloads grouped, a covariant return
# adding a slot. The module is built here with GCC, whose layout differs, so
# this compiles the interfaces for the engine's target with clang, reads the
# tables it prints, and compares them slot by slot with engine_tables.txt.
#
# usage: check_engine_tables.sh COMPILER SOURCE_DIR DUMP_FILE [TABLES_FILE]
#   COMPILER     clang++ able to target x86_64-pc-windows-msvc
#   SOURCE_DIR   the repository's root
#   DUMP_FILE    where the compiler's layouts are kept, for reading after a failure
#   TABLES_FILE  the expected tables (default: engine_tables.txt beside this script)
# Exit status: 0 every table as expected, 1 a table differs, 2 nothing could be compared.
set -euo pipefail

if [ $# -lt 3 ] || [ $# -gt 4 ]; then
    echo "usage: $0 COMPILER SOURCE_DIR DUMP_FILE [TABLES_FILE]" >&2
    exit 2
fi
compiler="$1"
source_dir="$2"
dump="$3"
here="$(cd "$(dirname "$0")" && pwd)"
tables="${4:-$here/engine_tables.txt}"
target=x86_64-pc-windows-msvc

if [ ! -r "$tables" ]; then
    echo "cannot read the expected tables: $tables" >&2
    exit 2
fi

# The engine's target has no standard library here: the compiler's freestanding
# C headers and the stand-ins of std_shim/ are enough to read the interfaces.
diagnostics="$dump.diagnostics"
if ! "$compiler" --target="$target" -std=c++17 -ffreestanding -nostdlibinc \
    -isystem "$here/std_shim" -I"$source_dir/src" -isystem "$source_dir/sdk" \
    -Xclang -fdump-vtable-layouts -S -o /dev/null "$here/EngineTablesProbe.cpp" \
    >"$dump" 2>"$diagnostics"; then
    echo "compiling EngineTablesProbe.cpp for $target failed:" >&2
    cat "$diagnostics" >&2
    if grep -q "fatal error: '[a-z_]*' file not found" "$diagnostics"; then
        echo "(a header includes a standard header that tests/abi/std_shim/ has no stand-in for: add one)" >&2
    fi
    exit 2
fi

# First file: the expected tables. Second file: the compiler's dump, whose
# tables read "VFTable for 'Base' in ... in 'Class' (N entries)." followed by
# "  i | <declaration> [tags]" lines, the RTTI locator first when RTTI is on.
awk -v target="$target" -v tablesName="$tables" -v dumpName="$dump" '
function fail(message) {
    print message
    failures++
}
function bad_table(message) {
    printf "%s:%d: %s\n", tablesName, FNR, message
    broken = 1
    exit 2
}
# The operation named by a dump entry: "destructor" for the destructor slot,
# else the function name of "Class::Name(".
function operation_of(text,    name) {
    if (!match(text, /[A-Za-z_][A-Za-z0-9_]*::~?[A-Za-z_][A-Za-z0-9_]*\(/))
        return "?"
    name = substr(text, RSTART, RLENGTH - 1)
    sub(/.*::/, "", name)
    return name ~ /^~/ ? "destructor" : name
}

FNR == NR {
    line = $0
    sub(/#.*/, "", line)
    gsub(/^[ \t]+|[ \t\r]+$/, "", line)
    if (line == "")
        next
    if (line ~ /^\[.*\]$/) {
        name = substr(line, 2, length(line) - 2)
        if (name !~ /^[A-Za-z_][A-Za-z0-9_]*$/)
            bad_table("\"" name "\" is not a class name")
        if (name in expectedCount)
            bad_table("class " name " is listed twice")
        current = name
        expectedCount[current] = 0
        order[++classes] = current
        next
    }
    if (current == "")
        bad_table("\"" line "\" comes before any [Class] line")
    if (line ~ /^=/) {
        other = line
        sub(/^=[ \t]*/, "", other)
        if (!(other in expectedCount) || other == current)
            bad_table("\"= " other "\" names no class listed above")
        for (i = 0; i < expectedCount[other]; i++)
            expected[current, expectedCount[current]++] = expected[other, i]
        next
    }
    if (line !~ /^[A-Za-z_][A-Za-z0-9_]*$/)
        bad_table("\"" line "\" is not an operation name")
    expected[current, expectedCount[current]++] = line
    next
}

/^VFTable for / {
    header = $0
    name = ""
    while (match(header, /'\''[^'\'']*'\''/)) {
        name = substr(header, RSTART + 1, RLENGTH - 2)
        header = substr(header, RSTART + RLENGTH)
    }
    tablesOf[name]++
    # Only the first table is the one the engine reaches through the object.
    inTable = tablesOf[name] == 1 ? name : ""
    if (inTable != "")
        foundCount[inTable] = 0
    next
}
/^$/ || /^VFTable indices/ {
    inTable = ""
    next
}
inTable != "" && /^ *[0-9]+ \| / {
    text = $0
    sub(/^ *[0-9]+ \| /, "", text)
    if (text ~ / RTTI$/)
        next
    found[inTable, foundCount[inTable]] = operation_of(text)
    foundText[inTable, foundCount[inTable]] = text
    foundCount[inTable]++
}

END {
    if (broken)
        exit 2
    if (classes == 0) {
        print tablesName ": lists no class"
        exit 2
    }
    slots = 0
    for (c = 1; c <= classes; c++) {
        name = order[c]
        want = expectedCount[name]
        slots += want
        if (!(name in foundCount)) {
            fail(name ": the compiler printed no table for it (include its header in EngineTablesProbe.cpp and delete one through a pointer there)")
            continue
        }
        if (tablesOf[name] > 1)
            fail(name ": " tablesOf[name] " tables of virtual operations, the engine knows one (a second base with virtual operations?)")
        have = foundCount[name]
        last = want > have ? want : have
        shown = 0
        for (slot = 0; slot < last; slot++) {
            if (slot < have && slot < want && found[name, slot] == expected[name, slot])
                continue
            # A shifted table differs everywhere after the shift: the first few say where.
            if (++shown > 3) {
                failures++
                continue
            }
            if (slot >= have)
                fail(name " slot " slot ": expected " expected[name, slot] ", found nothing (the compiled table ends at slot " have - 1 ")")
            else if (slot >= want)
                fail(name " slot " slot ": expected nothing (the engine'\''s table ends at slot " want - 1 "), found " found[name, slot] " [" foundText[name, slot] "]")
            else
                fail(name " slot " slot ": expected " expected[name, slot] ", found " found[name, slot] " [" foundText[name, slot] "]")
        }
        if (shown > 3)
            print name ": " shown - 3 " more slot(s) differ"
    }
    if (failures > 0) {
        print failures " difference(s) from " tablesName "; the compiler'\''s layouts are in " dumpName
        exit 1
    }
    print "tables of virtual operations as the engine expects them: " classes " classes, " slots " slots for " target
}
' "$tables" "$dump"
