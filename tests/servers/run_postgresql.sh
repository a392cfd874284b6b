#!/bin/sh
# run_postgresql.sh FOLDER PORT: a PostgreSQL server of its own, with its files in the empty FOLDER, on PORT of 127.0.0.1
# and a socket in FOLDER. It ends by SIGINT, or with the program that started it. By the socket the user "owner" comes in
# without a password; over the network everybody needs one. Ends with 77 where no such server is installed.
set -eu
folder=$1
port=$2
export LC_ALL=C
cd "$folder"

bin=$(ls -d /usr/lib/postgresql/*/bin 2>/dev/null | tail -n 1)
[ -x "$bin/initdb" ] && [ -x "$bin/postgres" ] || {
    echo "there is no PostgreSQL server in /usr/lib/postgresql"
    exit 77
}
as=
if [ "$(id -u)" = 0 ]; then # it refuses to run as root
    chown postgres: "$folder"
    as="--reuid=postgres --regid=postgres --clear-groups"
fi
setpriv $as "$bin/initdb" -D "$folder/data" -U owner --auth-local=trust --auth-host=scram-sha-256 -E UTF8 --locale=C \
    --no-sync --no-instructions >"$folder/initdb.log"
kill -0 "$PPID"
exec setpriv $as --pdeathsig INT "$bin/postgres" -D "$folder/data" -c listen_addresses=127.0.0.1 -c "port=$port" \
    -c "unix_socket_directories=$folder" -c fsync=off -c synchronous_commit=off -c full_page_writes=off \
    -c shared_buffers=32MB -c max_connections=20 -c autovacuum=off
