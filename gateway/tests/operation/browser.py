"""A browser without a screen, driven by its debugging port: what a person does with a page, and what then is on it."""
import json
import subprocess
import time
import urllib.request

import websocket


class Browser:
    def __init__(self, port, folder):
        arguments = ["--headless", "--no-sandbox", "--disable-gpu", "--disable-dev-shm-usage", "--window-size=1400,1000",
                     "--remote-allow-origins=*", f"--remote-debugging-port={port}", f"--user-data-dir={folder}", "about:blank"]
        self.process = subprocess.Popen(["chromium", *arguments], stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
        self.connection = websocket.create_connection(self.find_page(port), timeout=30)
        self.number = 0

    @staticmethod
    def find_page(port):
        for _ in range(300):
            try:
                pages = json.load(urllib.request.urlopen(f"http://127.0.0.1:{port}/json", timeout=5))
                return next(page["webSocketDebuggerUrl"] for page in pages if page["type"] == "page")
            except (OSError, StopIteration):
                time.sleep(0.1)
        raise RuntimeError("the browser does not start")

    def command(self, method, **parameters):
        self.number += 1
        self.connection.send(json.dumps({"id": self.number, "method": method, "params": parameters}))
        while (answer := json.loads(self.connection.recv())).get("id") != self.number:
            pass
        assert "error" not in answer, answer
        return answer["result"]

    def open(self, address):
        self.command("Page.navigate", url=address)

    def evaluate(self, expression):
        result = self.command("Runtime.evaluate", expression=expression, returnByValue=True)
        assert "exceptionDetails" not in result, result
        return result["result"].get("value")

    def wait_for(self, expression):
        """Until it is true, at most 20 s."""
        for _ in range(200):
            if self.evaluate(f"(() => {{ try {{ return Boolean({expression}) }} catch {{ return false }} }})()"):
                return
            time.sleep(0.1)
        raise AssertionError(f"never true: {expression}; the page has: {self.evaluate('document.body.innerText')}")

    def press(self, key):
        for kind in ("keyDown", "keyUp"):
            text = {"text": key} if kind == "keyDown" and len(key) == 1 else {}
            self.command("Input.dispatchKeyEvent", type=kind, key=key, **text)

    def take_picture(self, file):
        import base64
        with open(file, "wb") as picture:
            picture.write(base64.b64decode(self.command("Page.captureScreenshot")["data"]))

    def close(self):
        self.connection.close()
        self.process.terminate()
        self.process.wait(30)
