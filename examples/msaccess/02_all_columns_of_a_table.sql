SELECT DISTINCTROW products.*, Left$(products.title, 20) AS short_title
FROM products LEFT JOIN order_lines ON products.product_id = order_lines.product_id
WHERE order_lines.order_id IN (SELECT orders.order_id FROM orders WHERE Year(orders.ordered_on) = 2024)
UNION ALL SELECT products.*, "-" FROM products
