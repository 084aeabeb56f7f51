"""Runs stories of the native programs on those for Windows: shared.py STORY [CLASS[.TEST]...]."""

import importlib
import sys
import unittest

import wine

if __name__ == "__main__":
    wine.harness.Machine = wine.Machine
    # Whoever imports it finds the one that is there by then.
    importlib.import_module("client_credentials").run_client = wine.run_client
    story = importlib.import_module(sys.argv[1])
    unittest.main(module=story, argv=["shared", *sys.argv[2:]])
