"""What an operator sees of calls in a browser: page.py PORT-OF-PAGE PORT-OF-BROWSER FOLDER GATEWAYCTL SOCKET up|clear|over"""
import json
import subprocess
import sys

from browser import Browser

page, port, folder, gatewayctl, socket, case = sys.argv[1:]
ROWS = "[...document.querySelectorAll('table')].map(t => [...t.querySelectorAll('tbody tr')].map(r => [...r.cells].map(c => c.innerText)))"
EVENTS = "[...document.querySelectorAll('#ladder g')].map(g => [g.dataset.event, g.dataset.text])"


def recorded(call):
    """The events of the ladder, as the recorder has them."""
    lines = subprocess.run([gatewayctl, "--socket", socket, "--json", "call", str(call)], check=True, capture_output=True).stdout
    return [[line["event"], line["text"]] for line in map(json.loads, lines.splitlines()) if "event" in line]


browser = Browser(int(port), folder)
try:
    browser.open(f"http://127.0.0.1:{page}/calls")
    if case == "up":
        browser.wait_for("document.getElementById('state').innerText === 'serving, 1 up'")
        up, known = browser.evaluate(ROWS)
        assert up[0][0] == "1" and up[0][2:4] == ["answered", "a alice - b bob"], up
        assert known[0][0] == "1" and known[0][2:4] == ["up", "alice - bob"], known

        # by keyboard: search, and open what is there
        browser.press("/")
        for key in "carol":
            browser.press(key)
        browser.wait_for("document.querySelectorAll('tr[data-call]').length === 0")
        browser.open(f"http://127.0.0.1:{page}/calls#search=ALICE")
        browser.wait_for("document.querySelectorAll('tr[data-call]').length === 2")
        browser.press("Escape")  # leaves the search
        for _ in range(10):  # a page whose question was refused, since others ask, has no rows for a moment
            browser.wait_for("document.querySelectorAll('tr[data-call]').length === 2")
            browser.press("j")
            browser.press("Enter")
            if browser.evaluate("location.hash") == "#call=1":
                break
        browser.wait_for("location.hash === '#call=1' && document.querySelector('#ladder g')")

        # the ladder is the recorder's, and grows
        before = browser.evaluate(EVENTS)
        after = recorded(1)
        assert len(before) >= 15 and before == after[: len(before)], (before, after)
        heads = browser.evaluate("[...document.querySelectorAll('#ladder .head')].map(e => e.textContent)")
        assert heads == ["call", "a/1", "b/1"], heads
        assert "it ends when that adapter drops" in browser.evaluate("document.body.innerText")
        browser.wait_for("[...document.querySelectorAll('svg[data-score]')].filter(e => Number(e.dataset.score) > 3).length === 2")
        browser.wait_for("[...document.querySelectorAll('#ladder g')].some(g => g.dataset.text.startsWith('Quality-Of-Service'))")

        # the history of a property, by a click
        browser.evaluate("document.querySelector('#ladder g[data-property=State]').dispatchEvent(new Event('click'))")
        browser.wait_for("document.getElementById('history')?.innerText.startsWith('State of leg')")
        assert [row[2:] for row in browser.evaluate(ROWS)[1]] == [
            ["TRYING", "ALERTING", "its own adapter"], ["ALERTING", "CONNECTED", "its own adapter"]], browser.evaluate(ROWS)

        # dark and light, which it remembers
        colour = "getComputedStyle(document.body).backgroundColor"
        light = browser.evaluate(colour)
        browser.press("d")
        assert browser.evaluate(colour) != light
        browser.open(f"http://127.0.0.1:{page}/calls#call=1")
        browser.command("Page.reload")
        browser.wait_for(f"document.querySelector('#ladder g') && {colour} !== '{light}'")
        browser.take_picture(f"{folder}.png")
        browser.press("Escape")
        browser.wait_for("location.hash === '' && document.querySelector('tr[data-call]')")
        assert browser.evaluate("document.getElementById('clear').getClientRects().length") == 0, "nothing to clear here"
    elif case == "clear":
        browser.open(f"http://127.0.0.1:{page}/calls#call=1")
        browser.wait_for("document.getElementById('clear').getClientRects().length > 0")
        for token, told in [("guessed", "this is not the token"), ("not-known-to-all", "cleared")]:
            browser.evaluate("document.getElementById('token').focus(); document.getElementById('token').value = ''")
            for key in token:
                browser.press(key)
            browser.evaluate("document.querySelector('#clear button').click()")
            browser.wait_for(f"document.getElementById('cleared').innerText === '{told}'")
        browser.wait_for("document.getElementById('state').innerText === 'call 1, over'")
    else:
        browser.wait_for("document.getElementById('state').innerText === 'serving, 0 up'")
        up, known = browser.evaluate(ROWS)
        assert up == [] and known[0][2:] == ["ended", "alice - bob", "Normal call clearing"], (up, known)
        browser.open(f"http://127.0.0.1:{page}/calls#call=1")
        browser.wait_for("document.getElementById('state').innerText === 'call 1, over'")
        assert browser.evaluate(EVENTS) == recorded(1)
        browser.open(f"http://127.0.0.1:{page}/calls#call=77")
        browser.wait_for("document.getElementById('main').innerText === 'nothing is known of a call 77'")
    assert browser.evaluate("document.querySelectorAll('script').length") == 1
finally:
    browser.close()
