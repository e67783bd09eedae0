#!/usr/bin/env python3
"""Tells, in SPDX 2.3, what an installation consists of: its programs and libraries, the Debian packages whose libraries they
load, whose headers went into them, and what they were built with.

    sbom.py FOLDER >callcontrol.spdx.json

The folder is where `./run install FOLDER --gateway` left it. SOURCE_DATE_EPOCH, or else the last commit, is the time of creation.
"""
import functools
import hashlib
import json
import os
import pathlib
import re
import subprocess
import sys
import time

SOURCES = pathlib.Path(__file__).resolve().parent.parent
OURS = "SPDXRef-callcontrol"
# their code is in ours, though nothing of them is loaded
HEADERS_ALONE = {"libcli11-dev"}
# loads the stack libpri, so it is under that one's license as a whole
OTHER_LICENSES = {"callcontrol-gateway-isdn.so": "GPL-2.0-only"}


def run(*command):
    return subprocess.run(command, check=True, capture_output=True, text=True).stdout


def identifier(kind, name):
    return f"SPDXRef-{kind}-" + re.sub(r"[^A-Za-z0-9.-]", "-", name)


def is_elf(path):
    with open(path, "rb") as file:
        return file.read(4) == b"\x7fELF"


def needed(path):
    return re.findall(r"\(NEEDED\).*\[(.+)\]", run("readelf", "-d", path))


@functools.cache
def loaded(path):
    """The libraries that are loaded with a program or library, by the names by which they are asked for."""
    return dict(re.findall(r"^\s*(\S+) => (/\S+)", run("ldd", path), re.MULTILINE))


@functools.cache
def packages_of_libraries():
    found = {}
    for line in run("dpkg-query", "-S", "*.so*").splitlines():
        packages, separator, path = line.rpartition(": ")
        if separator and path.startswith("/"):
            found[path] = packages.split(",")[0].split(":")[0]
    return found


def package_of(path):
    """The Debian package that a library is of, under either of the names that the merged /usr gives it."""
    path = os.path.realpath(path)
    for name in (path, path.removeprefix("/usr")):
        if name in packages_of_libraries():
            return packages_of_libraries()[name]
    raise SystemExit(f"sbom: no package has {path}")


@functools.cache
def installed():
    """By name: version and architecture of a package, name and version of its source."""
    fields = "${db:Status-Abbrev}\t${Package}\t${Version}\t${Architecture}\t${source:Package}\t${source:Version}\n"
    lines = (line.split("\t") for line in run("dpkg-query", "-W", "-f", fields).splitlines())
    return {name: rest for state, name, *rest in lines if state.startswith("ii")}


def debian_package(name):
    version, architecture, source, source_version = installed()[name]
    return {
        "SPDXID": identifier("Package", name),
        "name": name,
        "versionInfo": version,
        "supplier": "Organization: Debian",
        "downloadLocation": "NOASSERTION",
        "filesAnalyzed": False,
        "sourceInfo": f"built from the source package {source} {source_version}",
        "licenseConcluded": "NOASSERTION",
        "licenseDeclared": "NOASSERTION",
        "licenseComments": f"told in /usr/share/doc/{name}/copyright",
        "copyrightText": "NOASSERTION",
        "externalRefs": [{
            "referenceCategory": "PACKAGE-MANAGER",
            "referenceType": "purl",
            "referenceLocator": f"pkg:deb/debian/{name}@{version}?arch={architecture}".replace("+", "%2B"),
        }],
    }


def our_file(path, folder):
    content = path.read_bytes()
    license_of = OTHER_LICENSES.get(path.name, "MIT")
    return {
        "SPDXID": identifier("File", str(path.relative_to(folder))),
        "fileName": f"./{path.relative_to(folder)}",
        "fileTypes": ["BINARY"],
        "checksums": [{"algorithm": kind, "checksumValue": hashlib.new(kind, content).hexdigest()} for kind in ("SHA1", "SHA256")],
        "licenseConcluded": license_of,
        "licenseInfoInFiles": ["NOASSERTION"],
        "copyrightText": "NOASSERTION",
    }


def our_package(files):
    version = re.search(r"project\(callcontrol VERSION (\S+)", (SOURCES / "CMakeLists.txt").read_text()).group(1)
    sums = sorted(checksum["checksumValue"] for file in files for checksum in file["checksums"] if checksum["algorithm"] == "SHA1")
    return {
        "SPDXID": OURS,
        "name": "callcontrol",
        "versionInfo": version,
        "supplier": "Organization: The callcontrol authors",
        "downloadLocation": "NOASSERTION",
        "filesAnalyzed": True,
        "packageVerificationCode": {"packageVerificationCodeValue": hashlib.sha1("".join(sums).encode()).hexdigest()},
        "licenseConcluded": " AND ".join(sorted({file["licenseConcluded"] for file in files}, reverse=True)),
        "licenseDeclared": "MIT",
        "licenseInfoFromFiles": ["NOASSERTION"],
        "copyrightText": "NOASSERTION",
    }


def build_dependencies():
    """The packages of Build-Depends that are there; one that is not has been no part of this build."""
    control = (SOURCES / "packaging/debian/control").read_text()
    listed = re.search(r"^Build-Depends:((?:.|\n )*)", control, re.MULTILINE).group(1)
    names = ["g++", *(entry.split()[0] for entry in listed.split(","))]
    return [name for name in names if name in installed()]


def describe(folder):
    paths = sorted(path for path in folder.rglob("*") if path.is_file() and not path.is_symlink() and is_elf(path))
    if not paths:
        raise SystemExit(f"sbom: nothing is installed in {folder}")
    own = {os.path.realpath(path) for path in paths}
    files = [our_file(path, folder) for path in paths]
    packages, followed, relationships = {}, set(), {("SPDXRef-DOCUMENT", "DESCRIBES", OURS)}

    def package(name):
        packages.setdefault(name, debian_package(name))
        return packages[name]["SPDXID"]

    def follow(path, subject, relationship):
        libraries = loaded(path)
        for name in needed(path):
            library = libraries.get(name)
            if library is None or os.path.realpath(library) in own:
                continue
            target = package(package_of(library))
            if target != subject:
                relationships.add((subject, relationship, target))
            if library not in followed:
                followed.add(library)
                follow(library, target, "DEPENDS_ON")

    for path, file in zip(paths, files):
        relationships.add((OURS, "CONTAINS", file["SPDXID"]))
        follow(path, file["SPDXID"], "DYNAMIC_LINK")
    for name in build_dependencies():
        if name in HEADERS_ALONE:
            relationships.add((OURS, "STATIC_LINK", package(name)))
        else:
            relationships.add((package(name), "BUILD_DEPENDENCY_OF", OURS))
    return [our_package(files), *(packages[name] for name in sorted(packages))], files, sorted(relationships)


def main():
    packages, files, relationships = describe(pathlib.Path(sys.argv[1]).resolve())
    epoch = os.environ.get("SOURCE_DATE_EPOCH") or run("git", "-C", str(SOURCES), "log", "-1", "--format=%ct")
    content = {
        "packages": packages,
        "files": files,
        "relationships": [dict(zip(("spdxElementId", "relationshipType", "relatedSpdxElement"), entry)) for entry in relationships],
    }
    name = f"callcontrol-{packages[0]['versionInfo']}"
    digest = hashlib.sha256(json.dumps(content, sort_keys=True).encode()).hexdigest()
    json.dump({
        "spdxVersion": "SPDX-2.3",
        "dataLicense": "CC0-1.0",
        "SPDXID": "SPDXRef-DOCUMENT",
        "name": name,
        "documentNamespace": f"https://callcontrol.invalid/spdx/{name}-{digest[:32]}",
        "creationInfo": {"created": time.strftime("%Y-%m-%dT%H:%M:%SZ", time.gmtime(int(epoch))), "creators": ["Tool: callcontrol-sbom"]},
        **content,
    }, sys.stdout, indent=2)
    print()


if __name__ == "__main__":
    main()
