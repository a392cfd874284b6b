SELECT o.order_id, c.name AS customer, city, shipped_on
FROM orders o
JOIN customers c ON c.customer_id = o.customer_id
WHERE o.shipped_on IS NULL AND c.city IN ('Utrecht', 'Gent')
