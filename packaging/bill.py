#!/usr/bin/env python3
"""Writes what the programs are made of, a bill of materials in CycloneDX's JSON: bill.py linux|windows VERSION FILE

The table `libraries` names what it is, the installed packages say in which version. SOURCE_DATE_EPOCH dates it, and its
number comes from its content: the same build gives the same bytes."""
import datetime, json, os, pathlib, subprocess, sys, urllib.parse, uuid

TABLE = pathlib.Path(__file__).with_name("libraries")
LOCK = pathlib.Path(__file__).parents[1] / "client/panel/page/package-lock.json"
PACKAGE = "${source:Package} ${source:Version} ${Package} ${Version} ${Architecture}"


def rows(system):
    """Name, package and licence of what is in the programs of this system."""
    column = {"linux": 1, "windows": 2}[system]
    lines = (line.split(maxsplit=3) for line in TABLE.read_text().splitlines() if not line.startswith("#"))
    return [(fields[0], fields[column], fields[3]) for fields in lines if fields[column] != "-"]


def package_url(package):
    """The URL of a package, and its version."""
    if package.startswith("npm:"):
        name = package.removeprefix("npm:")
        version = json.loads(LOCK.read_text())["packages"][f"node_modules/{name}"]["version"]
        return f"pkg:npm/{name}@{version}", version
    told = subprocess.run(["dpkg-query", "-W", "-f", PACKAGE, package.removeprefix("src:")], check=True,
                          capture_output=True, text=True).stdout.split()
    name, version, architecture = (*told[:2], "source") if package.startswith("src:") else told[2:]
    quoted = "@".join(urllib.parse.quote(part, safe=":") for part in (name, version))
    return f"pkg:deb/debian/{quoted}?arch={architecture}", version


def component(name, package, licence):
    url, version = package_url(package)
    return {"type": "library", "bom-ref": url, "name": name, "version": version,
            "licenses": [{"expression": licence}], "purl": url}


def bill(system, version):
    libraries = [component(*row) for row in rows(system)]
    moment = datetime.datetime.fromtimestamp(int(os.environ["SOURCE_DATE_EPOCH"]), datetime.timezone.utc)
    vexa = {"type": "application", "bom-ref": "vexa", "supplier": {"name": "Korvane"}, "name": "vexa",
            "version": version, "licenses": [{"expression": "MIT"}]}
    needs = [{"ref": "vexa", "dependsOn": [library["bom-ref"] for library in libraries]}]
    content = {"version": 1, "metadata": {"timestamp": moment.strftime("%Y-%m-%dT%H:%M:%SZ"), "component": vexa},
               "components": libraries, "dependencies": needs}
    number = uuid.uuid5(uuid.NAMESPACE_OID, json.dumps(content))
    return {"bomFormat": "CycloneDX", "specVersion": "1.5", "serialNumber": f"urn:uuid:{number}", **content}


def main(system, version, file):
    pathlib.Path(file).parent.mkdir(parents=True, exist_ok=True)
    pathlib.Path(file).write_text(json.dumps(bill(system, version), indent=2) + "\n")


main(*sys.argv[1:])
