"""Makes the prefix that WINEPREFIX names anew (`make`), or ends all that runs in it and removes it (`remove`)."""

import shutil
import subprocess
import sys

import wine


def remove():
    if wine.prefix().exists():
        wine.end_all()
        shutil.rmtree(wine.prefix())


def make():
    remove()
    wine.prefix().parent.mkdir(parents=True, exist_ok=True)
    quiet = {"stdin": subprocess.DEVNULL, "stdout": subprocess.DEVNULL, "stderr": subprocess.DEVNULL}
    subprocess.run(["wineboot", "--init"], env=wine.environment(), check=True, **quiet)
    wine.end_all()


if __name__ == "__main__":
    {"make": make, "remove": remove}[sys.argv[1]]()
