SELECT name, city
FROM customers
WHERE customer_id IN (SELECT customer_id FROM orders WHERE ordered_on > '2024-01-31')
