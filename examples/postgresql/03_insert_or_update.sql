INSERT INTO orders (order_id, customer_id)
SELECT n.order_id, n.customer_id
FROM new_orders n
ON CONFLICT (order_id) DO UPDATE SET customer_id = n.customer_id
RETURNING order_id
