"""Runs stories of the native programs on those for Windows: shared.py STORY [CLASS[.TEST]...]."""

import sys
import unittest

import wine  # whose machine is then that of every story

if __name__ == "__main__":
    unittest.main(module=sys.argv[1], argv=["shared", *sys.argv[2:]])
