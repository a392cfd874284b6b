#!/usr/bin/env python3
"""The report in a browser: report_test.py ZRSQL FOLDER; pictures go into the folder.

Ends with status 77 where Chromium is not installed.
"""

import os
import sqlite3
import subprocess
import sys
import tempfile
import time
import unittest

import webdriver

LARGE = 2000  # queries that still have to be usable
PATIENCE = 20  # seconds for the large report to open; it takes a fraction of that

zrsql = ""
pictures = ""


def run(*words):
    done = subprocess.run([zrsql, *words], capture_output=True, text=True, check=False)
    if done.returncode != 0:
        raise RuntimeError(f"zrsql {' '.join(words)}: {done.stderr}")


def make_shop(folder):
    project = os.path.join(folder, "shop.json")
    run("project", "new", project, "-d", "mssql")
    run("project", "add-table", project, "customers", "id:int", "name:varchar(50)", "city:varchar(50)")
    run("project", "add-table", project, "orders", "id:int", "customer_id:int", "total:decimal(10,2)")
    run("project", "add-table", project, "a_table_with_quite_a_long_name_that_goes_on", "id:int")
    queries = {
        "named_orders": "SELECT o.id, c.name AS customer, o.total * 1.2 AS gross\n"
        "FROM orders o JOIN customers c ON c.id = o.customer_id\nWHERE o.total > 10 AND c.city <> '<b>&'",
        "large": "SELECT n.customer, n.gross FROM named_orders n WHERE n.gross > 1000 ORDER BY n.gross",
        "by_city": "SELECT c.city, COUNT(*) AS orders_there, SUM(o.total) AS total FROM orders o\n"
        "JOIN customers c ON c.id = o.customer_id GROUP BY c.city HAVING COUNT(*) > 2",
        "everyone": "SELECT name FROM customers UNION ALL SELECT customer FROM large",
        "cut_off": "SELECT id FROM orders WHERE (((",
        "open_ends": "SELECT * FROM elsewhere, orders",
    }
    for name, text in queries.items():
        run("project", "add-query", project, name, text)
    report = os.path.join(folder, "shop.html")
    run("report", project, "-o", report)
    return report


def make_large(folder):
    base = os.path.join(folder, "large.db")
    with sqlite3.connect(base) as connection:
        for table in range(40):
            columns = ", ".join(f"c{column} INT" for column in range(12))
            connection.execute(f"CREATE TABLE t{table} (id INT, {columns})")
        for view in range(LARGE):
            other = f"v{view - 7}" if view % 3 else f"t{(view * 7) % 40}"
            connection.execute(
                f"CREATE VIEW v{view} AS SELECT a.id, a.c1 + b.c2 AS c1, b.c3 AS c2, a.c4 AS c3, b.c5 AS c4, "
                f"a.c1 AS c5 FROM t{view % 40} a JOIN {other if view >= 7 else 't1'} b ON a.id = b.id "
                f"WHERE a.c6 > {view}"
            )
    connection.close()
    project = os.path.join(folder, "large.json")
    run("project", "import", base, project, "-d", "postgresql")
    report = os.path.join(folder, "large.html")
    run("report", project, "-o", report)
    return report


class Report(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        cls.folder = tempfile.TemporaryDirectory(prefix="zrsql_report_")
        cls.report = make_shop(cls.folder.name)
        cls.browser = webdriver.Browser()

    @classmethod
    def tearDownClass(cls):
        cls.browser.close()
        cls.folder.cleanup()

    def setUp(self):
        self.browser.resize(1280, 900)
        self.browser.prefer("light")
        self.browser.open("/dev/null")
        self.browser.open(self.report)

    def tearDown(self):
        self.assertEqual(self.browser.complaints(), [])

    def run_script(self, script, *arguments):
        return self.browser.run(script, *arguments)

    def shown_names(self):
        return self.run_script(
            "return [...document.querySelectorAll('details.object')].filter(o => o.offsetParent)"
            ".map(o => o.querySelector('summary b').textContent)"
        )

    def opened_names(self):
        return self.run_script(
            "return [...document.querySelectorAll('details.object[open]')]"
            ".map(o => o.querySelector('summary b').textContent)"
        )

    def focused(self):
        return self.run_script(
            "const at = document.activeElement; return at.id || at.className || at.textContent || at.tagName"
        )

    def anchor(self, name):
        return self.run_script(
            "return [...document.querySelectorAll('details.object')]"
            ".find(o => o.querySelector('summary b').textContent === arguments[0]).id",
            name,
        )

    def search(self, words):
        self.browser.click("#search")
        self.run_script("document.getElementById('search').value = ''")
        self.browser.press(words)

    def test_stands_by_itself(self):
        self.assertIn("shop", self.run_script("return document.title"))
        self.assertEqual(self.run_script("return performance.getEntriesByType('resource').length"), 0)
        self.assertEqual(len(self.shown_names()), 9)

    def test_an_error_of_the_page_would_be_seen(self):
        self.run_script("setTimeout(() => { throw new Error('on purpose'); })")
        self.run_script("console.error('told on purpose')")
        told = []
        deadline = time.monotonic() + 20
        while len(told) < 2 and time.monotonic() < deadline:
            told += [entry["message"] for entry in self.browser.complaints()]
        self.assertIn("told on purpose", " ".join(told))
        self.assertIn("Error: on purpose", " ".join(told))

    def test_tells_what_was_not_read(self):
        unread = self.run_script("return document.getElementById('h-unread').parentElement.innerText")
        self.assertIn("cut_off", unread)
        self.assertIn("stopped at line", unread)
        self.assertNotIn("by_city", unread)

    def test_search_finds_names_columns_and_texts(self):
        for words, names in {
            "BY_CITY": ["by_city"],
            "gross": ["named_orders", "large"],
            "<b>&": ["named_orders"],
            "no such thing": [],
        }.items():
            self.search(words)
            self.browser.wait_until(f"document.getElementById('found').textContent === '{len(names)} found'")
            self.assertEqual(self.shown_names(), names)
        self.run_script("document.getElementById('search').select()")
        self.browser.press("\ue017")  # Delete
        self.browser.wait_until("document.getElementById('found').textContent === ''")
        self.assertEqual(len(self.shown_names()), 9)

    def test_enter_opens_what_was_found(self):
        self.search("by_city" + webdriver.ENTER)
        self.browser.wait_until("document.querySelector('details.object[open]')")
        self.assertEqual(self.opened_names(), ["by_city"])
        self.assertIn("by_city", self.run_script("return document.activeElement.textContent"))

    def test_a_click_in_the_graph_goes_to_the_query(self):
        anchor = self.anchor("large")
        self.run_script("document.getElementById('graph').scrollIntoView({block: 'center'})")
        self.browser.click(f"#graph a[data-node={anchor}] rect")
        self.browser.wait_until(f"location.hash === '#{anchor}'")
        self.browser.wait_until(f"document.getElementById('{anchor}').open")
        top = self.run_script(f"return document.getElementById('{anchor}').getBoundingClientRect().top")
        bar = self.run_script("return document.querySelector('header.bar').getBoundingClientRect().bottom")
        self.assertGreaterEqual(top, bar - 1)
        self.assertLess(top, 900)
        near = self.run_script(
            "return [...document.querySelectorAll('#graph a.near title')].map(t => t.textContent).sort()"
        )
        self.assertEqual(near, ["customers", "everyone", "large", "named_orders", "orders"])

    def test_a_source_goes_to_its_table(self):
        self.search("by_city" + webdriver.ENTER)
        anchor = self.anchor("customers")
        self.browser.wait_until("document.querySelector('details.object[open]')")
        self.browser.click(f"details.object[open] td a[href='#{anchor}']")
        self.browser.wait_until(f"document.getElementById('{anchor}').open")
        self.assertIn("customers", self.shown_names())

    def test_what_was_opened_behind_a_search_stays(self):
        self.search("by_city" + webdriver.ENTER)
        self.run_script("location.hash = arguments[0]", self.anchor("customers"))
        self.browser.wait_until(f"document.getElementById('{self.anchor('customers')}').open")
        time.sleep(0.4)  # longer than the page waits for more keys
        self.assertIn("customers", self.shown_names())

    def test_keys_alone_are_enough(self):
        for stop in ("skip", "search", "next", "theme"):
            self.browser.press(webdriver.TAB)
            self.assertEqual(self.focused(), stop)
        self.browser.press(webdriver.ENTER)
        self.assertTrue(self.run_script("return document.documentElement.classList.contains('dark')"))
        self.browser.press("/")
        self.assertEqual(self.focused(), "search")
        self.browser.press("named_orders" + webdriver.ENTER)
        self.browser.wait_until("document.querySelector('details.object[open]')")
        self.assertIn("named_orders", self.opened_names())
        self.browser.press(webdriver.ENTER)  # the summary has the focus
        self.browser.wait_until("!document.querySelector('details.object[open]')")
        self.browser.press(webdriver.ENTER + webdriver.TAB)
        self.assertEqual(self.focused(), "look")
        self.browser.press(webdriver.ENTER)
        self.assertEqual(
            self.run_script("return document.activeElement.getAttribute('data-node')"),
            self.anchor("named_orders"),
        )
        before = self.run_script("return document.getElementById('graph').getAttribute('viewBox')")
        self.browser.press("+")
        self.assertNotEqual(self.run_script("return document.getElementById('graph').getAttribute('viewBox')"), before)

    def test_the_graph_can_be_reached_by_tab_and_shows_it(self):
        for _ in range(30):
            if self.focused() == "graph":
                break
            self.browser.press(webdriver.TAB)
        self.assertEqual(self.focused(), "graph")
        outline = self.run_script("return getComputedStyle(document.activeElement).outlineStyle")
        self.assertNotEqual(outline, "none")

    def test_the_tree_unfolds(self):
        self.search("large" + webdriver.ENTER)
        self.browser.wait_until("document.querySelector('details.object[open]')")
        self.assertEqual(self.opened_names(), ["large"])
        self.browser.wait_until("document.querySelector('details.object[open] details.tree')")
        self.run_script("document.querySelector('details.object[open] details.tree').open = true")
        self.browser.wait_until("document.querySelector('details.object[open] .tree ul details[open]')")
        folded = self.run_script(
            "const fold = document.querySelector('details.object[open] .tree ul details');"
            "const high = fold.offsetHeight; fold.open = false; return fold.offsetHeight < high"
        )
        self.assertTrue(folded)

    def test_nothing_is_wider_than_the_page(self):
        for width in (1280, 400):
            self.browser.resize(width, 900)
            self.run_script("document.querySelectorAll('details').forEach(each => { each.open = true; })")
            self.assertLessEqual(self.run_script("return document.documentElement.scrollWidth"), width)

    def test_headings_are_not_hidden_by_the_bar(self):
        for heading in ("h-graph", "h-queries", "h-tables"):
            self.run_script("location.hash = arguments[0]", heading)
            hidden = self.run_script(
                "return document.getElementById(arguments[0]).getBoundingClientRect().top <"
                " document.querySelector('header.bar').getBoundingClientRect().bottom",
                heading,
            )
            self.assertFalse(hidden, heading)

    def test_a_node_that_is_looked_at_can_be_read_on_a_narrow_page(self):
        self.browser.resize(400, 800)
        self.search("large" + webdriver.ENTER)
        self.browser.wait_until("document.querySelector('details.object[open]')")
        self.browser.click("details.object[open] button.look")
        box = self.run_script(
            "const box = document.activeElement.querySelector('rect').getBoundingClientRect();"
            "return [box.left, box.right, box.height]"
        )
        self.assertGreaterEqual(box[0], 0)
        self.assertLessEqual(box[1], 400)
        self.assertGreater(box[2], 20)

    def test_labels_in_the_graph_stay_within_their_boxes(self):
        outside = self.run_script(
            "return [...document.querySelectorAll('#graph a')].filter(node => node.querySelector('text').getBBox().x +"
            " node.querySelector('text').getBBox().width > node.querySelector('rect').getBBox().x +"
            " node.querySelector('rect').getBBox().width).map(node => node.textContent)"
        )
        self.assertEqual(outside, [])

    def test_texts_stand_out_from_what_is_behind_them(self):
        for scheme in ("light", "dark"):
            self.browser.prefer(scheme)
            self.browser.wait_until(
                f"document.documentElement.classList.contains('dark') === {str(scheme == 'dark').lower()}"
            )
            faint = self.run_script(
                """
                document.querySelectorAll('details').forEach(each => { each.open = true; });
                const channels = text => (text.match(/[\\d.]+/g) || []).map(Number);
                const light = colour => channels(colour).slice(0, 3).map(part => part / 255)
                  .map(part => part <= 0.04045 ? part / 12.92 : ((part + 0.055) / 1.055) ** 2.4)
                  .reduce((sum, part, at) => sum + part * [0.2126, 0.7152, 0.0722][at], 0);
                const behind = element => {
                  for (let at = element; at; at = at.parentElement) {
                    const colour = getComputedStyle(at).backgroundColor;
                    if (channels(colour)[3] !== 0) return colour;
                  }
                  return 'rgb(255, 255, 255)';
                };
                const ratio = (a, b) => (Math.max(a, b) + 0.05) / (Math.min(a, b) + 0.05);
                const faint = [];
                for (const element of document.querySelectorAll('body *')) {
                  if (element.closest('script, style, title, .skip')) continue;
                  const isText = [...element.childNodes].some(node => node.nodeType === 3 && node.data.trim());
                  if (!isText) continue;
                  const inGraph = element.closest('#graph a');
                  const front = getComputedStyle(element)[inGraph ? 'fill' : 'color'];
                  const back = inGraph ? getComputedStyle(inGraph.querySelector('rect')).fill : behind(element);
                  const value = ratio(light(front), light(back));
                  if (value < 4.5) faint.push(element.tagName + '.' + element.getAttribute('class') + ' ' + value);
                }
                return faint;
                """
            )
            self.assertEqual(faint, [], scheme)

    def test_pictures_are_taken(self):
        for scheme in ("light", "dark"):
            self.browser.prefer(scheme)
            self.browser.open("/dev/null")
            self.browser.open(self.report)
            self.run_script("document.getElementById('h-graph').scrollIntoView()")
            self.browser.screenshot(os.path.join(pictures, f"report_graph_{scheme}.png"))
            self.run_script("scrollTo(0, 0)")
            self.browser.screenshot(os.path.join(pictures, f"report_{scheme}.png"))
            self.search("named_orders" + webdriver.ENTER)
            self.browser.wait_until("document.querySelector('details.object[open]')")
            self.run_script("document.querySelector('details[open] details.tree').open = true")
            self.browser.screenshot(os.path.join(pictures, f"report_query_{scheme}.png"))
        self.browser.resize(400, 800)
        self.browser.screenshot(os.path.join(pictures, "report_narrow.png"))
        self.browser.click(f"#{self.anchor('named_orders')} button.look")
        self.browser.screenshot(os.path.join(pictures, "report_near.png"))

    def test_a_large_project_stays_usable(self):
        report = make_large(self.folder.name)
        began = time.monotonic()
        self.browser.open(report)
        self.browser.wait_until(f"document.querySelectorAll('details.query').length === {LARGE}")
        opened = time.monotonic() - began
        searched = self.run_script(
            "const began = performance.now(); document.getElementById('search').value = 'v1999'; find();"
            "document.body.offsetHeight; return (performance.now() - began) / 1000"
        )
        again = self.run_script(
            "const began = performance.now(); document.getElementById('search').value = 'c6 > 12'; find();"
            "document.body.offsetHeight; return (performance.now() - began) / 1000"
        )
        self.assertIn("v1200", self.shown_names())
        self.browser.screenshot(os.path.join(pictures, "report_large.png"))
        print(
            f"{LARGE} queries, {os.path.getsize(report) / 1e6:.1f} MB: opened in {opened:.2f} s, "
            f"first search {searched:.2f} s, next {again:.2f} s"
        )
        self.assertLess(opened, PATIENCE)
        self.assertLess(searched, PATIENCE)


if __name__ == "__main__":
    if webdriver.missing_programs():
        print("skipped: not installed: " + ", ".join(webdriver.missing_programs()) + " (./dev browser installs them)")
        sys.exit(77)
    zrsql, pictures = sys.argv[1:3]
    os.makedirs(pictures, exist_ok=True)
    unittest.main(argv=[sys.argv[0], *sys.argv[3:]], verbosity=2)
