SELECT DISTINCT [name] FROM customers
UNION
SELECT title FROM products
UNION ALL
SELECT 'unknown'
