"""The page in headless Chromium, opened as a file: types, reads the answers, takes pictures.

page_test.py PAGE PICTURES
"""

import pathlib
import sys
import time
from typing import Callable

from selenium import webdriver
from selenium.webdriver.common.by import By
from selenium.webdriver.common.keys import Keys
from selenium.webdriver.support.ui import WebDriverWait

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

    def picture(self, path: pathlib.Path) -> None:
        path.write_bytes(self.driver.get_screenshot_as_png())

    def check_width(self) -> None:
        wide = self.driver.execute_script("return document.documentElement.scrollWidth - window.innerWidth")
        assert wide <= 0, f"the page is {wide} pixels wider than the screen"

    def check_names(self) -> None:
        """Everything that takes input has a name for a screen reader."""
        for element in self.driver.find_elements(By.CSS_SELECTOR, "input, textarea, select, button, iframe"):
            if element.is_displayed():
                assert element.accessible_name, f"#{element.get_attribute('id')} has no name"


def check_condition(page: Page) -> None:
    page.await_text("shortest", "x==4")
    page.fill("first", "F & 4")
    page.fill("second", "F & 6")
    page.await_text("shortest", "F&4")
    page.await_text("other", "bitand(F,4)")
    page.await_that("relation", lambda: page.text("relation").startswith("implies; second alone: F=2"))
    page.fill("second", "")
    page.await_that("no relation", lambda: page.text("relation") == "")
    page.fill("first", "A > 1 && = 2")
    page.await_that("a caret", lambda: page.text("problem").endswith("^") and "A > 1 && = 2" in page.text("problem"))
    page.fill("first", "x*x >= 0 || y")
    page.fill("assume", "x > 2")
    page.fill("first", "x >= 0 && y >= 0 && x + 2*y <= 12 && x != y")
    page.fill("assume", "")


def holds(x: int, y: int) -> bool:
    return x >= 0 and y >= 0 and x + 2 * y <= 12 and x != y


def check_map(page: Page) -> None:
    """Each cell against the condition itself."""
    page.await_that("the map of this condition", lambda: "x=12, y=0: holds" in page.driver.execute_script(
        "return document.getElementById('map').textContent"))
    cells = page.driver.execute_script(
        "return [...document.querySelectorAll('#map rect')].map(r => [r.textContent, r.getAttribute('class')])")
    for text, kind in cells:
        place, _ = text.split(": ")
        x, y = (int(part.split("=")[1]) for part in place.split(", "))
        assert kind == ("cell-yes" if holds(x, y) else "cell-no"), (text, kind)


def check_keyboard(page: Page) -> None:
    page.element("tab-condition").send_keys(Keys.ARROW_RIGHT)
    page.await_that("findings", lambda: "dead" in page.text("findings"))
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
    page.driver.get("about:blank")
    page.driver.get(address)
    page.await_text("shortest", "Mode==7")


def main() -> None:
    path, pictures = pathlib.Path(sys.argv[1]).resolve(), pathlib.Path(sys.argv[2])
    pictures.mkdir(parents=True, exist_ok=True)
    for width, dark in ((1200, False), (390, True)):
        driver = browser(width, dark)
        try:
            begin = time.monotonic()
            page = Page(driver, path.as_uri())
            page.await_text("shortest", "x==4")
            print(f"{width} px: first answer after {time.monotonic() - begin:.2f} s")
            check_condition(page)
            check_map(page)
            page.check_width()
            page.check_names()
            page.picture(pictures / f"condition-{width}.png")
            check_keyboard(page)
            page.check_width()
            page.check_names()
            page.picture(pictures / f"model-{width}.png")
            check_state(page)
            severe = [entry for entry in driver.get_log("browser") if entry["level"] == "SEVERE"]
            assert not severe, severe
        finally:
            driver.quit()
    print("the page works")


main()
