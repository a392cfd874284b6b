-- A shop and its warehouses: 40 tables, in SQL that PostgreSQL and MariaDB take alike.

CREATE TABLE currencies (code char(3) NOT NULL, name varchar(40) NOT NULL, rate decimal(12,6) NOT NULL, PRIMARY KEY (code));
CREATE TABLE countries (code char(2) NOT NULL, name varchar(60) NOT NULL, currency_code char(3), PRIMARY KEY (code),
    CONSTRAINT countries_currency FOREIGN KEY (currency_code) REFERENCES currencies (code));
CREATE TABLE regions (id integer NOT NULL, country_code char(2) NOT NULL, name varchar(60), PRIMARY KEY (id),
    CONSTRAINT regions_country FOREIGN KEY (country_code) REFERENCES countries (code));
CREATE TABLE addresses (id integer NOT NULL, street varchar(80), city varchar(60), postcode varchar(10), region_id integer, PRIMARY KEY (id),
    CONSTRAINT addresses_region FOREIGN KEY (region_id) REFERENCES regions (id));
CREATE TABLE customer_groups (id integer NOT NULL, name varchar(40), discount decimal(5,2), PRIMARY KEY (id));
CREATE TABLE employees (id integer NOT NULL, first_name varchar(40), last_name varchar(40), department varchar(30), manager_id integer, PRIMARY KEY (id),
    CONSTRAINT employees_manager FOREIGN KEY (manager_id) REFERENCES employees (id));
CREATE TABLE customers (id integer NOT NULL, group_id integer, first_name varchar(40), last_name varchar(40), email varchar(80) NOT NULL, phone varchar(30),
    address_id integer, born date, created timestamp NULL, PRIMARY KEY (id), CONSTRAINT customers_email UNIQUE (email),
    CONSTRAINT customers_group FOREIGN KEY (group_id) REFERENCES customer_groups (id),
    CONSTRAINT customers_address FOREIGN KEY (address_id) REFERENCES addresses (id));
CREATE TABLE customer_notes (id integer NOT NULL, customer_id integer NOT NULL, author_id integer, note text, written timestamp NULL, PRIMARY KEY (id),
    CONSTRAINT notes_customer FOREIGN KEY (customer_id) REFERENCES customers (id),
    CONSTRAINT notes_author FOREIGN KEY (author_id) REFERENCES employees (id));
CREATE TABLE brands (id integer NOT NULL, name varchar(40), country_code char(2), PRIMARY KEY (id),
    CONSTRAINT brands_country FOREIGN KEY (country_code) REFERENCES countries (code));
CREATE TABLE categories (id integer NOT NULL, parent_id integer, name varchar(40), PRIMARY KEY (id),
    CONSTRAINT categories_parent FOREIGN KEY (parent_id) REFERENCES categories (id));
CREATE TABLE taxes (id integer NOT NULL, name varchar(30), rate decimal(6,4), PRIMARY KEY (id));
CREATE TABLE products (id integer NOT NULL, brand_id integer, category_id integer, tax_id integer, sku varchar(20) NOT NULL, name varchar(80), price decimal(10,2),
    cost decimal(10,2), weight decimal(8,3), active boolean, PRIMARY KEY (id), CONSTRAINT products_sku UNIQUE (sku),
    CONSTRAINT products_brand FOREIGN KEY (brand_id) REFERENCES brands (id),
    CONSTRAINT products_category FOREIGN KEY (category_id) REFERENCES categories (id),
    CONSTRAINT products_tax FOREIGN KEY (tax_id) REFERENCES taxes (id));
CREATE TABLE product_images (id integer NOT NULL, product_id integer NOT NULL, url varchar(200), place smallint, PRIMARY KEY (id),
    CONSTRAINT images_product FOREIGN KEY (product_id) REFERENCES products (id));
CREATE TABLE attributes (id integer NOT NULL, name varchar(40), unit varchar(10), PRIMARY KEY (id));
CREATE TABLE product_attributes (product_id integer NOT NULL, attribute_id integer NOT NULL, content varchar(80), PRIMARY KEY (product_id, attribute_id),
    CONSTRAINT pa_product FOREIGN KEY (product_id) REFERENCES products (id),
    CONSTRAINT pa_attribute FOREIGN KEY (attribute_id) REFERENCES attributes (id));
CREATE TABLE tags (id integer NOT NULL, label varchar(30), PRIMARY KEY (id));
CREATE TABLE product_tags (product_id integer NOT NULL, tag_id integer NOT NULL, PRIMARY KEY (product_id, tag_id),
    CONSTRAINT pt_product FOREIGN KEY (product_id) REFERENCES products (id),
    CONSTRAINT pt_tag FOREIGN KEY (tag_id) REFERENCES tags (id));
CREATE TABLE reviews (id integer NOT NULL, product_id integer NOT NULL, customer_id integer, rating smallint, body text, written date, PRIMARY KEY (id),
    CONSTRAINT reviews_product FOREIGN KEY (product_id) REFERENCES products (id),
    CONSTRAINT reviews_customer FOREIGN KEY (customer_id) REFERENCES customers (id));
CREATE TABLE order_status (id integer NOT NULL, name varchar(20), PRIMARY KEY (id));
CREATE TABLE coupons (id integer NOT NULL, code varchar(20), share decimal(5,2), valid_from date, valid_to date, PRIMARY KEY (id), CONSTRAINT coupons_code UNIQUE (code));
CREATE TABLE orders (id integer NOT NULL, customer_id integer NOT NULL, status_id integer, ordered timestamp NULL, shipping_address_id integer, coupon_id integer,
    employee_id integer, PRIMARY KEY (id),
    CONSTRAINT orders_customer FOREIGN KEY (customer_id) REFERENCES customers (id),
    CONSTRAINT orders_status FOREIGN KEY (status_id) REFERENCES order_status (id),
    CONSTRAINT orders_address FOREIGN KEY (shipping_address_id) REFERENCES addresses (id),
    CONSTRAINT orders_coupon FOREIGN KEY (coupon_id) REFERENCES coupons (id),
    CONSTRAINT orders_employee FOREIGN KEY (employee_id) REFERENCES employees (id));
CREATE TABLE order_lines (order_id integer NOT NULL, line_no integer NOT NULL, product_id integer NOT NULL, quantity integer, unit_price decimal(10,2),
    discount decimal(10,2), PRIMARY KEY (order_id, line_no),
    CONSTRAINT lines_order FOREIGN KEY (order_id) REFERENCES orders (id),
    CONSTRAINT lines_product FOREIGN KEY (product_id) REFERENCES products (id));
CREATE TABLE payment_methods (id integer NOT NULL, name varchar(30), fee decimal(6,4), PRIMARY KEY (id));
CREATE TABLE payments (id integer NOT NULL, order_id integer NOT NULL, method_id integer, amount decimal(10,2), paid timestamp NULL, PRIMARY KEY (id),
    CONSTRAINT payments_order FOREIGN KEY (order_id) REFERENCES orders (id),
    CONSTRAINT payments_method FOREIGN KEY (method_id) REFERENCES payment_methods (id));
CREATE TABLE refunds (id integer NOT NULL, payment_id integer NOT NULL, amount decimal(10,2), reason varchar(200), refunded timestamp NULL, PRIMARY KEY (id),
    CONSTRAINT refunds_payment FOREIGN KEY (payment_id) REFERENCES payments (id));
CREATE TABLE invoices (id integer NOT NULL, order_id integer NOT NULL, number_text varchar(20), issued timestamp NULL, due date, PRIMARY KEY (id),
    CONSTRAINT invoices_order FOREIGN KEY (order_id) REFERENCES orders (id));
CREATE TABLE wish_items (customer_id integer NOT NULL, product_id integer NOT NULL, added date, PRIMARY KEY (customer_id, product_id),
    CONSTRAINT wish_customer FOREIGN KEY (customer_id) REFERENCES customers (id),
    CONSTRAINT wish_product FOREIGN KEY (product_id) REFERENCES products (id));
CREATE TABLE price_changes (id integer NOT NULL, product_id integer NOT NULL, old_price decimal(10,2), new_price decimal(10,2), changed date, PRIMARY KEY (id),
    CONSTRAINT changes_product FOREIGN KEY (product_id) REFERENCES products (id));
CREATE TABLE warehouses (id integer NOT NULL, name varchar(40), address_id integer, manager_id integer, PRIMARY KEY (id),
    CONSTRAINT warehouses_address FOREIGN KEY (address_id) REFERENCES addresses (id),
    CONSTRAINT warehouses_manager FOREIGN KEY (manager_id) REFERENCES employees (id));
CREATE TABLE zones (id integer NOT NULL, warehouse_id integer NOT NULL, code varchar(10), cooled boolean, PRIMARY KEY (id),
    CONSTRAINT zones_warehouse FOREIGN KEY (warehouse_id) REFERENCES warehouses (id));
CREATE TABLE bins (id integer NOT NULL, zone_id integer NOT NULL, code varchar(10), capacity integer, PRIMARY KEY (id),
    CONSTRAINT bins_zone FOREIGN KEY (zone_id) REFERENCES zones (id));
CREATE TABLE stock (bin_id integer NOT NULL, product_id integer NOT NULL, quantity integer, counted date, PRIMARY KEY (bin_id, product_id),
    CONSTRAINT stock_bin FOREIGN KEY (bin_id) REFERENCES bins (id),
    CONSTRAINT stock_product FOREIGN KEY (product_id) REFERENCES products (id));
CREATE TABLE movements (id integer NOT NULL, product_id integer NOT NULL, from_bin_id integer, to_bin_id integer, quantity integer, moved timestamp NULL,
    employee_id integer, PRIMARY KEY (id),
    CONSTRAINT movements_product FOREIGN KEY (product_id) REFERENCES products (id),
    CONSTRAINT movements_from FOREIGN KEY (from_bin_id) REFERENCES bins (id),
    CONSTRAINT movements_to FOREIGN KEY (to_bin_id) REFERENCES bins (id),
    CONSTRAINT movements_employee FOREIGN KEY (employee_id) REFERENCES employees (id));
CREATE TABLE suppliers (id integer NOT NULL, name varchar(60), address_id integer, currency_code char(3), rating smallint, PRIMARY KEY (id),
    CONSTRAINT suppliers_address FOREIGN KEY (address_id) REFERENCES addresses (id),
    CONSTRAINT suppliers_currency FOREIGN KEY (currency_code) REFERENCES currencies (code));
CREATE TABLE supplier_products (supplier_id integer NOT NULL, product_id integer NOT NULL, supplier_sku varchar(30), price decimal(10,2), lead_days integer,
    PRIMARY KEY (supplier_id, product_id),
    CONSTRAINT sp_supplier FOREIGN KEY (supplier_id) REFERENCES suppliers (id),
    CONSTRAINT sp_product FOREIGN KEY (product_id) REFERENCES products (id));
CREATE TABLE purchase_orders (id integer NOT NULL, supplier_id integer NOT NULL, warehouse_id integer, ordered date, expected date, PRIMARY KEY (id),
    CONSTRAINT po_supplier FOREIGN KEY (supplier_id) REFERENCES suppliers (id),
    CONSTRAINT po_warehouse FOREIGN KEY (warehouse_id) REFERENCES warehouses (id));
CREATE TABLE purchase_lines (purchase_order_id integer NOT NULL, line_no integer NOT NULL, product_id integer, quantity integer, unit_price decimal(10,2),
    PRIMARY KEY (purchase_order_id, line_no),
    CONSTRAINT pl_order FOREIGN KEY (purchase_order_id) REFERENCES purchase_orders (id),
    CONSTRAINT pl_product FOREIGN KEY (product_id) REFERENCES products (id));
CREATE TABLE receipts (id integer NOT NULL, purchase_order_id integer NOT NULL, line_no integer NOT NULL, quantity integer, received date, employee_id integer,
    PRIMARY KEY (id),
    CONSTRAINT receipts_line FOREIGN KEY (purchase_order_id, line_no) REFERENCES purchase_lines (purchase_order_id, line_no),
    CONSTRAINT receipts_employee FOREIGN KEY (employee_id) REFERENCES employees (id));
CREATE TABLE carriers (id integer NOT NULL, name varchar(40), phone varchar(30), PRIMARY KEY (id));
CREATE TABLE shipments (id integer NOT NULL, order_id integer NOT NULL, carrier_id integer, warehouse_id integer, sent timestamp NULL, delivered timestamp NULL,
    tracking varchar(40), PRIMARY KEY (id),
    CONSTRAINT shipments_order FOREIGN KEY (order_id) REFERENCES orders (id),
    CONSTRAINT shipments_carrier FOREIGN KEY (carrier_id) REFERENCES carriers (id),
    CONSTRAINT shipments_warehouse FOREIGN KEY (warehouse_id) REFERENCES warehouses (id));
