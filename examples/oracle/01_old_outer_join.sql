SELECT o.order_id, NVL(c.name, 'nobody') AS customer, TO_CHAR(o.ordered_on, 'YYYY-MM-DD') ordered
  FROM orders o, customers c
 WHERE o.customer_id = c.customer_id (+)
   AND o.shipped_on IS NULL
   AND EXTRACT(YEAR FROM o.ordered_on) = 2024
 ORDER BY customer
