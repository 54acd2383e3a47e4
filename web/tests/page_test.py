"""The page in headless Chromium, opened as a file: types, reads the answers, takes pictures.

page_test.py PAGE PICTURES
"""

import base64
import pathlib
import sys
import time
from typing import Callable

from selenium import webdriver
from selenium.webdriver.common.action_chains import ActionChains
from selenium.webdriver.common.by import By
from selenium.webdriver.common.keys import Keys
from selenium.webdriver.support.ui import Select, WebDriverWait

PATIENCE = 60  # seconds


def browser(width: int, dark: bool) -> webdriver.Chrome:
    options = webdriver.ChromeOptions()
    for argument in ("--headless=new", "--no-sandbox", "--disable-gpu", f"--window-size={width},1100"):
        options.add_argument(argument)
    driver = webdriver.Chrome(options=options)
    driver.execute_cdp_cmd("Emulation.setDeviceMetricsOverride",
                           {"width": width, "height": 1100, "deviceScaleFactor": 1, "mobile": width < 500})
    driver.execute_cdp_cmd("Emulation.setEmulatedMedia",
                           {"features": [{"name": "prefers-color-scheme", "value": "dark" if dark else "light"}]})
    return driver


# The visible elements with text of their own whose colours have a contrast below 4.5 (WCAG 2.1, 1.4.3).
CONTRAST = """
const channels = (color) => color.match(/[\\d.]+/g).map(Number);
const light = (color) => channels(color).slice(0, 3).map((c) => c / 255)
    .map((c) => (c <= 0.03928 ? c / 12.92 : ((c + 0.055) / 1.055) ** 2.4))
    .reduce((sum, c, i) => sum + c * [0.2126, 0.7152, 0.0722][i], 0);
const behind = (element) => {
    for (let each = element; each; each = each.parentElement) {
        const color = getComputedStyle(each).backgroundColor;
        if (channels(color)[3] !== 0) return color;
    }
    throw new Error('the page has no background');
};
const hasText = (element) => [...element.childNodes].some((node) => node.nodeType === 3 && node.data.trim());
const texts = [...document.body.querySelectorAll('*')].filter((element) => hasText(element) && element.checkVisibility());
if (texts.length < 15) throw new Error('there are only ' + texts.length + ' texts');
return texts.map((element) => {
    const [a, b] = [light(getComputedStyle(element)[element.closest('svg') ? 'fill' : 'color']), light(behind(element))];
    return [element.outerHTML.slice(0, 80), (Math.max(a, b) + 0.05) / (Math.min(a, b) + 0.05)];
}).filter(([, contrast]) => contrast < 4.5);
"""


class Page:
    """What somebody at the page does and sees."""

    def __init__(self, driver: webdriver.Chrome, address: str) -> None:
        self.driver = driver
        driver.get(address)

    def element(self, name: str):
        return self.driver.find_element(By.ID, name)

    def text(self, name: str) -> str:
        return self.element(name).text

    def fill(self, name: str, text: str) -> None:
        self.element(name).send_keys(Keys.CONTROL, "a")
        self.element(name).send_keys(text or Keys.DELETE)

    def await_that(self, what: str, condition: Callable[[], bool]) -> None:
        WebDriverWait(self.driver, PATIENCE, 0.05).until(lambda _: condition(), f"{what}; problem: {self.text('problem')!r}")

    def await_text(self, name: str, text: str) -> None:
        self.await_that(f"{name} is {text!r}, not {self.text(name)!r}", lambda: self.text(name) == text)

    def open_details(self) -> None:
        for summary in self.driver.find_elements(By.TAG_NAME, "summary"):
            summary.click()

    def picture(self, path: pathlib.Path) -> None:
        """All of the page, also what is below the screen."""
        picture = self.driver.execute_cdp_cmd("Page.captureScreenshot", {"captureBeyondViewport": True})
        path.write_bytes(base64.b64decode(picture["data"]))

    def check_width(self) -> None:
        wide = self.driver.execute_script("return document.documentElement.scrollWidth - window.innerWidth")
        assert wide <= 0, f"the page is {wide} pixels wider than the screen"

    def check_contrast(self) -> None:
        """Every text differs from its background as much as the guidelines for accessible content want."""
        poor = self.driver.execute_script(CONTRAST)
        assert not poor, poor

    def check_names(self) -> None:
        """Everything that takes input has a name for a screen reader."""
        for element in self.driver.find_elements(By.CSS_SELECTOR, "input, textarea, select, button, iframe"):
            if element.is_displayed():
                assert element.accessible_name, f"#{element.get_attribute('id')} has no name"


def check_condition(page: Page) -> None:
    Select(page.element("language")).select_by_visible_text("C")
    page.fill("first", "F & 4")
    page.fill("second", "F & 6")
    page.await_text("shortest", "F&4")
    page.await_text("other", "bitand(F,4)")
    page.await_that("relation", lambda: page.text("relation").startswith("implies; second alone: F=2"))
    page.fill("second", "")
    page.await_that("no relation", lambda: page.text("relation") == "")
    page.fill("first", "A > 1 && = 2")
    page.await_that("a caret", lambda: page.text("problem").endswith("^") and "A > 1 && = 2" in page.text("problem"))
    page.fill("first", "x > 1 && y")
    page.fill("assume", "x > 2")
    page.await_text("shortest", "y")
    page.await_that("the map says what else decides", lambda: "x=3: depends" in map_text(page) or "x=3, y=1: holds" in map_text(page))
    page.fill("first", "x >= 0 && y >= 0 && x + 2*y <= 12 && x != y")
    page.fill("assume", "")


def holds(x: int, y: int) -> bool:
    return x >= 0 and y >= 0 and x + 2 * y <= 12 and x != y


def map_text(page: Page) -> str:
    return page.driver.execute_script("return document.getElementById('map').textContent")


def check_forms(page: Page) -> None:
    """The other views of one condition, in both languages."""
    page.open_details()
    page.fill("first", "Mode != 2 && (Mode > 2 || Sport)")
    page.await_text("directive", "#if Mode != 2 && (Mode > 2 || Sport)")
    page.await_text("normal", "Mode>2 || Mode!=2 && Sport")
    page.fill("assume", "Mode == 1 || Mode == 2")
    page.await_text("shortest", "Mode!=2 && Sport")
    page.await_that("all answers", lambda: "stale" not in page.element("answers").get_attribute("class"))
    assert page.text("problem") == "", page.text("problem")
    page.await_that("steps", lambda: "= Mode!=2 && Sport" in page.text("steps"))
    page.await_that("a tree", lambda: page.text("tree").startswith("And &&"))
    page.fill("assume", "")
    page.fill("first", "A==1 && B")
    page.await_that("cells that a third name decides", lambda: "A=1, B=0: does not hold" in map_text(page))
    page.fill("first", "A==1 && B && C")
    page.await_that("cells that a third name decides", lambda: "A=1, B=1: C" in map_text(page))
    Select(page.element("up")).select_by_visible_text("C")
    page.await_that("another axis", lambda: "A=1, C=1: B" in map_text(page))
    Select(page.element("language")).select_by_visible_text("Quill")
    page.fill("first", "~(A==1)")
    page.await_text("other", "!(A==1)")


def check_examples(page: Page) -> None:
    select = Select(page.element("example"))
    names = [option.text for option in select.options[1:]]
    assert len(names) >= 6, names
    for name in names:
        before = page.text("tree") if page.element("tree").is_displayed() else ""
        select.select_by_visible_text(name)
        page.await_that(f"the answer of {name}", lambda: page.text("tree") != before and "stale" not in page.element("answers").get_attribute("class"))
        assert page.text("problem") == "", (name, page.text("problem"))
        assert page.text("shortest"), name
        assert select.first_selected_option.text == name
    page.fill("first", "A > 1")
    page.await_text("shortest", "A>1")
    assert select.first_selected_option.text == "(yours)"


def check_map(page: Page) -> None:
    """Each cell against the condition itself."""
    page.await_that("the map of this condition", lambda: "x=12, y=0: holds" in map_text(page))
    cells = page.driver.execute_script(
        "return [...document.querySelectorAll('#map rect')].map(r => [r.textContent, r.getAttribute('class')])")
    for text, kind in cells:
        place, _ = text.split(": ")
        x, y = (int(part.split("=")[1]) for part in place.split(", "))
        assert kind == ("cell-yes" if holds(x, y) else "cell-no"), (text, kind)


def check_keyboard(page: Page) -> None:
    """Everything is reached by the keyboard alone, in the order of the page."""
    page.driver.execute_script("document.activeElement.blur(); window.scrollTo(0, 0)")
    page.element("tab-condition").send_keys("")
    reached = ["tab-condition"]
    for _ in range(12):
        ActionChains(page.driver).send_keys(Keys.TAB).perform()
        reached.append(page.driver.switch_to.active_element.get_attribute("id"))
    assert reached[:8] == ["tab-condition", "example", "language", "first", "assume", "second", "across", "up"], reached
    page.element("tab-condition").send_keys(Keys.ARROW_RIGHT)
    page.await_that("findings", lambda: "Engine/Hydrogen is never active" in page.text("findings"))
    assert page.driver.switch_to.active_element.get_attribute("id") == "tab-model"
    page.driver.switch_to.frame("matrix")
    WebDriverWait(page.driver, PATIENCE).until(lambda d: d.find_elements(By.TAG_NAME, "table"))
    page.driver.switch_to.default_content()


def check_state(page: Page) -> None:
    """An address opens what it was copied from."""
    page.element("tab-condition").click()
    page.fill("first", "Mode == 7")
    page.await_text("shortest", "Mode==7")
    page.await_that("the address", lambda: "Mode" in page.driver.current_url)
    address = page.driver.current_url
    assert f"v={page.text('version')}" in address, address
    page.driver.get("about:blank")
    page.driver.get(address)
    page.await_text("shortest", "Mode==7")
    page.element("tab-model").click()
    page.fill("source", '{"blocks": 3}')
    page.await_that("what is wrong", lambda: "write a list" in page.text("model-problem"))
    address = page.driver.current_url
    page.driver.get("about:blank")
    page.driver.get(address)
    page.await_that("the model of the address", lambda: "write a list" in page.text("model-problem"))


def check_look(page: Page, path: pathlib.Path) -> None:
    page.check_width()
    page.check_names()
    page.check_contrast()
    page.picture(path)


def main() -> None:
    path, pictures = pathlib.Path(sys.argv[1]).resolve(), pathlib.Path(sys.argv[2])
    pictures.mkdir(parents=True, exist_ok=True)
    for width, dark in ((1200, False), (1200, True), (390, False), (390, True)):
        driver = browser(width, dark)
        colors = "dark" if dark else "light"
        try:
            begin = time.monotonic()
            page = Page(driver, path.as_uri())
            page.await_text("shortest", "x==4")
            print(f"{width} px, {colors}: first answer after {time.monotonic() - begin:.2f} s")
            check_forms(page)
            check_examples(page)
            check_condition(page)
            check_map(page)
            check_look(page, pictures / f"condition-{width}-{colors}.png")
            check_keyboard(page)
            check_look(page, pictures / f"model-{width}-{colors}.png")
            check_state(page)
            severe = [entry for entry in driver.get_log("browser") if entry["level"] == "SEVERE"]
            assert not severe, severe
        finally:
            driver.quit()
    print("the page works")


main()
