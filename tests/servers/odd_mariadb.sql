-- Users, and names, keys and objects that are less usual.

CREATE DATABASE `odd one`;
CREATE DATABASE secret;
CREATE TABLE secret.plans (id integer);
CREATE USER reader@'127.0.0.1' IDENTIFIED BY 'secret of reader';
CREATE USER reader@localhost IDENTIFIED BY 'secret of reader';
GRANT SELECT, SHOW VIEW, EXECUTE ON shop.* TO reader@'127.0.0.1', reader@localhost;
GRANT SELECT, SHOW VIEW, EXECUTE ON `odd one`.* TO reader@'127.0.0.1';
CREATE USER guest@'127.0.0.1';
GRANT SELECT ON shop.* TO guest@'127.0.0.1';

USE `odd one`;
CREATE TABLE `t ``x`` é` (Id integer PRIMARY KEY, word varchar(20), kind enum('a', 'b'), amount decimal(10,2) unsigned,
    CONSTRAINT pair UNIQUE (word, Id), INDEX plain (amount));
CREATE TABLE child (id integer PRIMARY KEY, a integer, b varchar(20),
    CONSTRAINT to_t FOREIGN KEY (b, a) REFERENCES `t ``x`` é` (word, Id));
CREATE VIEW in_view AS SELECT a FROM child;
CREATE FUNCTION twice(a integer, b integer) RETURNS integer DETERMINISTIC RETURN a * b;
CREATE PROCEDURE nothing_done() SELECT 1;
