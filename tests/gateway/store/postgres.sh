# A PostgreSQL server of the test's own, for the tests to source:
#
#   postgres_start       initdb into a new directory under /tmp and start
#                        the server on a free port of 127.0.0.1 (its socket
#                        there too); sets postgres_uri. False when it
#                        cannot, its logs then in postgres_dir.
#   postgres_stop        stops it (fast shutdown, bounded), waits for it,
#                        and removes the directory.
#   postgres_sql SQL     runs SQL in the database the gateways use.
#   postgres_pause / postgres_resume
#                        stop and start the same cluster on the same port.
#
# The server refuses to run as root, so under root (as in CI) the directory
# is given to the postgres user and every server command runs as that user;
# it is under /tmp so that the user can reach it whatever the checkout's
# permissions.
postgres_bin=${POSTGRES_BIN:-/usr/lib/postgresql/15/bin}
postgres_dir=
postgres_port=
postgres_uri=

postgres_as() {
  if ((EUID == 0)); then
    runuser -u postgres -- "$@"
  else
    "$@"
  fi
}

postgres_start() {
  postgres_dir=$(mktemp -d /tmp/gateway-postgres.XXXXXX) || return 1
  if ((EUID == 0)); then chown postgres: "$postgres_dir" || return 1; fi
  postgres_as "$postgres_bin/initdb" -D "$postgres_dir/data" -A trust -U gateway --no-sync \
    >"$postgres_dir/initdb.log" 2>&1 || return 1
  local attempt
  for attempt in 1 2 3 4 5; do
    postgres_port=$((20000 + RANDOM % 30000))
    postgres_resume && break
    postgres_port=
  done
  [[ -n $postgres_port ]] || return 1
  postgres_uri="postgresql://gateway@127.0.0.1:$postgres_port/postgres"
}

postgres_resume() {
  postgres_as timeout 60 "$postgres_bin/pg_ctl" -D "$postgres_dir/data" -l "$postgres_dir/server.log" -w -t 30 \
    -o "-c listen_addresses=127.0.0.1 -p $postgres_port -c unix_socket_directories=$postgres_dir -c fsync=off" \
    start >/dev/null 2>&1
}

postgres_sql() {
  postgres_as timeout 30 "$postgres_bin/psql" -X -q -v ON_ERROR_STOP=1 -h 127.0.0.1 -p "$postgres_port" \
    -U gateway -d postgres -c "$1" >/dev/null
}

postgres_pause() {
  postgres_as timeout 60 "$postgres_bin/pg_ctl" -D "$postgres_dir/data" -m fast -w -t 30 stop >/dev/null 2>&1
}

postgres_stop() {
  [[ -n $postgres_port ]] && postgres_pause
  postgres_port=
  [[ -n $postgres_dir ]] && rm -rf "$postgres_dir"
  postgres_dir=
}
