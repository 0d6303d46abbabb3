#!/usr/bin/env bash
# Writes the benchmark's configuration and SIPp's users: COUNT subscribers
# user000001... of the location service example.com, each inheriting the
# "DEFAULT" group, which challenges REGISTERs with realm example.com; each
# has its own password (pw000001...) in the authentication service users.
#
# usage: generate.sh COUNT DIRECTORY
# Writes DIRECTORY/subscribers.script (for location-gateway) and
# DIRECTORY/users.csv (for sipp -inf, one line a subscriber: the user, then
# SIPp's authentication keyword with the credentials, which SIPp expands when
# the field is sent; a field inside the keyword would not be).
set -euo pipefail
count=$1
directory=$2
mkdir -p "$directory"

cat >"$directory/subscribers.script" <<'SCRIPT'
location-service example.com create
location-service example.com domain insert 0 example.com
authentication-service users create
authentication-service users realm insert 0 example.com
identity example.com DEFAULT create identity-group
identity example.com DEFAULT face authentication-inbound create
face example.com DEFAULT authentication-inbound authenticate insert 0 users
identity example.com DEFAULT face registration-inbound create
face example.com DEFAULT registration-inbound lifetime-range set 60 7200 3600
SCRIPT
awk -v count="$count" 'BEGIN {
  for (i = 1; i <= count; ++i) {
    user = sprintf("user%06d", i)
    printf "identity example.com %s create identity DEFAULT\n", user
    printf "authentication-service users credentials set %s pw%06d\n", user, i
  }
}' >>"$directory/subscribers.script"

awk -v count="$count" 'BEGIN {
  print "SEQUENTIAL"
  for (i = 1; i <= count; ++i)
    printf "user%06d;[authentication username=user%06d password=pw%06d]\n", i, i, i
}' >"$directory/users.csv"
