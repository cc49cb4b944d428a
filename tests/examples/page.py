#!/usr/bin/env python3
"""page.py BUILD [PICTURE]: opens the page of a made series in a headless browser, without a network, and uses it."""
import os, shutil, subprocess, sys, tempfile

try:
    from selenium import webdriver
    from selenium.webdriver.chrome.service import Service
    from selenium.webdriver.common.by import By
    from selenium.webdriver.common.keys import Keys
    from selenium.webdriver.support.ui import WebDriverWait
except ImportError:
    print("skipped: the page in a browser, python3-selenium is not installed")
    sys.exit(0)
if not shutil.which("chromium") or not shutil.which("chromedriver"):
    print("skipped: the page in a browser, chromium is not installed")
    sys.exit(0)

road = os.path.join(os.path.realpath(sys.argv[1]), "examples/volume-road/volume-road")
scratch = tempfile.mkdtemp()
os.environ["SE_OFFLINE"] = "true"
options = webdriver.ChromeOptions()
options.binary_location = shutil.which("chromium")
for option in ("--headless", "--no-sandbox", "--disable-gpu", "--disable-quic", "--no-first-run", "--disable-background-networking",
               "--disable-component-update", "--disable-sync", "--window-size=1300,1100", f"--user-data-dir={scratch}/profile"):
    options.add_argument(option)
browser = None
try:
    subprocess.run([road, "make-series", "--phantom", scratch + "/series"], check=True, capture_output=True)
    os.remove(scratch + "/series/image0050.dcm")
    subprocess.run([road, "run", scratch + "/series", scratch + "/out"], check=True, capture_output=True)
    text = open(scratch + "/out/index.html").read()
    assert "http://" not in text and "https://" not in text, "the page names an address"
    browser = webdriver.Chrome(service=Service(shutil.which("chromedriver")), options=options)
    page = "file://" + scratch + "/out/index.html"

    def ready():
        WebDriverWait(browser, 30).until(lambda b: b.execute_script("return document.body && document.body.dataset.ready") == "yes")

    def pixel(view, x, y):
        """A pixel of a picture, in voxels."""
        return browser.execute_script(
            "const c = document.querySelectorAll('canvas')[arguments[0]];"
            "return [...c.getContext('2d').getImageData(arguments[1], arguments[2], 1, 1).data].slice(0, 3);", view, x, y)

    def where(view):
        return browser.execute_script("return document.querySelectorAll('.view header span + span')[arguments[0]].textContent", view)

    def checksum(view):
        return browser.execute_script(
            "const c = document.querySelectorAll('canvas')[arguments[0]];"
            "return c.getContext('2d').getImageData(0, 0, c.width, c.height).data.reduce((h, v) => (h * 31 + v) % 1000003, 7);", view)

    browser.get(page)
    ready()
    assert not [line for line in browser.get_log("browser") if line["level"] == "SEVERE"], browser.get_log("browser")
    assert [where(i) for i in range(3)] == ["65 of 128", "129 of 256", "129 of 256"], [where(i) for i in range(3)]
    letters = [e.text for e in browser.find_elements(By.CSS_SELECTOR, ".letter")]
    assert letters == ["L", "A", "R", "P", "L", "H", "R", "F", "P", "H", "A", "F"], letters
    assert "1 slice(s) missing after" in browser.find_element(By.ID, "warnings").text
    assert "256 x 256 x 127 voxels of short" in browser.find_element(By.ID, "report").text

    slider = browser.find_element(By.ID, "axial")
    before = checksum(0)
    slider.send_keys(Keys.ARROW_RIGHT)
    assert where(0) == "66 of 128", where(0)
    slider.send_keys(Keys.HOME)
    assert where(0) == "1 of 128" and checksum(0) != before
    # The tumour of the phantom, 980, lies 36 mm to the left, 30 to the back and 22 to the head; its outer shell is bright.
    browser.execute_script("arguments[0].value = 83; arguments[0].dispatchEvent(new Event('input'))", slider)
    shell, core = pixel(0, 36 + 128 + 7, 30 + 128)[0], pixel(0, 36 + 128, 30 + 128)[0]
    assert shell > 200 > core, (shell, core)
    centre = browser.find_element(By.ID, "center")
    browser.execute_script("arguments[0].value = 3000; arguments[0].dispatchEvent(new Event('change'))", centre)
    assert pixel(0, 36 + 128 + 7, 30 + 128)[0] == 0
    body = browser.find_element(By.TAG_NAME, "body")
    body.send_keys("1")
    assert pixel(0, 36 + 128 + 7, 30 + 128)[0] == shell
    canvas = browser.find_elements(By.TAG_NAME, "canvas")[0]
    width = browser.find_element(By.ID, "width").get_attribute("value")
    webdriver.ActionChains(browser).move_to_element(canvas).click_and_hold().move_by_offset(40, 30).release().perform()
    assert browser.find_element(By.ID, "width").get_attribute("value") != width
    canvas.send_keys(Keys.ARROW_UP)
    assert where(0) == "85 of 128", where(0)
    marked = checksum(0)
    body.send_keys("o")
    assert checksum(0) != marked and not browser.find_element(By.ID, "outline").is_selected()

    backgrounds = []
    for theme in ("light", "dark"):
        browser.get("about:blank")
        browser.get(f"{page}#theme={theme}&axial=83&coronal=158")
        ready()
        backgrounds.append(browser.execute_script("return getComputedStyle(document.body).backgroundColor"))
        assert where(0) == "84 of 128" and where(1) == "159 of 256"
    assert backgrounds[0] != backgrounds[1], backgrounds
    picture = sys.argv[2] if len(sys.argv) > 2 else scratch + "/page.png"
    assert browser.save_screenshot(picture) and os.path.getsize(picture) > 50000
finally:
    if browser:
        browser.quit()
    shutil.rmtree(scratch, ignore_errors=True)
print("passed")
