-- 8 more views, and a function, in MariaDB's own SQL. lineage_mariadb.txt belongs to them.

CREATE FUNCTION gross_price(price decimal(10,2), rate decimal(6,4)) RETURNS decimal(12,4) DETERMINISTIC RETURN price * (1 + rate);

CREATE VIEW supplier_labels AS
    SELECT su.id, concat(su.name, ', ', a.city) AS label FROM suppliers su JOIN addresses a ON a.id = su.address_id;
CREATE VIEW product_numbers AS
    SELECT cast(p.id AS char(10)) AS number_text, round(p.price, 1) AS short_price, p.weight DIV 1 AS weight FROM products p;
CREATE VIEW last_orders AS
    SELECT c.id, (SELECT max(o.ordered) FROM orders o WHERE o.customer_id = c.id) AS last_order FROM customers c;
CREATE VIEW shelf_prices AS
    SELECT p.sku, gross_price(p.price, t.rate) AS gross FROM products p JOIN taxes t ON t.id = p.tax_id;
CREATE VIEW order_years AS
    SELECT year(o.ordered) AS order_year, count(*) AS orders FROM orders o GROUP BY year(o.ordered);
CREATE VIEW product_ranks AS
    SELECT p.id, rank() OVER (PARTITION BY p.category_id ORDER BY p.price) AS place FROM products p;
CREATE VIEW category_tree AS
    WITH RECURSIVE tree AS (
        SELECT k.id, k.name, 1 AS depth FROM categories k WHERE k.parent_id IS NULL
        UNION ALL SELECT k.id, k.name, t.depth + 1 FROM categories k JOIN tree t ON t.id = k.parent_id)
    SELECT tree.id, tree.name, tree.depth FROM tree;
CREATE VIEW found_customers AS
    SELECT c.id, c.email FROM customers c WHERE c.last_name LIKE 'V%' AND c.group_id IN (1, 2);
