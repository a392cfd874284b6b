SELECT order_id, ROW_NUMBER() OVER (PARTITION BY customer_id ORDER BY ordered_on) AS place
FROM orders
