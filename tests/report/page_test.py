#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Opens the pages that `pmxboard report` writes in a real browser, and uses them as people do: with eyes, mouse and
keyboard.

usage: page_test.py TOOL [UNITTEST ARGUMENT...]
"""

import base64
import contextlib
import json
import os
import pathlib
import signal
import subprocess
import sys
import time
import unittest

sys.dont_write_bytecode = True

import browser as browsers  # noqa: E402
import pages  # noqa: E402
from selenium.webdriver.common.by import By  # noqa: E402
from selenium.webdriver.common.keys import Keys  # noqa: E402
from selenium.webdriver.support.ui import Select  # noqa: E402

TOOL = pathlib.Path(sys.argv[1]).resolve()
LARGEST = 2_000_000
ALL = "return [...document.querySelectorAll(arguments[0])]"
HELD_STEP = 4  # of NEVER: PMX_SetModeEx


def setUpModule():
    global browser, written, ways
    ways = contextlib.ExitStack()
    written = pages.Pages(TOOL, ways.enter_context(pages.folder()))
    browser = ways.enter_context(browsers.started())


def tearDownModule():
    ways.close()


class PageTest(unittest.TestCase):
    def setUp(self):
        browser.look()

    def tearDown(self):
        self.assertEqual([], browser.complaints())

    def open(self, *arguments, code=0):
        page = written.write(*arguments, code=code)
        browser.open(page)
        return page

    def all(self, selector):
        return browser.driver.find_elements(By.CSS_SELECTOR, selector)

    def one(self, selector):
        found = self.all(selector)
        self.assertEqual(1, len(found), selector)
        return found[0]

    def texts(self, selector):
        """Texts, folded ones too."""
        return browser.run(f"{ALL}.map((one) => one.textContent)", selector)

    def visible(self, selector):
        """Texts of those that are seen: neither folded nor filtered out."""
        return browser.run(f"{ALL}.filter((one) => one.checkVisibility()).map((one) => one.textContent)", selector)

    def choose(self, selector, value):
        Select(self.one(selector)).select_by_value(str(value))

    def press(self, *keys):
        browser.driver.switch_to.active_element.send_keys(*keys)

    def tabbed(self):
        """What Tab stops at, as the page has it."""
        return browser.run("""return [...document.querySelectorAll("a, button, input, select, summary, [tabindex]")]
            .filter((one) => one.tabIndex >= 0 && one.checkVisibility())""")

    def current(self):
        """The number of the step that is chosen."""
        return int(self.one("[aria-current=step]").get_attribute("id").removeprefix("step-"))

    def active(self):
        return browser.run("return document.activeElement.id")


class Shown(PageTest):
    def test_it_opens_from_a_file_and_asks_for_nothing(self):
        page = self.open(pages.NEVER)
        self.assertIn("display-part-never-answers.pmx", browser.driver.title)
        self.assertEqual([page.as_uri()], browser.requests())

    def test_every_step_is_shown_with_its_command(self):
        self.open(pages.NEVER)
        self.assertEqual(pages.commands(pages.NEVER), self.texts(".card h3 code"))
        self.assertEqual(len(pages.commands(pages.NEVER)), len(self.all(".bar.step")))

    def test_all_that_a_trace_has_is_there(self):
        self.open(pages.NEVER)
        trace = written.run("run", "--stores", "--trace-format", "jsonl", pages.NEVER).stdout.splitlines()
        self.assertEqual(len(trace), len(self.all(".calls li, .stores li")))
        calls = [json.loads(line)["function"] for line in trace if json.loads(line)["kind"] == "call"]
        shown = self.texts(".calls li.call")
        self.assertEqual(len(calls), len(shown))
        for call, line in zip(calls, shown):
            self.assertIn(f"  {call}(", line)

    def test_who_reads_no_code_learns_why_there_were_no_graphics(self):
        self.open(pages.NEVER)
        told = " ".join(self.texts("#story li"))
        self.assertIn("No graphics for 10 s: held back from 4 ms", told)
        self.assertIn("the display timer ran out; the display part had not answered", told)
        self.assertIn("Graphics are taken out of the picture while the display part switches the outputs", told)
        self.assertIn("A timer brings them back if it never does.", told)
        self.assertEqual([], self.all(".looks"), "nothing is drawn on them")
        self.open(pages.FIRST_LOOK)
        told = " ".join(self.texts("#story li"))
        self.assertIn("No graphics for 3 s: held back", told)
        self.assertIn("the display part has switched", told)
        self.assertEqual(["before, after step 4", "meanwhile, after step 6", "afterwards, after step 7"],
                         [text.partition(":")[0] for text in self.texts(".looks figcaption")])
        self.assertEqual(3, len(set(browser.run(f"{ALL}.map((one) => one.src)", ".looks img"))))

    def test_held_graphics_are_a_bar_that_leads_to_their_step(self):
        self.open(pages.NEVER)
        bar = self.all(".bar.held")[0]
        self.assertIn("held back for 10 s", bar.get_attribute("aria-label"))
        track = self.all(".track")[0].size["width"]
        self.assertGreater(bar.size["width"], track / 2)
        self.one("#scale").click()
        self.assertGreater(self.all(".bar.held")[0].size["width"], track * 0.9)
        self.all(".bar.held")[0].click()
        self.assertEqual(HELD_STEP, self.current())
        self.assertIn("Graphics are held back", self.one(f"#step-{HELD_STEP}").text)
        self.assertIn("held back for 10 s", self.one("#told").text)

    def test_what_was_refused_says_why_and_what_would_do(self):
        self.open(pages.REFUSED)
        self.assertIn("source 1 feeds two planes", " ".join(self.texts("#story li.bad")))
        refused = " ".join(self.texts(".refused"))
        self.assertIn("Refused: source 1 feeds two planes, 0 and 1.", refused)
        self.assertIn("PMX_SetArbPlaneOrder 0 0x76543201", refused)
        self.assertNotEqual([], self.all(".card.refusing .result.refusing"))
        self.assertEqual([], self.all(".card:not(.refusing) .result.refusing"))

    def test_answers_by_script_are_told(self):
        self.open(pages.SCENARIOS / "os-failures-at-shutdown.pmx")
        told = " ".join(self.texts("#story li"))
        self.assertRegex(told, r"\d+ answers of the platform came by script, first in step \d+\.")

    def test_times_stand_within_long_steps_and_at_the_end(self):
        self.open(pages.NEVER)
        self.assertIn("5 s", self.texts(".times span"))
        self.one("#scale").click()
        times = self.texts(".times span")
        self.assertGreaterEqual(set(times), {"0 ms", "2 s", "4 s", "6 s"})
        self.assertTrue(any(time_.startswith("10.00") for time_ in times), times)
        places = browser.run(f"{ALL}.map((one) => one.getBoundingClientRect()).map((one) => [one.left, one.right])"
                             ".sort((one, other) => one[0] - other[0])", ".times span")
        for (_, end), (begin, _) in zip(places, places[1:]):
            self.assertLess(end, begin, "they can be read")

    def test_names_of_any_kind_stay_text(self):
        for name in (b"a<b class=evil>&\"'.pmx", b"a\x01\x1b[31m\xc2\x9b.pmx", b"\xff\xfe\xc3.pmx"):
            path = pathlib.Path(os.fsdecode(os.fsencode(written.folder / "") + b"/" + name))
            path.write_bytes(b"PMX_Init\nprint \"\xff<b class=evil>\"\nPMX_GetMode 7 8 9\n")
            self.open(path, code=1)
            self.assertEqual([], self.all(".evil"))
            shown = os.fsdecode(name) if b"<" in name else "\\x" + f"{name[1 if name[0] == 97 else 0]:02X}"
            self.assertIn(shown.lower(), self.one("#title").get_attribute("textContent").lower())
            self.assertNotRegex(self.one("body").get_attribute("textContent"), "[\x01\x1b\x9b]")

    def test_the_standard_input_is_a_scenario_once(self):
        page = written.folder / "stdin.html"
        found = written.run("report", "-", "-o", page, stdin="PMX_Init\n")
        self.assertEqual((0, ""), (found.returncode, found.stderr))
        browser.open(page)
        self.assertEqual("<stdin>", self.one("#title").text)
        self.assertEqual(["PMX_Init"], self.texts(".card h3 code"))
        again = written.folder / "again.html"
        for arguments in (("-", "-"), ("-", "--board", "default", "--board", "bedroom-player")):
            found = written.run("report", *arguments, "-o", again, stdin="PMX_Init\n")
            self.assertEqual(2, found.returncode)
            self.assertIn("the standard input holds one scenario only", found.stderr)
            self.assertFalse(again.exists())

    def test_the_page_goes_where_it_is_sent(self):
        found = written.run("report", "-", "-o", "/dev/stdout", stdin="PMX_Init\n")
        self.assertEqual((0, ""), (found.returncode, found.stderr))
        page = written.folder / "stdout.html"
        page.write_text(found.stdout, encoding="utf-8")
        browser.open(page)
        self.assertEqual(["PMX_Init"], self.texts(".card h3 code"))

    def test_a_restored_state_takes_no_time(self):
        saved = written.folder / "saved-at-4s.json"
        self.assertEqual(0, written.run("run", "-q", "-", stdin=f"PMX_Init\nadvance 4s\nsave {saved}\n").returncode)
        self.open(written.scenario("restores.pmx", f"PMX_Init\nrestore {saved}\nPMX_GetMode 0\n"))
        self.assertNotIn("takes", self.one("#step-3 .when").text)
        self.assertIn("3 steps, 0 expectations, 2 ms on board", " ".join(self.texts("#story li")))

    def test_a_failure_is_told_where_it_happened(self):
        wrong = written.scenario("wrong.pmx", "PMX_Init\nPMX_GetMode 0\nexpect result 0\nPMX_Stop\n")
        self.open(wrong, code=1)
        self.assertEqual(2, len(self.all(".card")))
        self.assertEqual(1, len(self.all("#step-2 .failed")))
        self.assertIn("The scenario failed", " ".join(self.texts("#story li")))

    def test_a_failure_of_no_step_is_told_once(self):
        self.open(written.scenario("unread.pmx", 'PMX_Init\nprint "no end\n'), code=1)
        told = self.texts("#story .failed")
        self.assertEqual(1, len(told))
        self.assertIn("unread.pmx:2: ", told[0])
        self.assertEqual([], self.all(".card .failed"))
        written.scenario("within.pmx", "PMX_GetMode 0\nPMX_GetTvType 0\nexpect result 0\n")
        self.open(written.scenario("including.pmx", f"PMX_Init\ninclude {written.folder}/within.pmx\n"), code=1)
        self.assertEqual(1, len(self.texts("#story .failed")))
        self.assertEqual(1, len(self.all(".card .failed")))

    def test_a_run_without_steps_is_a_page(self):
        for lines, code in (("", 0), ("# nothing\n", 0), ('print "no end\n', 1)):
            self.open(written.scenario(f"none-{len(lines)}.pmx", lines), code=code)
            self.press(Keys.ARROW_RIGHT, Keys.END, Keys.HOME)
            self.assertIn("No step", self.one("#told").text)
            self.assertEqual(code, len(self.texts("#story .failed")))
            self.one("#scale").click()

    def test_one_that_cannot_be_read_to_its_end_leaves_the_others(self):
        endless = written.scenario("endless.pmx", "PMX_Init\n#" + "x" * (1 << 21) + "\n")
        self.open(pages.FIRST_LOOK, endless, code=2)
        self.assertEqual(pages.commands(pages.FIRST_LOOK), self.texts(".card h3 code"))
        self.choose("#run", 1)
        self.assertEqual(["PMX_Init"], self.texts(".card h3 code"))
        self.assertIn("endless.pmx:2", self.texts("#story .failed")[0])

    def test_a_step_that_breaks_the_program_down_is_the_last_on_the_page(self):
        page, begun = written.folder / "broken.html", written.folder / "begun.json"
        arguments = [str(TOOL), "report", str(pages.FIRST_LOOK), "-", "-o", str(page)]
        with subprocess.Popen(arguments, stdin=subprocess.PIPE, stderr=subprocess.PIPE, cwd=pages.ROOT) as tool:
            tool.stdin.write(f"PMX_Init\nPMX_SetTvType 0 PMX_TV_TYPE_PAL\nsave {begun}\n".encode())
            tool.stdin.flush()
            while not begun.exists():
                time.sleep(0.01)
            copies = pathlib.Path(f"/proc/{tool.pid}/task/{tool.pid}/children").read_text(encoding="ascii").split()
            os.kill(int(copies[-1]), signal.SIGSEGV)
            said = tool.stderr.read().decode()
        self.assertEqual(1, tool.returncode, said)
        message = "<stdin>:3: the step broke the program down: "
        self.assertIn(message, said)
        browser.open(page)
        self.choose("#run", 1)
        self.assertEqual(["PMX_Init", "PMX_SetTvType 0 PMX_TV_TYPE_PAL", f"save {begun}"], self.texts(".card h3 code"))
        self.assertIn(message, self.one("#step-3 .failed").text)
        self.assertIn(f"step 3 failed: {message}", self.one("#story .failed").text)
        self.assertIn("PMX_HalSetTvType", "".join(self.texts("#step-2 .calls li")))
        browser.run("document.activeElement.blur()")
        self.one("body").send_keys(Keys.END)
        self.assertEqual(3, self.current())

    def test_how_to_repeat_a_failure_has_board_and_quotes(self):
        wrong = written.scenario("sp ace.pmx", "PMX_Init\nPMX_GetMode 0\nexpect result 77\n")
        found = written.run("report", "--board", "bedroom-player", wrong, "-o", written.folder / "repeat.html")
        self.assertEqual(1, found.returncode)
        self.assertIn(f"repeat: pmxboard run --board bedroom-player '{wrong}'\n", found.stderr)

    def test_what_was_so_already_is_no_refusal(self):
        self.open(written.scenario("again.pmx", "PMX_Init\nPMX_Init\n"))
        self.assertEqual([], self.all("#story .bad"))
        self.assertEqual([], self.all(".refusing"))
        self.assertIn("Nothing to do: ", self.one("#step-2").text)

    def test_what_a_command_shows_is_on_its_card(self):
        self.open(written.scenario("shows.pmx", 'print "why this is\\n"\nPMX_Init\nstatus graphics\n'))
        self.assertEqual("why this is", self.one("#step-1 .told").text)
        self.assertIn("Graphics", self.one("#step-3 .told").text)

    def test_left_out_lines_are_told(self):
        def leave_out(data):
            for step in data["runs"][0]["steps"]:
                step["left_out"]["entries"], step["entries"] = len(step["entries"]), []
            data["runs"][0]["steps"][0]["left_out"]["changes"] = 1
            return data

        browser.open(written.changed(written.write(pages.NEVER), leave_out))
        lines = len(written.run("run", "--stores", "--trace-format", "jsonl", pages.NEVER).stdout.splitlines())
        self.assertRegex(self.one(f"#step-{HELD_STEP} .left-out").text, r"leaves out \d+ lines of the trace\.")
        self.assertIn("the display timer ran out", self.texts("#story li")[0], "that is known without them")
        self.assertIn(f"Of its steps this page leaves out {lines} lines of the trace and 1 change of the state.",
                      self.texts("#story li"))

    def test_assertions_and_misuses_are_told(self):
        self.open(written.scenario("wrong-use.pmx", "PMX_Init\npoke MutexPMX 99\nPMX_Uninit\nexpect misuses 1\n"))
        self.assertIn("step 3", " ".join(self.texts("#story .bad")))
        self.assertEqual(1, len(self.all("#step-3.refusing")))

    def test_time_goes_on_over_a_power_on(self):
        self.open(written.scenario("twice.pmx", "PMX_Init\nadvance 1s\npower-on\nPMX_Init\n"))
        begun = float(self.texts("#step-4 .entries .time")[0])
        self.assertGreaterEqual(begun, 1000)
        self.assertIn("count from the power-on at 1.", " ".join(self.texts("#step-4 .status summary")))

    def test_what_a_step_does_at_its_end_is_seen_within_it(self):
        self.open(pages.NEVER)
        held = self.all(".bar.held")[0].rect
        step = self.one(f".bar.step[data-step='{HELD_STEP - 1}']").rect
        self.assertLess(held["x"], step["x"] + step["width"])
        self.assertEqual(1, len(self.all(".bar.held")), "none of no time behind it")

    def test_what_a_scenario_holds_stays_text(self):
        text = "</script><b class=evil>&amp;<!--"
        hostile = written.scenario("hostile.pmx", f'poke PMX_debug_level 2\nPMX_Printf 1 "{text}\\n"\n')
        self.open(hostile)
        self.assertEqual([], self.all(".evil"))
        self.assertIn(text, self.texts(".card h3 code")[1])

    def test_the_page_of_the_longest_scenario_leaves_nothing_out(self):
        page = self.open(pages.LONGEST)
        self.assertLess(page.stat().st_size, LARGEST)
        self.assertEqual(pages.commands(pages.LONGEST), self.texts(".card h3 code"))
        self.assertEqual([], self.all(".left-out"))

    # Limits of each kind but the pictures' are met: by new modes, by all that a step can show, and by too many steps.
    ENDLESS = "".join((
        "PMX_Init\ndisplay-part answer 1s\n",
        *(f"PMX_SetModeEx 0 [ [0], [1, RES_1080P{hertz}HZ], [1, RES_576P], [1, RES_576I] ] {hertz} 0 0\nadvance 20s\n"
          for hertz in (50, 60) * 30), "status\n" * 500))

    def test_a_page_at_its_limits_opens_and_tells_what_is_missing(self):
        page = self.open(written.scenario("endless.pmx", self.ENDLESS))
        self.assertLess(len(self.tabbed()), 60, "however many steps there are")
        self.assertRegex(self.one("#story .waits summary").text, r"^\d+ more waits, \d+ s together$")
        self.assertLess(page.stat().st_size, LARGEST)
        self.assertGreater(page.stat().st_size, LARGEST / 2)
        told = " ".join(self.texts("#story li"))
        self.assertRegex(told, r"\d+ more steps ran that this page leaves out")
        self.assertRegex(told, r"leaves out \d+ lines of the trace and \d+ changes of the state\.")
        self.assertIn("The bars of its time line end at", told)
        self.press(Keys.END)
        self.assertEqual(len(self.all(".card")), self.current())
        browser.look(browsers.NARROW)
        self.assertLessEqual(browser.run("return document.documentElement.scrollWidth"), browsers.NARROW)

    def test_it_fits_on_screens_of_any_kind(self):
        self.open(pages.FIRST_LOOK)
        grounds = set()
        for width in (browsers.WIDE, browsers.NARROW):
            for scheme in (browsers.LIGHT, browsers.DARK):
                browser.look(width, scheme)
                self.assertLessEqual(browser.run("return document.documentElement.scrollWidth"), width)
                grounds.add(browser.run("return getComputedStyle(document.body).backgroundColor"))
        self.assertEqual(2, len(grounds), "light and dark")

    def test_two_runs_fit_side_by_side_unfolded(self):
        self.open(pages.ANSWERS, pages.NEVER)
        self.choose("#other", 1)
        browser.run("for (const one of document.querySelectorAll('details')) one.open = true")
        for width in (browsers.WIDE, browsers.NARROW):
            browser.look(width)
            self.assertLessEqual(browser.run("return document.documentElement.scrollWidth"), width)


class Pictures(PageTest):
    LAST = 8  # step of FIRST_LOOK, behind which graphics are back

    def test_all_of_them_are_whole(self):
        self.open(pages.FIRST_LOOK)
        self.assertEqual(4 * len(pages.commands(pages.FIRST_LOOK)), len(self.all(".picture img")))
        broken = browser.run("""return Promise.all([...document.querySelectorAll(".picture img")].map((image) => {
            image.loading = "eager"; return image.decode().then(() => image.naturalWidth, () => 0); }))
            .then((widths) => widths.filter((width) => width === 0).length)""")
        self.assertEqual(0, broken)

    def test_one_that_is_left_out_is_told(self):
        def leave_out(data):
            steps = data["runs"][0]["steps"][:self.LAST]
            seen = [step["outputs"] for step in steps if step["outputs"]][-1]
            steps[-1]["outputs"] = [dict(output) for output in seen]
            steps[-1]["outputs"][1]["picture"], steps[-1]["left_out"]["pictures"] = None, 1
            return data

        browser.open(written.changed(written.write(pages.FIRST_LOOK), leave_out))
        self.assertEqual(3, len(self.all(f"#step-{self.LAST} .picture img")))
        self.assertIn("left out", self.one(f"#step-{self.LAST} .pictures .nothing").text)
        self.assertIn("leaves out 1 picture.", self.one(f"#step-{self.LAST} .left-out").text)
        browser.run("arguments[0].click()", self.all(f"#step-{self.LAST} .picture")[0])
        self.press(Keys.ARROW_DOWN)
        self.assertIn("This page leaves the picture out.", self.one("#large-text").text)
        self.press(Keys.ESCAPE)

    def test_they_are_what_a_shot_is(self):
        taken = written.folder / "hdmi.png"
        lines = f"{pages.FIRST_LOOK.read_text(encoding='utf-8')}shot hdmi {taken} 640x360\n"
        self.assertEqual(0, written.run("run", "-q", written.scenario("shot.pmx", lines)).returncode)
        self.open(pages.FIRST_LOOK)
        shown = self.one(f"#step-{self.LAST} .picture:nth-child(2) img").get_attribute("src")
        self.assertEqual(taken.read_bytes(), base64.b64decode(shown.partition("base64,")[2], validate=True))

    def test_enter_enlarges_and_arrows_step(self):
        self.open(pages.FIRST_LOOK)
        thumbnail = self.one(f"#step-{self.LAST} .picture:nth-child(2)")
        browser.run("arguments[0].focus()", thumbnail)
        self.press(Keys.ENTER)
        large = self.one("#large[open]")
        self.assertIn(f"HDMI, after step {self.LAST}", self.one("#large-title").text)
        self.assertGreater(self.one("#large-picture").size["width"], 3 * thumbnail.size["width"])
        last = self.one("#large-picture").get_attribute("src")
        self.press(Keys.ARROW_LEFT, Keys.ARROW_LEFT)
        self.assertIn(f"HDMI, after step {self.LAST - 2}", self.one("#large-title").text)
        self.assertEqual(self.LAST - 2, self.current())
        self.assertNotEqual(last, self.one("#large-picture").get_attribute("src"), "graphics were away")
        self.press(Keys.ARROW_DOWN)
        self.assertIn("component, after", self.one("#large-title").text)
        self.press(Keys.ARROW_UP, Keys.ARROW_RIGHT)
        self.assertIn(f"HDMI, after step {self.LAST - 1}", self.one("#large-title").text)
        self.press(Keys.ESCAPE)
        self.assertFalse(large.is_displayed())
        self.assertTrue(browser.run("return document.activeElement === arguments[0]", thumbnail))


    def test_what_is_enlarged_beside_leaves_the_position(self):
        self.open(pages.ANSWERS, pages.NEVER)
        self.choose("#other", 1)
        self.assertEqual(1, self.current())
        browser.run("document.querySelector('#other-step-3 .picture').click()")
        self.assertIn("after step 3", self.one("#large-text[role=status]").text)
        self.press(Keys.ARROW_RIGHT)
        self.assertIn("after step 4", self.one("#large-text").text)
        self.press(Keys.ESCAPE)
        self.assertEqual(1, self.current())
        browser.run("document.activeElement.blur()")
        self.one("body").send_keys(Keys.ARROW_RIGHT)
        self.assertEqual(2, self.current())


class Used(PageTest):
    def test_the_keyboard_steps(self):
        self.open(pages.NEVER)
        count = len(pages.commands(pages.NEVER))
        self.assertEqual(1, self.current())
        self.press(Keys.END)
        self.assertEqual(count, self.current())
        self.press(Keys.ARROW_LEFT)
        self.assertEqual((count - 1, f"step-{count - 1}"), (self.current(), self.active()))
        self.press(Keys.ARROW_RIGHT, Keys.ARROW_RIGHT)
        self.assertEqual(count, self.current(), "there is none behind the last")
        self.press(Keys.HOME)
        self.assertEqual(1, self.current())
        self.press("/")
        self.assertEqual("filter", self.active())
        self.press("a", Keys.ARROW_LEFT)
        self.assertEqual(1, self.current(), "arrows in a field move in it")

    def test_arrows_go_through_a_lane(self):
        self.open(pages.NEVER)
        bars = self.all(".bar.step")
        bars[0].send_keys(Keys.ARROW_RIGHT, Keys.NULL)
        active = lambda: browser.driver.switch_to.active_element  # noqa: E731
        self.assertEqual(bars[1], active())
        self.assertEqual(1, self.current(), "nothing is chosen yet")
        self.press(Keys.END)
        self.assertEqual(bars[-1], active())
        self.press(Keys.ARROW_RIGHT)
        self.assertEqual(bars[-1], active(), "there is none behind the last")
        self.assertEqual([bars[-1]], [bar for bar in bars if bar.get_property("tabIndex") == 0])
        self.press(Keys.HOME, Keys.ARROW_RIGHT)
        self.press(Keys.ENTER)
        self.assertEqual((2, "step-2"), (self.current(), self.active()))

    def test_arrows_go_through_the_story(self):
        self.open(pages.NEVER)
        links = self.all("#story a")
        self.assertLess(1, len(links))
        self.assertEqual([links[0]], [link for link in self.tabbed() if link in links])
        links[0].send_keys(Keys.ARROW_DOWN)
        self.assertEqual(links[1], browser.driver.switch_to.active_element)
        self.press(Keys.ENTER)
        self.assertEqual("step-6", self.active())

    def test_tab_goes_through_the_chosen_step_alone(self):
        def steps():
            return {card for card in browser.run("return arguments[0].map((one) => one.closest('.card')?.id)",
                                                 self.tabbed()) if card}

        self.open(pages.NEVER)
        self.assertEqual({"step-1"}, steps())
        self.press(Keys.END)
        self.press(Keys.TAB)
        self.assertEqual({"step-6"}, steps())
        self.assertTrue(browser.run("return document.activeElement.matches('#step-6 .picture')"))
        self.one("#step-2 .calls summary").click()
        self.assertEqual(({"step-2"}, 2), (steps(), self.current()))
        bars = browser.run("return arguments[0].filter((one) => one.matches('.bar'))", self.tabbed())
        self.assertEqual(len(self.all(".track")), len(bars))

    def test_an_address_names_a_step(self):
        page = self.open(pages.NEVER)
        browser.driver.get("about:blank")
        browser.driver.get(f"{page.as_uri()}#step-3")
        self.assertEqual(3, self.current())

    def test_the_filter_leaves_what_contains_it(self):
        self.open(pages.NEVER)
        self.assertEqual([], self.visible(".entries li"), "folded at first")
        self.one("#filter").send_keys("tve_")
        shown = self.visible(".entries li")
        trace = written.run("run", "--trace-format", "jsonl", pages.NEVER).stdout.splitlines()
        self.assertEqual(sum("TVE_" in line for line in trace), len(shown))
        self.assertTrue(shown and all("TVE_" in line for line in shown), shown)
        self.assertIn(f"{len(shown)} lines", self.one("#found").text)
        self.assertIn("without", self.one("#step-1").get_attribute("class"))
        self.one("#filter").send_keys(Keys.BACKSPACE * 4)
        self.assertEqual([], self.all(".card.without"))
        self.assertEqual("", self.one("#found").text)

    def test_lists_unfold(self):
        self.open(pages.NEVER)
        self.one(f"#step-{HELD_STEP} .calls summary").click()
        self.assertEqual(len(self.all(f"#step-{HELD_STEP} .calls li")), len(self.visible(".entries li")))
        self.one(f"#step-{HELD_STEP} .state summary").click()
        self.assertIn("record.ucMode", " ".join(self.visible(".state th")))

    def test_two_runs_stand_side_by_side(self):
        self.open(pages.ANSWERS, pages.NEVER)
        self.assertIn("display-part-answers", self.one("#title").text)
        self.choose("#run", 1)
        self.assertIn("display-part-never-answers", self.one("#title").text)
        self.choose("#other", 0)
        self.assertEqual(pages.commands(pages.NEVER), self.texts("[id^=step-] h3 code"))
        self.assertEqual(pages.commands(pages.ANSWERS), self.texts("[id^=other-step-] h3 code"))
        self.assertIn("no such step in this run", self.texts(".nothing"))
        self.assertIn("Both do the same, and look the same.", self.texts(".apart"))
        self.choose("#other", 1)
        self.assertEqual({"Both do the same, and look the same."}, set(self.texts(".apart")), "beside itself")

    def test_what_differs_between_two_runs_is_named(self):
        one = written.scenario("one.pmx", "PMX_Init\nPMX_GetTvType 0\n")
        other = written.scenario("other.pmx", "PMX_Init\nPMX_SetTvType 0 PMX_TV_TYPE_PAL\nPMX_GetTvType 0\n")
        self.open(one, other)
        self.choose("#other", 1)
        self.assertIn("*pucTvType = PMX_TV_TYPE_NTSC", self.texts(".apart .gone"))
        self.assertIn("*pucTvType = PMX_TV_TYPE_PAL", self.texts(".apart .new"))


    ANSWER = ("PMX_Init\ndisplay-part answer {}\n"
              "PMX_SetModeEx 0 [ [0], [1, RES_1080P50HZ], [1, RES_576P], [1, RES_576I] ] 50 0 0\nadvance 20s\n")

    def test_how_two_runs_differ_is_told_in_words(self):
        one, other = (written.scenario(f"{time}.pmx", self.ANSWER.format(time)) for time in ("2s", "3s"))
        self.open(one, other)
        self.assertFalse(self.one("#beside").is_displayed())
        self.choose("#other", 1)
        self.assertIn("Graphics waited: 2 s here, 3 s there.", self.texts("#compared li"))
        self.choose("#other", 0)
        self.assertEqual(["Both do the same, and look the same."], self.texts("#compared li"))

    def test_time_lines_and_stories_of_both_runs_stand_beside_each_other(self):
        self.open(*(written.scenario(f"{time_}.pmx", self.ANSWER.format(time_)) for time_ in ("2s", "3s")))
        self.choose("#other", 1)
        self.one("#scale").click()
        held = [self.one(f".side-{side} .bar.held") for side in (0, 1)]
        self.assertAlmostEqual(2 / 3, held[0].size["width"] / held[1].size["width"], delta=0.02)
        self.assertLess(held[0].rect["y"], held[1].rect["y"])
        self.assertEqual(len(self.all(".side-0")), len(self.all(".side-1")))
        stories = self.texts("#story .story")
        for story, time_ in zip(stories, ("2 s", "3 s"), strict=True):
            self.assertIn(f"No graphics for {time_}", story)
        above = [self.one(part).rect["y"] for part in ("#compared", "#story", "#whose", "#lanes")]
        self.assertEqual(sorted(above), above)
        self.assertIn("2s.pmx. Below: ", self.one("#whose").text)
        held[1].click()
        self.assertEqual((3, "other-step-3"), (self.current(), self.active()))
        self.all("#story .story:nth-child(2) a")[1].click()
        self.assertEqual((4, "other-step-4"), (self.current(), self.active()))
        browser.run("document.querySelector('#other-step-3 .picture').click()")
        self.assertIn("3s.pmx", self.one("#large-title").text)
        self.press(Keys.ESCAPE)
        for width in (browsers.WIDE, browsers.NARROW):
            browser.look(width)
            self.assertLessEqual(browser.run("return document.documentElement.scrollWidth"), width)

    def test_one_scenario_runs_on_two_boards(self):
        self.open("--board", "default", "--board", "bedroom-player", pages.SCENARIOS / "frequency-change.pmx")
        self.choose("#other", 1)
        self.assertIn("on board bedroom player", self.one("#title").text)
        self.assertIn("Boards: default here, bedroom player there.", self.texts("#compared li"))

    def test_pictures_that_differ_stand_beside_each_other(self):
        one = written.scenario("whole.pmx", "PMX_Init\nPMX_SetMuteEnable 0 0\n")
        other = written.scenario("muted.pmx", "PMX_Init\nPMX_SetMuteEnable 0 0\nPMX_SetMuteEnable 0 1\n"
                                              "PMX_SetMuteEnable 0 0\n")
        self.open(one, other)
        self.choose("#other", 1)
        self.assertEqual([], self.all(".apart-pictures"))
        browser.open(written.changed(written.write(one, other), self.another_picture))
        self.choose("#other", 1)
        self.assertEqual(2, len(self.all(".apart-pictures img")))

    def test_a_picture_that_is_left_out_differs_from_none(self):
        def leave_out(data):
            steps = self.another_picture(data)["runs"][1]["steps"]
            steps[0]["outputs"][0]["picture"] = None
            return data

        muted = written.scenario("muted.pmx", "PMX_Init\nPMX_SetMuteEnable 0 1\nPMX_SetMuteEnable 0 0\n")
        browser.open(written.changed(written.write(muted, muted), leave_out))
        self.choose("#other", 1)
        self.assertEqual([], self.all(".apart-pictures"))
        self.assertTrue(any("left out" in text for text in self.texts(".nothing")))
        self.assertFalse(any("changed; left out" in text for text in self.texts(".nothing")))

    @staticmethod
    def another_picture(data):
        data["pictures"].append(data["pictures"][0])
        first, second = data["runs"][1]["steps"][:2]
        second["outputs"] = [dict(output) for output in first["outputs"]]
        first["outputs"][0]["picture"] = len(data["pictures"]) - 1
        return data

    def test_long_lists_are_compared_in_bearable_time(self):
        self.open(pages.NEVER)
        script = '''const many = (salt) => Array.from({ length: 20000 }, (_, i) => `${i % 7}-${(i * salt) % 9001}`);
            const begin = performance.now();
            const same = aligned(many(3), many(3)).every(([i, j]) => i === j);
            const other = aligned(["a", ...many(3), "z"], ["a", ...many(5), "z"]);
            const whole = [0, 1].every((side) =>
              new Set(other.map((pair) => pair[side]).filter((at) => at >= 0)).size === 20002);
            return [same, whole, other[0], other.at(-1), performance.now() - begin]'''
        same, whole, first, last, took_ms = browser.run(script)
        self.assertTrue(same and whole)
        self.assertEqual(([0, 0], [20001, 20001]), (first, last))
        self.assertLess(took_ms, 5000)
        self.assertEqual([[0, 0], [1, -1], [2, 1], [-1, 2]],
                         browser.run("return aligned(['a', 'b', 'c'], ['a', 'c', 'd'])"))


class TheWatch(unittest.TestCase):
    """What finds nothing in these pages would find something."""

    def test_it_sees_complaints_and_requests(self):
        page = written.folder / "bad.html"
        page.write_text('<!DOCTYPE html><img src="missing.png" alt=""><script>console.error("no")</script>',
                        encoding="utf-8")
        browser.look()
        browser.open(page)
        self.assertEqual([page.as_uri(), (written.folder / "missing.png").as_uri()], browser.requests())
        self.assertTrue(any('"no"' in complaint for complaint in browser.complaints()))


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1] + sys.argv[2:])
