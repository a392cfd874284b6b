SELECT p.title, SUM(l.quantity) AS sold, IFNULL(MAX(l.unit_price), 0) AS dearest
FROM order_lines l INNER JOIN products p ON p.product_id = l.product_id
WHERE (l.quantity BETWEEN 1 AND 100)
GROUP BY p.title
HAVING SUM(l.quantity) > 5
