// Where result columns come from and what depends on what, against expectations made by hand.

#include "host/lineage.h"

#include <gtest/gtest.h>

namespace zr::host {
namespace {

using Texts = std::vector<std::string>;

class Traced : public testing::Test {
 protected:
    explicit Traced(DBTypes kind = DB_MSSQL) : database(kind) {
        addTable(u"orders", {u"id", u"customer_id", u"total"});
        addTable(u"customers", {u"id", u"name", u"city"});
        addTable(u"secrets", {});
    }

    Table& addTable(const CString& name, const std::vector<CString>& columns) {
        auto table = std::make_unique<Table>(database.GetDBType());
        setNames(*table, name);
        for (const CString& column : columns) {
            auto field = std::make_unique<Field>();
            setNames(*field, column);
            table->addField(std::move(field));
        }
        return database.addTable(std::move(table));
    }

    void addQuery(const CString& name, const CString& sql) {
        auto query = std::make_unique<Query>(database.GetDBType());
        setNames(*query, name);
        query->SetSQL(sql);
        database.addQuery(std::move(query));
    }

    Lineage& lineage() {
        if (!lineage_)
            lineage_ = std::make_unique<Lineage>(
                database, [this](const CZRQueryInfo& query) { return query.GetSrcName() != notWhole; });
        return *lineage_;
    }

    const CZRQueryInfo& query(const CString& name) {
        lineage();
        return *database.FindQueryBySrcName(name);
    }

    static std::string text(const ColumnOrigins& origins) {
        std::string all;
        for (const ColumnOrigin& origin : origins) {
            if (!all.empty()) all += ", ";
            all += (origin.source.IsEmpty() ? "?" : origin.source.toUtf8()) + "." + origin.column.toUtf8();
            if (!origin.isKnown()) all += " (" + std::string(explain(origin.why)) + ")";
        }
        return all;
    }

    // "name: origins" of each result column.
    Texts columns(const CString& name) {
        Texts all;
        for (const ResultColumn& column : lineage().tracer().columnsOf(query(name)))
            all.push_back(column.name.toUtf8() + ": " + text(column.origins));
        return all;
    }

    Texts columnsOf(const CString& sql) {
        addQuery(u"q", sql);
        return columns(u"q");
    }

    Texts uses(const CString& name) {
        Texts all;
        for (const ColumnUse& use : lineage().tracer().usesOf(query(name)))
            all.push_back(std::string(use.clause) + ": " + text(use.steps));
        return all;
    }

    // "distance name: columns | clauses | what it reads from" of each query.
    Texts impact(const CString& target) {
        const auto found = lineage().find(target);
        if (!found) return {"not found"};
        const Impact told = lineage().impactOf(*found);
        Texts all;
        for (const DependentQuery& each : told.queries) {
            std::string line = std::to_string(each.distance) + " " + each.query->GetSrcName().toUtf8() + ":";
            for (const CString& column : each.columns) line += " " + column.toUtf8();
            line += " |";
            for (const auto& use : each.uses) line += " " + std::string(use.clause);
            line += " |";
            for (const CZRSourceInfo* object : each.reads) line += " " + object->GetSrcName().toUtf8();
            all.push_back(line);
        }
        for (const UncertainQuery& each : told.uncertain)
            all.push_back("perhaps " + each.query->GetSrcName().toUtf8() + ": " +
                          std::string(explain(each.open.why)));
        for (const DependentKey& key : told.keys)
            all.push_back((key.isForeign ? "foreign key " : "index ") + key.key->GetSrcName().toUtf8());
        return all;
    }

    Database database;
    CString notWhole;

 private:
    std::unique_ptr<Lineage> lineage_;
};

class LineageOfColumns : public Traced {};

TEST_F(LineageOfColumns, FollowsAliasesAndExpressions) {
    EXPECT_EQ(columnsOf(u"SELECT o.id AS number, o.total * 2 + c.id AS twice, 'x' AS fixed FROM orders o "
                        u"INNER JOIN customers c ON c.id = o.customer_id"),
              (Texts{"number: orders.id", "twice: orders.total, customers.id", "fixed: "}));
}

TEST_F(LineageOfColumns, FollowsAColumnWithoutAQualifierToTheOnlySourceThatHasIt) {
    EXPECT_EQ(columnsOf(u"SELECT name, total FROM orders o INNER JOIN customers c ON c.id = o.customer_id"),
              (Texts{"name: customers.name", "total: orders.total"}));
}

TEST_F(LineageOfColumns, SpreadsStars) {
    EXPECT_EQ(
        columnsOf(u"SELECT c.*, total FROM orders o, customers c"),
        (Texts{"id: customers.id", "name: customers.name", "city: customers.city", "total: orders.total"}));
}

TEST_F(LineageOfColumns, GoesThroughQueriesOnQueries) {
    addQuery(u"top", u"SELECT m.sum_of AS s, m.* FROM middle m");
    addQuery(u"middle", u"SELECT b.total + b.id AS sum_of FROM base b");
    addQuery(u"base", u"SELECT * FROM orders");
    EXPECT_EQ(columns(u"top"), (Texts{"s: orders.total, orders.id", "sum_of: orders.total, orders.id"}));
    const auto& first = lineage().tracer().columnsOf(query(u"top")).front();
    EXPECT_EQ(text(first.steps), "middle.sum_of");
}

TEST_F(LineageOfColumns, GoesThroughNestedQueries) {
    EXPECT_EQ(columnsOf(u"SELECT d.n, d.t FROM (SELECT name AS n, city AS t FROM customers) d"),
              (Texts{"n: customers.name", "t: customers.city"}));
}

TEST_F(LineageOfColumns, LetsANestedQuerySeeTheSourcesAroundIt) {
    addQuery(u"q",
             u"SELECT o.id FROM orders o WHERE o.id IN (SELECT c.id FROM customers c WHERE c.id = "
             u"o.customer_id AND total > 5)");
    EXPECT_EQ(uses(u"q"), (Texts{"where: orders.id", "sub-query: customers.id", "where: customers.id",
                                 "where: orders.customer_id", "where: orders.total"}));
}

TEST_F(LineageOfColumns, TellsWhereTheAnalysisEndsAtANestedQuery) {
    addQuery(u"q", u"SELECT o.id, (SELECT c.name FROM customers c) AS most FROM orders o");
    addQuery(u"top", u"SELECT id FROM q");
    EXPECT_EQ(columns(u"q"), Texts{});
    EXPECT_EQ(lineage().tracer().missingOf(query(u"q")), Unknown::PartOfAnalysis);
    EXPECT_EQ(columns(u"top"), (Texts{"id: q.id (a nested query stands in the first clause, and there the "
                                      "analysis ends)"}));
}

TEST_F(LineageOfColumns, TakesAllBranchesOfAUnionPlaceByPlace) {
    EXPECT_EQ(columnsOf(u"SELECT id, total FROM orders UNION ALL SELECT id, city FROM customers"),
              (Texts{"id: orders.id, customers.id", "total: orders.total, customers.city"}));
}

TEST_F(LineageOfColumns, TellsWhyAColumnIsUnknown) {
    EXPECT_EQ(
        columnsOf(u"SELECT o.wrong, x.a, id, s.hidden, n.b, o.id FROM orders o, customers c, secrets s, "
                  u"nowhere n"),
        (Texts{"wrong: orders.wrong (there is no such column)",
               "a: x.a (no source of the query has that name)", "id: ?.id (several sources may have it)",
               "hidden: secrets.hidden (the project does not tell the columns of the table)",
               "b: nowhere.b (the project has no table or query of that name)", "id: orders.id"}));
}

TEST_F(LineageOfColumns, GivesAColumnThatNoneIsKnownToHaveToTheOneSourceThatIsOpen) {
    EXPECT_EQ(columnsOf(u"SELECT token FROM orders o, secrets s"),
              (Texts{"token: secrets.token (the project does not tell the columns of the table)"}));
}

TEST_F(LineageOfColumns, KnowsThatNoSourceHasAColumn) {
    EXPECT_EQ(columnsOf(u"SELECT token FROM orders o, customers c"),
              (Texts{"token: ?.token (no source of the query has it)"}));
}

TEST_F(LineageOfColumns, MarksWhatComesFromATextThatWasNotReadToItsEnd) {
    notWhole = u"base";
    addQuery(u"base", u"SELECT id FROM orders");
    addQuery(u"top", u"SELECT id, more FROM base");
    EXPECT_EQ(columns(u"top"), (Texts{"id: orders.id, base. (the text was not read to its end)",
                                      "more: base.more (the text was not read to its end)"}));
}

TEST_F(LineageOfColumns, GoesOnWithQueriesInARing) {
    addQuery(u"a", u"SELECT b.x, o.id FROM b, orders o");
    addQuery(u"b", u"SELECT a.x FROM a");
    addQuery(u"free", u"SELECT id FROM orders");
    EXPECT_EQ(columns(u"free"), (Texts{"id: orders.id"}));
    EXPECT_EQ(columns(u"a"), (Texts{"x: a.x (the query reads from itself)", "id: orders.id"}));
    ASSERT_EQ(lineage().rings().size(), 1u);
    EXPECT_EQ(lineage().rings()[0].size(), 2u);
    EXPECT_TRUE(lineage().isInRing(query(u"b")));
    EXPECT_FALSE(lineage().isInRing(query(u"free")));
}

TEST_F(LineageOfColumns, TellsWhatIsReadBesideTheResultColumns) {
    addQuery(
        u"q",
        u"SELECT c.name AS n FROM customers c INNER JOIN orders o ON o.customer_id = c.id WHERE o.total > "
        u"(SELECT total FROM orders) GROUP BY c.name ORDER BY n");
    EXPECT_EQ(uses(u"q"),
              (Texts{"from: orders.customer_id", "from: customers.id", "where: orders.total",
                     "group by: customers.name", "order by: customers.name", "sub-query: orders.total"}));
}

TEST_F(LineageOfColumns, NeedsNoMachineStackForNesting) {
    static constexpr int kDepth = 2000;
    CString sql(u"SELECT id FROM orders");
    for (int level = 0; level < kDepth; ++level) sql = u"SELECT id FROM (" + sql + u") d";
    EXPECT_EQ(columnsOf(sql), (Texts{"id: orders.id"}));
}

class LineageImpact : public Traced {
 protected:
    LineageImpact() {
        addQuery(u"base", u"SELECT id, total AS amount FROM orders");
        addQuery(u"named", u"SELECT c.name, b.amount FROM customers c INNER JOIN base b ON b.id = c.id");
        addQuery(u"filtered",
                 u"SELECT c.city FROM customers c INNER JOIN orders o ON o.id = c.id WHERE o.total > 5");
        addQuery(u"outer_one", u"SELECT city FROM filtered");
        addQuery(u"other", u"SELECT name FROM customers");
    }
};

TEST_F(LineageImpact, OfAColumnGoesThroughQueriesAndClauses) {
    EXPECT_EQ(impact(u"orders.total"), (Texts{"1 base: amount | |", "1 filtered: | where |",
                                              "2 named: amount | | base", "2 outer_one: | | filtered"}));
}

TEST_F(LineageImpact, OfATableIsAllThatReadsIt) {
    EXPECT_EQ(impact(u"ORDERS"), (Texts{"1 base: id amount | | orders", "1 filtered: | from where | orders",
                                        "2 named: amount | from | base", "2 outer_one: | | filtered"}));
}

TEST_F(LineageImpact, OfAQuerysColumn) {
    EXPECT_EQ(impact(u"base.amount"), (Texts{"1 named: amount | |"}));
    EXPECT_EQ(impact(u"base.id"), (Texts{"1 named: | from |"}));
    EXPECT_EQ(impact(u"other"), Texts{});
}

TEST_F(LineageImpact, OfWhatIsNotThere) {
    EXPECT_EQ(impact(u"orders.nothing"), (Texts{"not found"}));
    EXPECT_EQ(impact(u"nothing"), (Texts{"not found"}));
}

TEST_F(LineageImpact, NamesQueriesThatMayDependOnIt) {
    notWhole = u"cut";
    addQuery(u"cut", u"SELECT name FROM customers WHERE 1 = 1 AND oh ORDERS");
    addQuery(u"open", u"SELECT o.id AS x, total FROM orders o, secrets s, strange t");
    addTable(u"second", {u"id", u"total"});
    addQuery(u"either", u"SELECT total FROM orders, second");
    EXPECT_EQ(
        impact(u"orders.total"),
        (Texts{"1 base: amount | |", "1 filtered: | where |", "1 open: total | |", "2 named: amount | | base",
               "2 outer_one: | | filtered", "perhaps cut: the text was not read to its end",
               "perhaps either: several sources may have it"}));
}

TEST_F(LineageImpact, NamesKeys) {
    auto* orders = dynamic_cast<Table*>(database.FindTableBySrcName(u"orders"));
    auto* customers = dynamic_cast<Table*>(database.FindTableBySrcName(u"customers"));
    auto index = std::make_unique<Index>();
    setNames(*index, u"pk_customers");
    index->addColumn(u"id");
    customers->addIndex(std::move(index));
    auto key = std::make_unique<ForeignKey>();
    setNames(*key, u"fk_orders");
    key->ReferencedTable = u"customers";
    key->Columns.AddTail({u"customer_id", u"id"});
    orders->addForeignKey(std::move(key));
    EXPECT_EQ(impact(u"customers.city"), (Texts{"1 filtered: city | |", "2 outer_one: city | | filtered"}));
    const Texts ofId = impact(u"customers.id");
    EXPECT_EQ(Texts(ofId.end() - 2, ofId.end()), (Texts{"foreign key fk_orders", "index pk_customers"}));
    EXPECT_EQ(impact(u"orders.customer_id"), (Texts{"foreign key fk_orders"}));
}

TEST_F(LineageImpact, OfARingEnds) {
    addQuery(u"r1", u"SELECT r2.x, o.total AS y FROM r2, orders o");
    addQuery(u"r2", u"SELECT r1.x, r1.y FROM r1");
    const Texts all = impact(u"orders.total");
    EXPECT_EQ(std::count(all.begin(), all.end(), "1 r1: y | | r2"), 1);
}

TEST_F(LineageOfColumns, TakesANameThatIsAnAliasTooForTheColumn) {
    EXPECT_EQ(columnsOf(u"SELECT city AS city, name AS n, n AS k, orders.total AS total, total * 2 AS twice "
                        u"FROM customers, orders"),
              (Texts{"city: customers.city", "n: customers.name", "k: ?.n (no source of the query has it)",
                     "total: orders.total", "twice: orders.total"}));
}

TEST_F(LineageOfColumns, TakesANameOfAConditionForTheColumnOrElseForTheAlias) {
    addQuery(u"v",
             u"SELECT name AS city, total + 1 AS more FROM customers, orders WHERE city = 'x' GROUP BY more");
    EXPECT_EQ(uses(u"v"), (Texts{"where: customers.city", "group by: orders.total"}));
}

class LineageOfPostgres : public Traced {
 protected:
    LineageOfPostgres() : Traced(DB_POSTGRESQL) {}
};

TEST_F(LineageOfPostgres, SpreadsStars) {
    addQuery(u"v", u"SELECT * FROM customers");
    EXPECT_EQ(
        columnsOf(u"SELECT v.*, max(o.total) AS most FROM v JOIN orders o ON o.id = v.id GROUP BY v.id"),
        (Texts{"id: customers.id", "name: customers.name", "city: customers.city", "most: orders.total"}));
}

TEST_F(LineageOfPostgres, FollowsColumnsThatAreCast) {
    EXPECT_EQ(
        columnsOf(u"SELECT o.id::text AS a, total::numeric(10,2), min(o.customer_id::int::text) AS low, "
                  u"(o.id)::bigint AS b, x.c::text AS c FROM orders o, secrets x"),
        (Texts{"a: orders.id", "total: orders.total", "low: orders.customer_id", "b: orders.id",
               "c: secrets.c (the project does not tell the columns of the table)"}));
}

TEST_F(LineageOfPostgres, KnowsUsesOfColumnsThatAreCast) {
    addQuery(u"v", u"SELECT o.id FROM orders o WHERE o.total::text = 'x' AND (customer_id)::text = 'y'");
    EXPECT_EQ(uses(u"v"), (Texts{"where: orders.total", "where: orders.customer_id"}));
}

TEST_F(LineageOfPostgres, LeavesAColumnAloneThatIsNamedLikeACastOne) {
    addTable(u"marked", {u"id", u"idCAST"});
    EXPECT_EQ(columnsOf(u"SELECT m1.idCAST AS a, m1.id::text AS b FROM marked m1"),
              (Texts{"a: marked.idCAST", "b: marked.idCAST"}))
        << "which of the two is meant can't be told";
}

TEST_F(LineageOfPostgres, KnowsNoMarkOfACastInOtherDialects) {
    Database other(DB_MSSQL);
    auto query = std::make_unique<Query>(DB_MSSQL);
    setNames(*query, u"v");
    query->SetSQL(u"SELECT idCAST FROM orders");
    other.addQuery(std::move(query));
    Lineage traced(other);
    EXPECT_EQ(traced.tracer().columnsOf(*other.Queries.GetHead())[0].name, u"idCAST");
}

class LineageOfMysql : public Traced {
 protected:
    LineageOfMysql() : Traced(DB_MYSQL) {}
};

TEST_F(LineageOfMysql, FollowsQuotedNamesAndUnions) {
    EXPECT_EQ(
        columnsOf(u"SELECT `o`.`id` AS `n`, total FROM `orders` `o` UNION SELECT id, name FROM customers"),
        (Texts{"n: orders.id, customers.id", "total: orders.total, customers.name"}));
}

// Joins without ON, as MariaDB prints tables with commas between them.
TEST_F(LineageOfMysql, KnowsTheLastAliasOfJoinsWithoutConditions) {
    addTable(u"limits", {u"low"});
    EXPECT_EQ(columnsOf(u"select `o`.`id` AS `id`,`l`.`low` AS `low`,`city` AS `city`,`c`.`name` AS `name` "
                        u"from `s`.`orders` `o` join "
                        u"`s`.`customers` `c` join `s`.`limits` `l` where `o`.`id` = `l`.`low`"),
              (Texts{"id: orders.id", "low: limits.low", "city: customers.city", "name: customers.name"}));
    EXPECT_EQ(uses(u"q"), (Texts{"where: orders.id", "where: limits.low"}));
}

TEST_F(LineageOfMysql, KnowsTheLastAliasOfFourJoinedTables) {
    addTable(u"limits", {u"low"});
    addTable(u"tags", {u"label"});
    EXPECT_EQ(
        columnsOf(
            u"select o.id, c.name, l.low, x.label from orders o join customers c join limits l join tags x"),
        (Texts{"id: orders.id", "name: customers.name", "low: limits.low", "label: tags.label"}));
}

TEST_F(LineageOfMysql, TakesATableBehindJoinsForNoAlias) {
    addTable(u"limits", {u"low"});
    addTable(u"tags", {u"label"});
    EXPECT_EQ(columnsOf(u"select orders.id, low, label from orders join customers join limits join tags"),
              (Texts{"id: orders.id", "low: limits.low", "label: tags.label"}));
}

class LineageOfOracle : public Traced {
 protected:
    LineageOfOracle() : Traced(DB_ORACLE) {}
};

TEST_F(LineageOfOracle, TakesANameThatIsAnAliasTooForTheColumn) {
    EXPECT_EQ(
        columnsOf(u"SELECT city AS city, total * 2 AS twice, orders.total AS total FROM customers, orders"),
        (Texts{"city: customers.city", "twice: orders.total", "total: orders.total"}));
}

TEST_F(LineageOfOracle, FollowsNamesOfAnyCase) {
    EXPECT_EQ(columnsOf(u"SELECT O.ID N, C.NAME FROM ORDERS O, CUSTOMERS C WHERE O.CUSTOMER_ID = C.ID"),
              (Texts{"N: orders.id", "NAME: customers.name"}));
}

class LineageOfAccess : public Traced {
 protected:
    LineageOfAccess() : Traced(DB_MSACCESS) {}
};

TEST_F(LineageOfAccess, FollowsBracketedNames) {
    EXPECT_EQ(columnsOf(u"SELECT [orders].[id] AS n, customers.name FROM orders INNER JOIN customers ON "
                        u"orders.customer_id = customers.id"),
              (Texts{"n: orders.id", "name: customers.name"}));
}

}  // namespace
}  // namespace zr::host
