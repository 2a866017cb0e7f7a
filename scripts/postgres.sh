# Sourced by test.sh and bench.sh: starts a throwaway PostgreSQL 15 server on
# a free loopback port, exports QUOTAS_TEST_PG_* for it, and stops it and
# removes its folder when the calling script exits. Pass "fast" for test
# settings (no fsync); without it the server is durable, for benchmarks.

pg_bin=/usr/lib/postgresql/15/bin
pg_dir=$(mktemp -d /tmp/quotas-pg.XXXXXX)

as_postgres() {
  if [ "$(id -u)" -eq 0 ]; then runuser -u postgres -- "$@"; else "$@"; fi
}

stop_postgres() {
  if [ -f "$pg_dir/data/postmaster.pid" ]; then
    as_postgres "$pg_bin/pg_ctl" -D "$pg_dir/data" -m fast -w stop >/dev/null 2>&1 || true
  fi
  rm -rf "$pg_dir"
}
trap stop_postgres EXIT

if [ "$(id -u)" -eq 0 ]; then
  # initdb refuses to run as root; the server runs as "postgres".
  id postgres >/dev/null 2>&1 || useradd --system --home-dir /var/lib/postgresql --shell /bin/sh postgres
  chown postgres "$pg_dir"
fi

pg_password=$(head -c 18 /dev/urandom | base64 | tr -dc 'A-Za-z0-9')
printf '%s\n' "$pg_password" >"$pg_dir/password"
[ "$(id -u)" -eq 0 ] && chown postgres "$pg_dir/password"
as_postgres "$pg_bin/initdb" -D "$pg_dir/data" -U quotas --pwfile="$pg_dir/password" -A scram-sha-256 -N -E UTF8 >"$pg_dir/initdb.log" \
  || { cat "$pg_dir/initdb.log" >&2; exit 1; }

pg_options="-c listen_addresses=127.0.0.1 -k $pg_dir -c max_connections=100"
[ "${1:-}" = fast ] && pg_options="$pg_options -c fsync=off -c synchronous_commit=off -c full_page_writes=off"

started=""
for attempt in 1 2 3 4 5 6 7 8; do
  port=$((20000 + RANDOM % 30000))
  if as_postgres "$pg_bin/pg_ctl" -D "$pg_dir/data" -w -t 60 -l "$pg_dir/server.log" -o "-p $port $pg_options" start >/dev/null; then
    started=yes
    break
  fi
done
if [ -z "$started" ]; then
  echo "Could not start the PostgreSQL test server:" >&2
  cat "$pg_dir/server.log" >&2
  exit 1
fi

export QUOTAS_TEST_PG_HOST=127.0.0.1
export QUOTAS_TEST_PG_PORT=$port
export QUOTAS_TEST_PG_USER=quotas
export QUOTAS_TEST_PG_PASSWORD=$pg_password
echo "PostgreSQL test server on 127.0.0.1:$port"
