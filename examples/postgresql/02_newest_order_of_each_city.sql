SELECT DISTINCT ON (c.city) c.city, c.name || ', ' || c.city AS shown, o.ordered_on
FROM customers c LEFT JOIN orders o ON o.customer_id = c.customer_id
WHERE o.ordered_on > NOW() - INTERVAL '1 year 6 months'
ORDER BY c.city, o.ordered_on DESC
