-- 52 views that PostgreSQL and MariaDB take alike. lineage.txt tells where each of their columns comes from.

CREATE VIEW customer_names AS
    SELECT id, concat(first_name, ' ', last_name) AS full_name, email FROM customers;
CREATE VIEW all_products AS
    SELECT * FROM products;
CREATE VIEW customer_addresses AS
    SELECT c.id AS customer_id, c.last_name, a.street, a.city, a.postcode, r.name AS region, r.country_code
    FROM customers c JOIN addresses a ON a.id = c.address_id LEFT JOIN regions r ON r.id = a.region_id;
CREATE VIEW customer_countries AS
    SELECT ca.customer_id, ca.last_name, ca.city, co.name AS country, cu.name AS currency, cu.rate
    FROM customer_addresses ca JOIN countries co ON co.code = ca.country_code JOIN currencies cu ON cu.code = co.currency_code;
CREATE VIEW country_sizes AS
    SELECT country, count(*) AS customers, min(city) AS first_city FROM customer_countries GROUP BY country;
CREATE VIEW line_amounts AS
    SELECT l.order_id, l.line_no, l.product_id, l.quantity, l.quantity * l.unit_price - l.discount AS amount FROM order_lines l;
CREATE VIEW order_totals AS
    SELECT order_id, sum(amount) AS total, count(*) AS line_count FROM line_amounts GROUP BY order_id;
CREATE VIEW order_overview AS
    SELECT o.id, o.ordered, st.name AS status, c.last_name AS customer, t.total
    FROM orders o JOIN order_status st ON st.id = o.status_id JOIN customers c ON c.id = o.customer_id
        LEFT JOIN order_totals t ON t.order_id = o.id;
CREATE VIEW open_orders AS
    SELECT * FROM order_overview WHERE status = 'open';
CREATE VIEW big_open_orders AS
    SELECT b.*, b.total * 0.1 AS bonus FROM open_orders b WHERE b.total > 1000;
CREATE VIEW products_with_brand AS
    SELECT p.id, p.sku, p.name, b.name AS brand, k.name AS category
    FROM products p, brands b, categories k WHERE b.id = p.brand_id AND k.id = p.category_id;
CREATE VIEW category_parents AS
    SELECT child.id, child.name, parent.name AS parent_name
    FROM categories child LEFT JOIN categories parent ON parent.id = child.parent_id;
CREATE VIEW category_paths AS
    SELECT v.id, v.name, v.parent_name, g.parent_name AS grandparent_name
    FROM category_parents v JOIN categories k ON k.id = v.id LEFT JOIN category_parents g ON g.id = k.parent_id;
CREATE VIEW gross_prices AS
    SELECT p.id, p.sku, p.price, p.price * (1 + t.rate) AS gross, t.name AS tax FROM products p JOIN taxes t ON t.id = p.tax_id;
CREATE VIEW margins AS
    SELECT g.id, g.sku, g.gross, p.cost, g.price - p.cost AS margin FROM gross_prices g JOIN products p ON p.id = g.id;
CREATE VIEW good_margins AS
    SELECT mg.* FROM margins mg WHERE mg.margin > 10;
CREATE VIEW product_ratings AS
    SELECT product_id, avg(rating) AS average, max(written) AS last_review, count(*) AS reviews FROM reviews GROUP BY product_id;
CREATE VIEW rated_products AS
    SELECT p.id, p.name, coalesce(r.average, 0) AS average, r.last_review
    FROM products p LEFT JOIN product_ratings r ON r.product_id = p.id;
CREATE VIEW best_products AS
    SELECT id, name, average FROM rated_products WHERE average >= 4;
CREATE VIEW people AS
    SELECT first_name, last_name, phone AS contact FROM customers
    UNION SELECT first_name, last_name, department FROM employees;
CREATE VIEW parties AS
    SELECT id, last_name AS name FROM customers UNION ALL SELECT id, name FROM suppliers UNION ALL SELECT id, name FROM carriers;
CREATE VIEW party_names AS
    SELECT DISTINCT name FROM parties;
CREATE VIEW money_flow AS
    SELECT p.order_id, p.amount, p.paid AS moment FROM payments p
    UNION ALL SELECT pay.order_id, 0 - r.amount, r.refunded FROM refunds r JOIN payments pay ON pay.id = r.payment_id;
CREATE VIEW order_balances AS
    SELECT f.order_id, sum(f.amount) AS paid, t.total, t.total - sum(f.amount) AS open_amount
    FROM money_flow f JOIN order_totals t ON t.order_id = f.order_id GROUP BY f.order_id, t.total;
CREATE VIEW payment_overview AS
    SELECT y.id, m.name AS method, y.amount, y.amount * m.fee AS fee FROM payments y JOIN payment_methods m ON m.id = y.method_id;
CREATE VIEW customer_spending AS
    SELECT c.id, c.last_name, q.spent
    FROM customers c JOIN (SELECT o.customer_id, sum(t.total) AS spent FROM orders o JOIN order_totals t ON t.order_id = o.id
        GROUP BY o.customer_id) q ON q.customer_id = c.id;
CREATE VIEW top_customers AS
    SELECT s.last_name, s.spent FROM customer_spending s WHERE s.spent > 500 ORDER BY s.spent DESC;
CREATE VIEW latest_orders AS
    SELECT o.id, o.customer_id, o.ordered
    FROM orders o JOIN (SELECT customer_id, max(ordered) AS last_time FROM orders GROUP BY customer_id) lo
        ON lo.customer_id = o.customer_id AND lo.last_time = o.ordered;
CREATE VIEW customers_with_orders AS
    SELECT c.id, c.email FROM customers c WHERE EXISTS (SELECT o.id FROM orders o WHERE o.customer_id = c.id);
CREATE VIEW customers_without_orders AS
    SELECT c.id, c.email FROM customers c WHERE c.id NOT IN (SELECT o.customer_id FROM orders o);
CREATE VIEW wished_products AS
    SELECT p.id, p.name FROM products p WHERE p.id IN (SELECT w.product_id FROM wish_items w);
CREATE VIEW wish_lists AS
    SELECT c.email, p.name AS product, w.added
    FROM wish_items w JOIN customers c ON c.id = w.customer_id JOIN products p ON p.id = w.product_id;
CREATE VIEW product_details AS
    SELECT p.name AS product, a.name AS attribute, v.content, a.unit
    FROM products p JOIN product_attributes v ON v.product_id = p.id JOIN attributes a ON a.id = v.attribute_id;
CREATE VIEW product_labels AS
    SELECT p.sku, t.label FROM products p JOIN product_tags x ON x.product_id = p.id JOIN tags t ON t.id = x.tag_id;
CREATE VIEW stock_levels AS
    SELECT sk.product_id, sum(sk.quantity) AS on_hand, min(sk.counted) AS oldest_count FROM stock sk GROUP BY sk.product_id;
CREATE VIEW stock_places AS
    SELECT p.sku, w.name AS warehouse, z.code AS zone, b.code AS bin, sk.quantity
    FROM stock sk JOIN bins b ON b.id = sk.bin_id JOIN zones z ON z.id = b.zone_id JOIN warehouses w ON w.id = z.warehouse_id
        JOIN products p ON p.id = sk.product_id;
CREATE VIEW bin_load AS
    SELECT b.id, b.code, b.capacity, b.capacity - sum(sk.quantity) AS free_places
    FROM bins b LEFT JOIN stock sk ON sk.bin_id = b.id GROUP BY b.id, b.code, b.capacity;
CREATE VIEW warehouse_values AS
    SELECT w.id, w.name, sum(sk.quantity * p.cost) AS worth
    FROM warehouses w JOIN zones z ON z.warehouse_id = w.id JOIN bins b ON b.zone_id = z.id JOIN stock sk ON sk.bin_id = b.id
        JOIN products p ON p.id = sk.product_id
    GROUP BY w.id, w.name;
CREATE VIEW movements_out AS
    SELECT mv.id, mv.product_id, mv.from_bin_id AS bin_id, mv.quantity FROM movements mv;
CREATE VIEW movements_both AS
    SELECT mv.product_id, mv.from_bin_id AS bin_id, 0 - mv.quantity AS change_by, mv.moved FROM movements mv WHERE mv.from_bin_id IS NOT NULL
    UNION ALL SELECT mv.product_id, mv.to_bin_id, mv.quantity, mv.moved FROM movements mv WHERE mv.to_bin_id IS NOT NULL;
CREATE VIEW bin_changes AS
    SELECT b.code, v.product_id, sum(v.change_by) AS change_by
    FROM movements_both v JOIN bins b ON b.id = v.bin_id GROUP BY b.code, v.product_id;
CREATE VIEW reorder_list AS
    SELECT p.id, p.sku, l.on_hand, sp.price, su.name AS supplier
    FROM products p LEFT JOIN stock_levels l ON l.product_id = p.id JOIN supplier_products sp ON sp.product_id = p.id
        JOIN suppliers su ON su.id = sp.supplier_id
    WHERE l.on_hand < 10 OR l.on_hand IS NULL;
CREATE VIEW cheapest_offers AS
    SELECT sp.product_id, min(sp.price) AS price FROM supplier_products sp GROUP BY sp.product_id HAVING min(sp.lead_days) < 30;
CREATE VIEW purchase_totals AS
    SELECT pl.purchase_order_id, sum(pl.quantity * pl.unit_price) AS total FROM purchase_lines pl GROUP BY pl.purchase_order_id;
CREATE VIEW purchase_overview AS
    SELECT po.id, su.name AS supplier, w.name AS warehouse, t.total, po.expected
    FROM purchase_orders po JOIN suppliers su ON su.id = po.supplier_id JOIN warehouses w ON w.id = po.warehouse_id
        LEFT JOIN purchase_totals t ON t.purchase_order_id = po.id;
CREATE VIEW receipts_of_lines AS
    SELECT l.purchase_order_id, l.line_no, l.quantity, r.quantity AS received
    FROM purchase_lines l LEFT JOIN receipts r ON r.purchase_order_id = l.purchase_order_id AND r.line_no = l.line_no;
CREATE VIEW shipment_times AS
    SELECT sh.id, sh.order_id, k.name AS carrier, o.ordered, sh.sent, sh.delivered
    FROM shipments sh JOIN carriers k ON k.id = sh.carrier_id JOIN orders o ON o.id = sh.order_id;
CREATE VIEW employee_managers AS
    SELECT e.id, e.last_name, m.last_name AS manager FROM employees e LEFT JOIN employees m ON m.id = e.manager_id;
CREATE VIEW warehouse_managers AS
    SELECT w.name, e.first_name, e.last_name, a.city
    FROM warehouses w JOIN employees e ON e.id = w.manager_id JOIN addresses a ON a.id = w.address_id;
CREATE VIEW price_history AS
    SELECT p.sku, pc.old_price, pc.new_price, pc.new_price - pc.old_price AS difference,
        CASE WHEN pc.new_price > pc.old_price THEN 'up' ELSE 'down' END AS direction
    FROM price_changes pc JOIN products p ON p.id = pc.product_id;
CREATE VIEW order_moments AS
    SELECT o.id, CASE st.name WHEN 'open' THEN o.ordered ELSE i.issued END AS moment
    FROM orders o JOIN order_status st ON st.id = o.status_id LEFT JOIN invoices i ON i.order_id = o.id;
CREATE VIEW city_sizes AS
    SELECT z.city, z.places
    FROM (SELECT ad.city, count(*) AS places FROM (SELECT a.city FROM addresses a WHERE a.region_id IS NOT NULL) ad GROUP BY ad.city) z
    WHERE z.places > 1;
