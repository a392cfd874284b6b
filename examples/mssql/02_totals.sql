SELECT TOP 10 p.title, SUM(l.quantity * l.unit_price) AS revenue, COUNT(*) AS sold
FROM order_lines AS l INNER JOIN products AS p ON p.product_id = l.product_id
WHERE l.quantity BETWEEN 1 AND 100
GROUP BY p.title
HAVING SUM(l.quantity) > 5
ORDER BY p.title DESC
