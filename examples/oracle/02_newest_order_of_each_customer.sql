SELECT x.customer_id, x.order_id
  FROM (SELECT o.customer_id, o.order_id,
               ROW_NUMBER() OVER (PARTITION BY o.customer_id ORDER BY o.ordered_on DESC) AS place
          FROM orders o) x
 WHERE x.place = 1
