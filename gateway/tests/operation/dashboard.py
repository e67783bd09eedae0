"""Whether the dashboard and the rules of alerts ask for what the page of figures has: dashboard.py FOLDER PAGE."""
import json
import re
import subprocess
import sys
from pathlib import Path

folder, page = Path(sys.argv[1]), Path(sys.argv[2]).read_text()
families = {}
for name, kind in re.findall(r"^# TYPE (\S+) (\S+)$", page, re.MULTILINE):
    families |= {name + end: kind for end in (("_bucket", "_sum", "_count") if kind == "histogram" else ("",))}
ELSEWHERE = re.compile("callcontrol_gateway_isdn_")  # of a module that the test does not have

dashboard = json.loads((folder / "dashboard.json").read_text())
expressions = [target["expr"] for panel in dashboard["panels"] for target in panel["targets"]]
expressions += [item["query"]["query"] for item in dashboard["templating"]["list"] if isinstance(item["query"], dict)]
assert len(expressions) > 20
for text in [*expressions, (folder / "alerts.yml").read_text()]:
    for name in re.findall(r"\b(?:callcontrol_gateway|process)_\w+", text):
        assert name in families or ELSEWHERE.match(name), f"{name} is not on the page"
    for name in re.findall(r"\b(?:rate|increase)\((\w+)", text):
        assert ELSEWHERE.match(name) or families[name] in ("counter", "histogram"), f"{name} does not only rise"

# what the variables stand for is not known here, nor what is asked for them: Prometheus parses the rest
rules = {"groups": [{"name": "dashboard", "rules": [
    {"record": f"panel:{i}", "expr": text} for i, text in enumerate(expressions) if "label_values" not in text]}]}
subprocess.run(["promtool", "check", "rules", "/dev/stdin"], input=json.dumps(rules), text=True, check=True)
