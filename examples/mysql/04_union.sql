SELECT name, 'customer' AS kind FROM customers WHERE city = 'Gent'
UNION ALL
SELECT title, 'product' AS kind FROM products WHERE product_id IN (SELECT product_id FROM order_lines)
