"""The layering check: the source tree keeps the include rule, and the check
itself catches an include of a higher layer or of a peer.

Run by ctest (layering_test) with the source root as its argument.
"""

import os
import sys
import tempfile
import unittest

ROOT = os.path.abspath(sys.argv.pop(1) if len(sys.argv) > 1 else
                       os.path.join(os.path.dirname(os.path.abspath(__file__)), "..", ".."))
sys.path.insert(0, os.path.join(ROOT, "tools"))
import check_layers  # noqa: E402


class SourceTree(unittest.TestCase):
    def test_no_folder_includes_a_higher_layer(self):
        self.assertEqual(check_layers.violations(ROOT), [])


class Check(unittest.TestCase):
    CASES = [  # (folder, included folder, allowed)
        ("framework", "module", False), ("framework", "agent", False), ("framework", "schema", False),
        ("logging", "access", False), ("logging", "framework", True), ("access", "logging", True),
        ("data", "agent", False), ("agent", "data", True), ("agent", "providers", False),
        ("providers", "derivedObjects", False), ("derivedObjects", "agent", True),
        ("module", "providers", True), ("sim", "access", True), ("sim", "logging", False),
        ("host", "framework", False), ("tests", "module", True),
    ]

    def test_rule(self):
        for folder, target, ok in self.CASES:
            with self.subTest(folder=folder, target=target):
                self.assertEqual(check_layers.allowed(folder, target), ok)

    def test_offending_include_is_reported_with_its_line(self):
        with tempfile.TemporaryDirectory() as root:
            os.makedirs(os.path.join(root, "framework"))
            with open(os.path.join(root, "framework", "A.h"), "w") as f:
                f.write('#pragma once\n#include "framework/B.h"\n#include "module/Provider_For.h"\n')
            self.assertEqual(check_layers.violations(root),
                             ["framework/A.h:3: framework/ includes module/, a higher layer"])


if __name__ == "__main__":
    unittest.main()
