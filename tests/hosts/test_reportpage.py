"""The page of --report, as a browser shows it."""

from __future__ import annotations

import io
import json
import shutil
import subprocess

import numpy as np
import pytest
from matplotlib.image import imread
from selenium import webdriver

# Weights, missing data, two targets of which one has three categories, and names that HTML would misread.
COLOURS = ["red", "green", "<i>"]
DATA = "x,<b>&y,buyer,colour,n\n" + "".join(
    f"{i if i % 7 else ''},{i + (i * 37) % 90},{'yes' if i > 120 else 'no'},{COLOURS[i // 70]},{1 + i % 3}\n"
    for i in range(200)
)

CELLS = """return [...document.querySelectorAll('section')].map(section =>
    [...section.querySelectorAll('table.bins tr')].map(row => [...row.cells].map(cell => cell.textContent)))"""

# Of each rectangle of a chart: where it is on the page, its class, and its colour and that of the class in the key.
RECTANGLES = """return [...document.querySelectorAll('section')].map(section =>
    [...section.querySelectorAll('rect')].map(rect => {
        const box = rect.getBoundingClientRect();
        const kind = rect.getAttribute('class'), key = section.querySelector('.key .' + kind);
        return {kind, x: box.x + box.width / 2, y: box.y + box.height / 2, height: box.height,
                fill: getComputedStyle(rect).fill, key: key && getComputedStyle(key).backgroundColor};
    }))"""

INK_AND_GROUND = """const style = getComputedStyle(document.body); return [style.color, style.backgroundColor]"""


@pytest.fixture(scope="module")
def browser(tmp_path_factory):
    chromium, driver = shutil.which("chromium"), shutil.which("chromedriver")
    if not (chromium and driver):
        pytest.skip("needs chromium and chromedriver")
    options = webdriver.ChromeOptions()
    options.binary_location = chromium
    for name in ("headless", "no-sandbox", "disable-gpu", "hide-scrollbars", "disable-background-networking"):
        options.add_argument(f"--{name}")
    options.add_argument(f"--user-data-dir={tmp_path_factory.mktemp('chromium')}")
    started = webdriver.Chrome(options=options, service=webdriver.ChromeService(driver))
    yield started
    started.quit()


@pytest.fixture(scope="module")
def findings(mcbin, browser, tmp_path_factory):
    """Opens the page in the browser. Gives what the tool has found, in the order of the page: by gain."""
    directory = tmp_path_factory.mktemp("report")
    (directory / "data.csv").write_text(DATA)
    arguments = ["--pairs", "*:buyer,*:colour", "--weight", "n", "--format", "json", "--report", "page.html"]
    done = subprocess.run([mcbin, "supervised", "data.csv", *arguments], cwd=directory, capture_output=True, check=True)
    browser.set_window_size(900, 6000)
    browser.get((directory / "page.html").as_uri())
    results = [result for result in json.loads(done.stdout)["results"] if result["cut_points"]]
    return sorted(results, key=lambda result: result["model_entropy"] - result["target_entropy"])


def groups_of(result):
    """The bins, and the missing if there are any."""
    return result["bins"] + [result["missing"]] * (result["missing"]["weight"] > 0)


def test_the_tables_hold_the_weights_that_were_found(browser, findings):
    sections = browser.execute_script(CELLS)

    assert len(findings) == len(sections) == 4
    for result, (head, *rows) in zip(findings, sections):
        categories = len(result["bins"][0]["weights"])
        groups = groups_of(result)
        others = ["missing"] * (len(groups) - len(result["bins"])) + ["total"]
        assert [row[0] for row in rows[len(result["bins"]) :]] == others
        for bin, row in zip(groups, rows):
            assert [float(cell) for cell in [row[1], *row[3 : 3 + categories]]] == [bin["weight"], *bin["weights"]]
        assert ("WoE" in head) == (categories == 2)


def test_the_charts_have_the_shares_as_heights_and_the_colours_of_their_key(browser, findings):
    screen = (imread(io.BytesIO(browser.get_screenshot_as_png())) * 255).round().astype(int)

    for result, rectangles in zip(findings, browser.execute_script(RECTANGLES)):
        shares = [r for r in rectangles if r["kind"] != "weight"]
        weights = [r["height"] for r in rectangles if r["kind"] == "weight"]
        groups = groups_of(result)
        expected = [w / group["weight"] for group in groups for w in group["weights"] if w > 0]
        full = sum(r["height"] for r in shares) / len(groups)
        assert np.allclose([r["height"] / full for r in shares], expected, atol=1e-3)
        found = [group["weight"] for group in groups]
        assert np.allclose(np.divide(weights, max(weights)), np.divide(found, max(found)), atol=1e-3)
        for r in shares:
            assert r["fill"] == r["key"]
            if r["height"] > 2:
                assert f"rgb({', '.join(map(str, screen[int(r['y']), int(r['x']), :3]))})" == r["fill"]


def test_names_are_text_and_nothing_is_loaded_or_run(browser, findings):
    headings = browser.execute_script("return [...document.querySelectorAll('h2')].map(h => h.textContent)")
    assert {f"{result['attribute']} by {result['target']}" for result in findings} <= set(headings)
    assert "<b>&y" in "".join(headings)

    assert browser.execute_script("return document.querySelectorAll('script, link, img, iframe').length") == 0
    assert browser.execute_script("return performance.getEntriesByType('resource').length") == 0


def test_the_page_fits_a_phone(browser, findings):
    phone = {"width": 360, "height": 740, "deviceScaleFactor": 2, "mobile": True}
    browser.execute_cdp_cmd("Emulation.setDeviceMetricsOverride", phone)
    width = browser.execute_script("return document.scrollingElement.scrollWidth")
    browser.execute_cdp_cmd("Emulation.clearDeviceMetricsOverride", {})

    assert width <= 360


@pytest.mark.parametrize("scheme", ["light", "dark"])
def test_the_text_stands_out_from_the_ground(browser, findings, scheme):
    def read_luminance(colour: str) -> float:
        channels = np.array([int(channel) for channel in colour[4:-1].split(",")]) / 255
        linear = np.where(channels > 0.04045, ((channels + 0.055) / 1.055) ** 2.4, channels / 12.92)
        return float(linear @ [0.2126, 0.7152, 0.0722])

    features = [{"name": "prefers-color-scheme", "value": scheme}]
    browser.execute_cdp_cmd("Emulation.setEmulatedMedia", {"features": features})
    ink, ground = map(read_luminance, browser.execute_script(INK_AND_GROUND))

    assert (ink > ground) == (scheme == "dark")
    assert (max(ink, ground) + 0.05) / (min(ink, ground) + 0.05) >= 7  # what the guidelines on contrast want


def test_the_page_of_an_evaluation_has_both_populations_side_by_side(mcbin, browser, tmp_path):
    head, *rows = DATA.splitlines(keepends=True)
    (tmp_path / "first.csv").write_text(DATA)
    (tmp_path / "second.csv").write_text(head + "".join(rows[50:]))
    command = f"{mcbin} supervised first.csv --target buyer --format json >bins.json"
    subprocess.run(["bash", "-c", command], cwd=tmp_path, check=True)
    call = [mcbin, "evaluate", "bins.json", "second.csv", "--report", "page.html", "--format", "json"]
    done = subprocess.run(call, cwd=tmp_path, capture_output=True, check=True)
    browser.get((tmp_path / "page.html").as_uri())

    document = json.loads(done.stdout)
    sections = browser.execute_script(CELLS)
    assert len(sections) == len(document["attributes"]) > 1
    for attribute, first, second, (_, _, *shown) in zip(
        document["attributes"], document["first"]["results"], document["second"]["results"], sections
    ):
        assert len(shown) == len(attribute["parts"]) + 1
        for part, then, now, row in zip(attribute["parts"], groups_of(first), groups_of(second), shown):
            assert [float(row[2]), float(row[6])] == [then["weight"], now["weight"]]
            assert row[1] == part["label"] and float(row[-1]) == pytest.approx(part["stability"], abs=1e-4)
    heights = browser.execute_script(
        "return [...document.querySelectorAll('section:first-of-type rect.second')].map(r => +r.getAttribute('height'))"
    )
    found = [group["weight"] for group in groups_of(document["second"]["results"][0])]
    assert np.allclose(np.divide(heights, sum(heights)), np.divide(found, sum(found)), atol=1e-3)
    assert browser.execute_script("return document.querySelectorAll('script, link, img').length") == 0
    browser.set_window_size(900, 6000)
