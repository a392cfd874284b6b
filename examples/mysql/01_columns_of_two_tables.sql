SELECT `o`.`order_id`, c.name AS `customer name`, c.*
FROM `orders` AS `o`
LEFT JOIN customers c ON c.customer_id = o.customer_id
WHERE o.shipped_on IS NOT NULL AND c.city NOT IN ('Utrecht', 'Gent')
ORDER BY o.order_id DESC
LIMIT 20, 10
