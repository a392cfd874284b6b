SELECT o.[order_id], [c.name] & ", " & c.city AS label,
       [l.quantity] * [l.unit_price] AS amount, IIf([amount] > 100, "large", "small") AS size_class
FROM (orders AS o INNER JOIN customers AS c ON o.customer_id = c.customer_id)
INNER JOIN order_lines AS l ON o.order_id = l.order_id
WHERE (((o.shipped_on) Is Null) AND ((o.ordered_on) Between #1/1/2024# And #12/31/2024#))
ORDER BY c.city DESC;
