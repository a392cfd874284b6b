SELECT o.order_id, c.name AS customer, SUM(l.quantity * l.unit_price) AS revenue
FROM orders AS o
JOIN public.customers c ON c.customer_id = o.customer_id
JOIN order_lines l ON l.order_id = o.order_id
WHERE o.shipped_on >= DATE '2024-01-31' AND c.city NOT IN ('Utrecht', 'Gent')
GROUP BY o.order_id, c.name
HAVING SUM(l.quantity) > 5
ORDER BY revenue DESC
LIMIT 10
