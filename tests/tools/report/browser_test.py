#!/usr/bin/env python3
"""Opens reports in a browser, and uses them as a person would.

  browser_test.py COMMAND ROOT    the built command, and the root of the repository

Exit status 77 when there is no browser, or nothing to steer it with: the test is skipped.
"""

from __future__ import annotations

import os
import pathlib
import shutil
import subprocess
import sys
import tempfile
import unittest

SKIPPED = 77

try:
    from selenium import webdriver
    from selenium.webdriver.chrome.options import Options
    from selenium.webdriver.chrome.service import Service
    from selenium.webdriver.common.by import By
    from selenium.webdriver.common.keys import Keys
    from selenium.webdriver.support.ui import WebDriverWait
except ImportError:
    print("skipped: python3-selenium is not installed")
    sys.exit(SKIPPED)

BROWSER = shutil.which("chromium")
DRIVER = shutil.which("chromedriver")
if not BROWSER or not DRIVER:
    print("skipped: chromium or chromium-driver is not installed")
    sys.exit(SKIPPED)

OPTIONS = (
    "--headless=new --no-sandbox --disable-gpu --disable-quic --no-first-run "
    "--disable-background-networking --disable-component-update --disable-sync "
    "--disable-dev-shm-usage --window-size=1280,1000"
).split()

# Names that would do harm if one of them became markup.
SCRIPT = "<script>window.harm=1</script>"
IMAGE = "<img/src=x/onerror=window.harm=1>"
QUOTE = "\"onmouseover='window.harm=1'"
HOSTILE_DOMAIN = "<img src=x onerror=window.harm=1>&'\"\x01"

COMMAND = pathlib.Path(sys.argv[1])
ROOT = pathlib.Path(sys.argv[2])
PATIENCE = 30  # seconds; a busy machine is no failure


def run(*command: object, **more: object) -> None:
    environment = {**os.environ, "ASAN_OPTIONS": "detect_leaks=0", **more}
    subprocess.run(
        [str(word) for word in command], check=True, env=environment, stdout=subprocess.DEVNULL
    )


def make_host(directory: pathlib.Path) -> pathlib.Path:
    host = directory / "host"
    run(COMMAND, "host", "init", host)
    run(ROOT / "scripts/pack-tardisks", ROOT / "examples/host/tardisks", host / "tardisks")
    run(COMMAND, "host", "assemble", host)
    return host


def make_hostile_policy(directory: pathlib.Path) -> pathlib.Path:
    policy = directory / "hostile"
    for name in ("objects", "domains", "fileLabels"):
        (policy / name).mkdir(parents=True)
    objects = [SCRIPT, IMAGE, QUOTE, "vendorTardisk", "storageTardisk"]
    (policy / "objects" / "base").write_text("\n".join(objects) + "\n")
    for name in ("appDom", "globalVMDom", "ioFilterDom", "vendorDom", "storageDom", QUOTE):
        (policy / "domains" / name).write_text("")
    (policy / "domains" / HOSTILE_DOMAIN).write_text(
        f"-a {SCRIPT} read grant\n-d {IMAGE} {QUOTE} exec grant\n-d {QUOTE} appDom fork grant\n"
        f"-p net_admin {SCRIPT} grant\n-r /{SCRIPT} rw\n-u {QUOTE} stream revoke\n"
    )
    (policy / "fileLabels" / "base").write_text(f"/etc/hosts {SCRIPT}\n")
    return policy


def make_ring(directory: pathlib.Path, size: int, reach: int) -> pathlib.Path:
    """A policy of so many domains, each of which goes to so many next ones."""
    policy = directory / f"ring{size}"
    for name in ("objects", "domains", "fileLabels"):
        (policy / name).mkdir(parents=True)
    (policy / "objects" / "base").write_text("next\nvendorTardisk\nstorageTardisk\n")
    for name in ("appDom", "globalVMDom", "ioFilterDom", "vendorDom", "storageDom"):
        (policy / "domains" / name).write_text("")
    for i in range(size):
        (policy / "domains" / f"ring{i}").write_text("".join(
            f"-d next ring{(i + step) % size} exec grant\n" for step in range(1, reach + 1)))
    return policy


def open_browser(profile: pathlib.Path) -> webdriver.Chrome:
    options = Options()
    options.binary_location = BROWSER
    for option in (*OPTIONS, f"--user-data-dir={profile}"):
        options.add_argument(option)
    options.set_capability("goog:loggingPrefs", {"browser": "ALL"})
    return webdriver.Chrome(service=Service(DRIVER), options=options)


class ReportInABrowser(unittest.TestCase):
    @classmethod
    def setUpClass(cls) -> None:
        scratch = tempfile.TemporaryDirectory()
        cls.addClassCleanup(scratch.cleanup)
        cls.directory = pathlib.Path(scratch.name)
        host = make_host(cls.directory)
        own = "/etc/olvane/secpolicy"
        run(COMMAND, "report", "--host", host, own, "-o", cls.directory / "own.html")
        run(COMMAND, "report", "--host", host, own, "-o", cls.directory / "circle.html",
            PATH=str(cls.directory))
        run(COMMAND, "report", "--host", host, make_hostile_policy(cls.directory),
            "-o", cls.directory / "hostile.html")
        for page, size, reach in (("ring", 400, 1), ("dense", 60, 55)):
            run(COMMAND, "report", "--host", host, make_ring(cls.directory, size, reach),
                "-o", cls.directory / f"{page}.html")
        cls.browser = open_browser(cls.directory / "profile")
        cls.addClassCleanup(cls.browser.quit)

    def setUp(self) -> None:
        self.open("own")

    def tearDown(self) -> None:
        # What broke the content policy stands there, too.
        self.assertEqual(self.browser.get_log("browser"), [])

    def open(self, page: str) -> None:
        self.browser.get("about:blank")
        self.browser.get((self.directory / f"{page}.html").as_uri())

    def run_script(self, script: str, *arguments: object) -> object:
        return self.browser.execute_script(script, *arguments)

    def all(self, selector: str) -> list:
        return self.browser.find_elements(By.CSS_SELECTOR, selector)

    def one(self, selector: str):
        return self.browser.find_element(By.CSS_SELECTOR, selector)

    def wait(self, condition) -> None:
        WebDriverWait(self.browser, PATIENCE).until(lambda _: condition())

    def shown_domains(self) -> list[str]:
        return self.run_script(
            "return [...document.querySelectorAll('#domains > .entry:not([hidden]) h3')]"
            ".map((heading) => heading.textContent)"
        )

    def shown_rules(self) -> list[str]:
        return self.run_script(
            "return [...document.querySelectorAll('#domains .rules > li')]"
            ".filter((line) => line.checkVisibility())"
            ".map((line) => line.querySelector('code').textContent)"
        )

    def search(self, text: str) -> None:
        query = self.one("#query")
        query.clear()
        before = self.one("#matches").text
        query.send_keys(text)
        self.wait(lambda: self.one("#matches").text != before)

    def domain(self, name: str):
        [entry] = [entry for entry in self.all("#domains > .entry")
                   if entry.find_element(By.TAG_NAME, "h3").text == name]
        return entry

    def test_opens(self) -> None:
        self.assertEqual(self.browser.title, "Security policy: /etc/olvane/secpolicy")
        self.assertEqual(self.one("h1").text, "Security policy")
        self.assertIn("rootDom", self.shown_domains())
        self.assertTrue(self.one("#query").is_displayed())

    def test_fetches_nothing(self) -> None:
        self.assertEqual(self.run_script("return performance.getEntriesByType('resource')"), [])

    def test_search_narrows_to_a_domain_and_back(self) -> None:
        everything = self.shown_domains()
        self.search("vendorProbeDom")
        self.wait(lambda: set(self.shown_domains()) == {"vendorProbeDom", "vendorDom"})
        self.assertEqual(self.shown_rules(), ["-d probeBin vendorProbeDom exec grant"])
        self.assertFalse(self.one("#graph").is_displayed())
        self.one("#query").send_keys(Keys.ESCAPE)
        self.assertEqual(self.shown_domains(), everything)
        self.assertEqual(self.shown_rules(), [])
        self.assertTrue(self.one("#graph").is_displayed())

    def test_search_finds_rules_by_all_words(self) -> None:
        self.search("shellBin revoke")
        self.wait(lambda: self.shown_rules())
        for rule in self.shown_rules():
            self.assertIn("shellBin", rule)
            self.assertIn("revoke", rule)
        self.search("sshDom shellBin grant")
        self.wait(lambda: self.shown_domains() == ["sshDom"])
        self.assertIn("-d shellBin shellDom exec grant", self.shown_rules())

    def test_search_that_finds_nothing_says_so(self) -> None:
        self.search("noSuchThing")
        self.wait(lambda: self.one("#matches").text == "Nothing matches")
        self.assertEqual(self.shown_domains(), [])

    def test_search_is_reached_by_key(self) -> None:
        self.one("body").send_keys("/")
        self.assertEqual(self.run_script("return document.activeElement.id"), "query")
        self.assertEqual(self.one("#query").get_attribute("value"), "")

    def test_link_leads_from_a_domain_to_another(self) -> None:
        ssh = self.domain("sshDom")
        ssh.find_element(By.TAG_NAME, "summary").click()
        ssh.find_element(By.LINK_TEXT, "shellDom").click()
        shell = self.domain("shellDom")
        self.wait(lambda: shell.get_attribute("open") == "true")
        self.assertTrue(self.browser.current_url.endswith("#" + shell.get_attribute("id")))
        self.wait(lambda: self.run_script(
            "const place = arguments[0].getBoundingClientRect();"
            "return place.top >= 0 && place.top < innerHeight", shell))

    def test_link_leaves_a_search(self) -> None:
        self.search("sshDom shellBin exec grant")
        self.wait(lambda: self.shown_domains() == ["sshDom"])
        self.domain("sshDom").find_element(By.LINK_TEXT, "shellBin").click()
        self.wait(lambda: self.one("#query").get_attribute("value") == "")
        self.assertEqual(
            self.run_script("return document.querySelector(':target h3').textContent"), "shellBin")
        self.assertTrue(self.one(":target").get_attribute("open"))

    def test_entry_opens_by_key(self) -> None:
        entry = self.domain("rootDom")
        entry.find_element(By.TAG_NAME, "summary").send_keys(Keys.ENTER)
        self.wait(lambda: entry.get_attribute("open") == "true")
        self.assertIn("-d sshBin sshDom exec grant", self.shown_rules())

    def test_graph_is_drawn(self) -> None:
        for page in ("own", "circle"):
            self.open(page)
            nodes = self.all("#graph svg .node")
            self.assertIn("rootDom", [node.find_element(By.TAG_NAME, "text").text
                                      for node in nodes])
            self.assertGreater(len(self.all("#graph svg .link")), 20)
            for node in nodes:
                self.assertGreater(node.size["width"], 0)
        self.assertEqual(len(self.all("#graph svg .node circle")), len(nodes))

    def node(self, name: str):
        [node] = [node for node in self.all("#graph svg .node")
                  if node.find_element(By.TAG_NAME, "text").text == name]
        return node

    def marked(self) -> set[str]:
        return {node.find_element(By.TAG_NAME, "text").text
                for node in self.all("#graph svg .node.marked")}

    def test_graph_shows_what_a_domain_is_linked_to(self) -> None:
        self.run_script("arguments[0].focus()", self.node("netDom"))
        self.assertEqual(self.marked(), {"netDom", "rootDom", "firewallDom"})
        self.node("netDom").click()
        self.wait(lambda: self.domain("netDom").get_attribute("open") == "true")

    def test_graph_of_very_many_links_shows_those_that_leave_a_domain(self) -> None:
        self.open("dense")
        self.assertEqual(self.all("#graph .link"), [])
        node = self.node("ring7")
        self.run_script("arguments[0].focus()", node)
        [line] = self.all("#graph .texture .marked")
        self.assertEqual(line.get_attribute("data-from"), node.get_attribute("data-domain"))
        self.assertEqual(line.get_attribute("d").count("M"), 55)
        self.assertEqual(self.marked(), {"ring7"})

    def test_big_drawing_fits_until_it_is_asked_for_in_full(self) -> None:
        self.open("ring")
        drawing = self.one("#graph svg")
        self.assertLess(drawing.size["width"], 1280)
        self.assertLess(drawing.size["height"], 1000)
        self.one("#graph input").click()
        self.assertGreater(drawing.size["width"], 2000)

    def test_words_of_a_policy_do_nothing(self) -> None:
        self.open("hostile")
        self.run_script("for (const entry of document.querySelectorAll('details')) entry.open = true")
        for node in self.all("#graph svg .node"):
            self.run_script(
                "arguments[0].dispatchEvent(new MouseEvent('mouseover', {bubbles: true}))", node)
        self.assertIsNone(self.run_script("return window.harm"))
        self.assertEqual(len(self.all("script")), 1)
        self.assertEqual(self.all("img, [onerror], [onmouseover]"), [])
        self.assertIn(HOSTILE_DOMAIN.replace("\x01", "\\x01"), self.shown_domains())
        self.assertIn(f"-a {SCRIPT} read grant", self.shown_rules())
        self.search("onerror")
        self.assertIsNone(self.run_script("return window.harm"))

    def test_content_policy_stops_a_script_that_gets_in(self) -> None:
        self.run_script(
            "document.body.append(Object.assign(document.createElement('script'),"
            "{textContent: 'window.harm = 1'}))")
        self.assertIsNone(self.run_script("return window.harm"))
        log = self.browser.get_log("browser")
        self.assertEqual(len(log), 1)
        self.assertIn("Content Security Policy", log[0]["message"])

    def test_fits_a_telephone(self) -> None:
        self.browser.execute_cdp_cmd(
            "Emulation.setDeviceMetricsOverride",
            {"width": 390, "height": 844, "deviceScaleFactor": 1, "mobile": True})
        self.addCleanup(self.browser.execute_cdp_cmd, "Emulation.clearDeviceMetricsOverride", {})
        self.run_script("document.querySelectorAll('details').forEach((e) => { e.open = true; })")
        self.assertEqual(self.run_script("return document.documentElement.scrollWidth"), 390)

    def test_colours_follow_the_reader(self) -> None:
        colours = []
        for scheme in ("light", "dark"):
            self.browser.execute_cdp_cmd(
                "Emulation.setEmulatedMedia",
                {"features": [{"name": "prefers-color-scheme", "value": scheme}]})
            colours.append(self.run_script("return getComputedStyle(document.body).backgroundColor"))
        self.browser.execute_cdp_cmd("Emulation.setEmulatedMedia", {"features": []})
        self.assertNotEqual(*colours)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
