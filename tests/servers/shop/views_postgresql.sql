-- 8 more views, and a function, in PostgreSQL's own SQL. lineage_postgresql.txt belongs to them.

CREATE FUNCTION gross_price(price numeric, rate numeric) RETURNS numeric LANGUAGE sql IMMUTABLE AS 'SELECT price * (1 + rate)';
CREATE FUNCTION gross_price(price numeric) RETURNS numeric LANGUAGE sql IMMUTABLE AS 'SELECT price * 1.21';

CREATE VIEW supplier_labels AS
    SELECT su.id, su.name || ', ' || a.city AS label FROM suppliers su JOIN addresses a ON a.id = su.address_id;
CREATE VIEW product_numbers AS
    SELECT p.id::varchar AS number_text, p.price::numeric(10,1) AS short_price, p.weight::double precision AS weight FROM products p;
CREATE VIEW latest_reviews AS
    SELECT DISTINCT ON (r.product_id) r.product_id, r.rating, r.written FROM reviews r ORDER BY r.product_id, r.written DESC;
CREATE VIEW shelf_prices AS
    SELECT p.sku, gross_price(p.price, t.rate) AS gross FROM products p JOIN taxes t ON t.id = p.tax_id;
CREATE VIEW order_years AS
    SELECT extract(year FROM o.ordered) AS order_year, count(*) AS orders FROM orders o GROUP BY extract(year FROM o.ordered);
CREATE VIEW product_ranks AS
    SELECT p.id, rank() OVER (PARTITION BY p.category_id ORDER BY p.price) AS place FROM products p;
CREATE VIEW category_tree AS
    WITH RECURSIVE tree AS (
        SELECT k.id, k.name, 1 AS depth FROM categories k WHERE k.parent_id IS NULL
        UNION ALL SELECT k.id, k.name, t.depth + 1 FROM categories k JOIN tree t ON t.id = k.parent_id)
    SELECT tree.id, tree.name, tree.depth FROM tree;
CREATE VIEW found_customers AS
    SELECT c.id, c.email FROM customers c WHERE c.last_name LIKE 'V%' AND c.group_id IN (1, 2);
