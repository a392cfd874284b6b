#!/bin/sh
# run_mariadb.sh FOLDER PORT: a MariaDB server of its own, with its files in the empty FOLDER, on PORT of 127.0.0.1 and
# the socket FOLDER/socket. It ends by SIGTERM, or with the program that started it. By the socket the user "root" comes
# in without a password. Ends with 77 where no such server is installed.
set -eu
folder=$1
port=$2
cd "$folder"

command -v mariadbd >/dev/null && command -v mariadb-install-db >/dev/null || {
    echo "there is no MariaDB server: mariadbd and mariadb-install-db are not found"
    exit 77
}
as=
if [ "$(id -u)" = 0 ]; then # it refuses to run as root
    chown nobody "$folder"
    as="--reuid=nobody --regid=$(id -g nobody) --clear-groups"
fi
setpriv $as mariadb-install-db --no-defaults --datadir="$folder/data" --auth-root-authentication-method=normal \
    --skip-test-db --innodb-log-file-size=4M >"$folder/install.log" 2>&1
kill -0 "$PPID"
exec setpriv $as --pdeathsig TERM mariadbd --no-defaults --datadir="$folder/data" --socket="$folder/socket" \
    --bind-address=127.0.0.1 --port="$port" --pid-file="$folder/pid" --skip-name-resolve --skip-log-bin \
    --innodb-flush-log-at-trx-commit=0 --innodb-buffer-pool-size=32M --innodb-log-file-size=4M
