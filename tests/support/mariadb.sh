#!/bin/sh
# Runs a MariaDB server with new data in a folder, until it is ended.
# usage: mariadb.sh FOLDER PORT
set -eu
PATH=$PATH:/usr/sbin:/usr/local/bin
data=$(dirname "$0")/../data
user=$(id -un)
# its own folder: at its start, a server deletes all temporary tables that it finds
export TMPDIR="$1/tmp"
mkdir "$TMPDIR"
mariadb-install-db --no-defaults --user="$user" --datadir="$1/data" --skip-test-db --skip-name-resolve
exec mariadbd --defaults-file="$data/mariadb.cnf" --init-file="$(realpath "$data")/mariadb.sql" --user="$user" \
    --datadir="$1/data" --port="$2" --socket="$1/s.sock" --pid-file="$1/pid"
