#!/usr/bin/env bash
# Checks what a shared library exports against its public headers. Every
# exported dynamic symbol must belong to a class, function or variable that
# a public header declares (an internal name that leaks out fails), and
# every function and variable declared at namespace scope, and every class
# with a member declared there but defined out of line, must be exported (a
# public one that is missing, or that lacks its LS_EXPORT mark, fails).
#
# usage: [NM=nm] check-exported-symbols.sh LIBRARY HEADER... [-- HEADER...]
# The headers after "--" belong to libraries this one links: it may export
# their names too (the vtable of a base class it uses, for one) but need not.
set -euo pipefail
library=$1
shift
own=()
while [ $# -gt 0 ] && [ "$1" != -- ]; do
  own+=("$1")
  shift
done
[ $# -gt 0 ] && shift
others=("$@")

# "name" lines for what headers declare that the library must define:
# namespace-scope function declarations (not definitions, not templates),
# extern variables, and classes with a member declared but not defined in
# the header. With "all", every declared class counts, defined or not.
declared() {
  local which=$1
  shift
  awk -v which="$which" '
    function flush() {
      if (pending != "" && pending ~ /\);[ \t]*$/) {
        name = pending; sub(/\(.*/, "", name); sub(/.*[^A-Za-z_0-9]/, "", name); print name
      }
      pending = ""
    }
    FNR == 1 { klass = ""; previous = "" }
    pending != "" { pending = pending $0; if ($0 ~ /[;{][ \t]*$/) flush(); next }
    /^(class|struct) / && $0 !~ /;[ \t]*$/ && previous !~ /^template/ {
      klass = $0; sub(/^(class|struct) (LS_EXPORT )?/, "", klass); sub(/[^A-Za-z_0-9].*/, "", klass)
      if (which == "all") print klass
    }
    /^};/ { klass = "" }
    klass != "" && /^  [^ \/]/ && /\) *(const)? *(override)? *;$/ && !/= *(0|default|delete) *;/ && !/friend/ {
      print klass
    }
    /^extern / && /;[ \t]*$/ && !/"/ { name = $0; sub(/(\[\])? *;.*/, "", name); sub(/.*[^A-Za-z_0-9]/, "", name); print name }
    /^[A-Za-z_]/ && /\(/ && !/^(inline|static|template|class|struct|namespace|using|typedef|friend|extern|constexpr|return|enum)/ &&
        previous !~ /^template/ {
      pending = $0; if ($0 ~ /[;{][ \t]*$/) flush()
    }
    NF { previous = $0 }
  ' "$@" | sort -u
}

required=$(declared some "${own[@]}")
allowed=$(declared all "${own[@]}"; [ ${#others[@]} -eq 0 ] || declared all "${others[@]}")

# Exported symbols as (first component, last component) of their qualified
# name: "typeinfo for LS_IIdentity" gives LS_IIdentity twice,
# "SYSTEM::DRIVER_REPOSITORY()" gives SYSTEM and DRIVER_REPOSITORY.
# Symbols a sanitizer build adds for its own bookkeeping are not the
# library's.
symbols=$("${NM:-nm}" -D --defined-only -C "$library" | cut -d' ' -f3- |
  grep -Ev '^(__odr_asan|__asan|__ubsan|__tsan|__sanitizer)' |
  sed -E 's/^(typeinfo name for|typeinfo for|vtable for|VTT for|non-virtual thunk to|virtual thunk to|guard variable for) //' |
  sed -E ':strip; s/<[^<>]*>//; t strip' |
  sed -E 's/\(.*//; s/^.* ([^ ]+)$/\1/' |
  awk -F'::' '{ print $1, $NF }' | sort -u)

status=0
while read -r first last; do
  if ! grep -qxF "$first" <<<"$allowed" && ! grep -qxF "$last" <<<"$allowed"; then
    echo "exported but not public: $first ... $last"
    status=1
  fi
done <<<"$symbols"
for name in $required; do
  if ! awk -v name="$name" '$1 == name || $2 == name { found = 1 } END { exit !found }' <<<"$symbols"; then
    echo "public but not exported: $name"
    status=1
  fi
done
exit $status
