-- Names, keys and objects that are less usual.

CREATE SCHEMA "Odd One";
GRANT USAGE ON SCHEMA "Odd One" TO reader;
SET search_path = "Odd One";

CREATE TABLE "T ""x"" é" ("Id" integer, gone text, amount numeric(10,2), words varchar(20)[], at timestamp(3),
    CONSTRAINT "T key" PRIMARY KEY ("Id", at));
ALTER TABLE "T ""x"" é" DROP COLUMN gone;
CREATE UNIQUE INDEX whole ON "T ""x"" é" (amount) INCLUDE (words);
CREATE UNIQUE INDEX partial ON "T ""x"" é" (amount) WHERE amount > 0;
CREATE UNIQUE INDEX expression ON "T ""x"" é" (abs(amount));
CREATE TABLE child (id integer PRIMARY KEY, a integer, b timestamp(3),
    CONSTRAINT "to_T" FOREIGN KEY (b, a) REFERENCES "T ""x"" é" (at, "Id"));
CREATE TABLE nothing ();
CREATE TABLE parts (id integer, day date) PARTITION BY RANGE (day);
CREATE TABLE parts_2026 PARTITION OF parts FOR VALUES FROM ('2026-01-01') TO ('2027-01-01');
CREATE VIEW in_view AS SELECT a FROM child;
CREATE MATERIALIZED VIEW kept AS SELECT label FROM shop.tags;
CREATE FUNCTION twice(a integer) RETURNS integer LANGUAGE sql AS 'SELECT a * 2';
CREATE FUNCTION twice(a integer, b integer) RETURNS integer LANGUAGE sql AS 'SELECT a * b';
CREATE PROCEDURE nothing_done() LANGUAGE sql AS 'SELECT 1';
