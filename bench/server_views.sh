#!/usr/bin/env bash
# server_views.sh [ZRSQL]: how long import, lineage and report take for 2,000 views of a PostgreSQL server, which is started
# for it and ended behind it. Real and processor time of zrsql, and the machine's load ahead of each.
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
zrsql=$(realpath "${1:-$root/build/release/bin/zrsql}")
shop=$root/tests/servers/shop
work=$(mktemp -d /tmp/zrsql_bench_XXXXXX)
chmod 755 "$work"
mkdir "$work/server"
port=$((20000 + RANDOM % 20000))

"$root/tests/servers/run_postgresql.sh" "$work/server" "$port" >"$work/log" 2>&1 &
server=$!
trap 'kill -INT "$server" 2>/dev/null; wait "$server" || true; rm -rf "$work"' EXIT
psql=(psql -h "$work/server" -p "$port" -U owner -d postgres -q -v ON_ERROR_STOP=1)
for ((attempt = 0; ; ++attempt)); do
    pg_isready -q -h "$work/server" -p "$port" && break
    ((attempt < 300)) && kill -0 "$server" || { cat "$work/log"; exit 1; }
    sleep 0.1
done

{
    echo "CREATE SCHEMA shop; SET search_path = shop;"
    cat "$shop/tables.sql"
    cat <<'SQL'
DO $$ BEGIN
    FOR i IN 1..500 LOOP
        EXECUTE format('CREATE VIEW lines_%s AS SELECT l.order_id, l.line_no, l.quantity * l.unit_price - l.discount AS amount,
            p.sku, p.name, b.name AS brand, k.name AS category, CASE WHEN p.weight > %s THEN p.cost ELSE p.price END AS base
            FROM order_lines l JOIN products p ON p.id = l.product_id LEFT JOIN brands b ON b.id = p.brand_id
            LEFT JOIN categories k ON k.id = p.category_id WHERE l.quantity > %s AND p.active', i, i, i);
        EXECUTE format('CREATE VIEW totals_%s AS SELECT order_id, sum(amount) AS total, count(*) AS line_count, min(brand) AS brand
            FROM lines_%s GROUP BY order_id', i, i);
        EXECUTE format('CREATE VIEW orders_%s AS SELECT o.id, o.ordered, st.name AS status, c.first_name, c.last_name, a.city, t.*
            FROM orders o JOIN order_status st ON st.id = o.status_id JOIN customers c ON c.id = o.customer_id
            LEFT JOIN addresses a ON a.id = c.address_id LEFT JOIN totals_%s t ON t.order_id = o.id', i, i);
        EXECUTE format('CREATE VIEW people_%s AS SELECT v.last_name, v.city, v.total FROM orders_%s v WHERE v.total > %s
            UNION ALL SELECT e.last_name, e.department, 0 FROM employees e
            WHERE e.id IN (SELECT o.employee_id FROM orders o WHERE o.status_id = %s)', i, i, i, i);
    END LOOP;
END $$;
SQL
} | "${psql[@]}"

measure() {
    echo "$1, load $(cut -d' ' -f1-3 /proc/loadavg)" >&2
    TIMEFORMAT='  real %R s, user %U s, system %S s'
    time "${@:2}"
}
measure import "$zrsql" project import "postgresql://owner@/postgres?host=$work/server&port=$port&schema=shop" "$work/project.json" -d postgresql
measure lineage "$zrsql" lineage "$work/project.json" --format csv >"$work/lineage.csv"
measure report "$zrsql" report "$work/project.json" -o "$work/report.html"
echo "lines of lineage: $(wc -l <"$work/lineage.csv"), of them unknown: $(grep -c ',no,' "$work/lineage.csv" || true); page: $(stat -c %s "$work/report.html") bytes"
