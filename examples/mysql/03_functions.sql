SELECT DISTINCTROW CONCAT(c.name, ', ', c.city) AS shown,
       CASE WHEN o.shipped_on IS NULL THEN 'open' ELSE DATE_FORMAT(o.shipped_on, '%Y') END AS state,
       `discount`(c.customer_id) AS discount
FROM shop.orders o JOIN shop.customers c ON c.customer_id = o.customer_id
