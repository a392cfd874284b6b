SELECT UPPER(c.name) AS shown,
       CASE WHEN o.shipped_on IS NULL THEN 'open' ELSE 'shipped' END AS state,
       DATEDIFF(day, o.ordered_on, GETDATE()) AS days,
       dbo.Discount(c.customer_id) AS discount
FROM dbo.orders o LEFT OUTER JOIN dbo.customers c ON c.customer_id = o.customer_id
ORDER BY days
