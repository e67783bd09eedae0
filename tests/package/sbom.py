"""sbom.py SOURCES BUILD WORK: installs what was built, has its bill of materials made twice, and holds that to the rules of SPDX
2.3 and to what the linker says."""
import hashlib
import json
import os
import pathlib
import shutil
import subprocess
import sys

import jsonschema

sources, build, work = map(pathlib.Path, sys.argv[1:])
shutil.rmtree(work, ignore_errors=True)
subprocess.run(("cmake", "--install", build, "--prefix", work / "tree"), check=True, stdout=subprocess.DEVNULL)
environment = {**os.environ, "SOURCE_DATE_EPOCH": "1795000000"}
texts = [subprocess.run((sources / "packaging/sbom.py", work / "tree"), check=True, capture_output=True, text=True, env=environment).stdout
         for _ in range(2)]
assert texts[0] == texts[1], "the same installation, another bill"
bill = json.loads(texts[0])

schema = json.loads((sources / "tests/package/sbom.schema.json").read_text())
jsonschema.Draft202012Validator.check_schema(schema)
jsonschema.Draft202012Validator(schema).validate(bill)

# each thing is there once, and whatever is related is there
ids = [entry["SPDXID"] for entry in (bill, *bill["packages"], *bill["files"])]
assert len(ids) == len(set(ids))
related = {(entry["spdxElementId"], entry["relationshipType"], entry["relatedSpdxElement"]) for entry in bill["relationships"]}
assert {end for entry in related for end in (entry[0], entry[2])} <= set(ids)
named = {end for entry in related for end in (entry[0], entry[2])}
assert set(ids) == named, f"nothing says what these are for: {set(ids) - named}"

# the sums are those of the files, and no program or library is missing
ours, *others = bill["packages"]
sums = []
for file in bill["files"]:
    content = (work / "tree" / file["fileName"]).read_bytes()
    for checksum in file["checksums"]:
        assert hashlib.new(checksum["algorithm"], content).hexdigest() == checksum["checksumValue"]
    sums.append(file["checksums"][0]["checksumValue"])
assert ours["packageVerificationCode"]["packageVerificationCodeValue"] == hashlib.sha1("".join(sorted(sums)).encode()).hexdigest()
names = {pathlib.Path(file["fileName"]).name for file in bill["files"]}
assert {"callcontrol-gateway", "gatewayctl", "callcontrol-gateway-sip.so", "libcallcontrol-gateway-host.so"} <= names, names

# what a module loads, and what it does not
linked = {name: {end[len("SPDXRef-Package-"):] for start, kind, end in related if kind == "DYNAMIC_LINK" and start.endswith(name)}
          for name in ("callcontrol-gateway-sip.so", "callcontrol-gateway-isdn.so", "bin-callcontrol-gateway")}
assert {"libsofia-sip-ua0", "libssl3"} <= linked["callcontrol-gateway-sip.so"] and "libpri1.4" not in linked["callcontrol-gateway-sip.so"], linked
assert "libpri1.4" in linked["callcontrol-gateway-isdn.so"] and "libsofia-sip-ua0" not in linked["callcontrol-gateway-isdn.so"], linked
licenses = {pathlib.Path(file["fileName"]).name: file["licenseConcluded"] for file in bill["files"]}
assert [name for name in licenses if licenses[name] != "MIT"] == ["callcontrol-gateway-isdn.so"], licenses
for package in others:
    version = subprocess.run(("dpkg-query", "-W", "-f", "${Version}\n", package["name"]), check=True, capture_output=True, text=True).stdout
    assert package["versionInfo"] in version.split(), package
print(f"{len(bill['files'])} files, {len(others)} packages")
