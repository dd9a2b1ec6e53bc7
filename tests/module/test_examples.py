# -*- coding: utf-8 -*-
"""examples/convert.py under the interpreter that runs the tests (2.7 or 3)."""
import os
import re
import subprocess
import sys
import unittest

from support import BUILD, EXAMPLES, PY3, convert_here, examples


class ConvertScript(unittest.TestCase):
    def test_prints_each_file_with_its_text(self):
        paths = examples()
        out = subprocess.check_output(
            [sys.executable, os.path.join(EXAMPLES, 'convert.py')] + paths +
            [os.path.join(EXAMPLES, '*.none')],  # a pattern the shell found nothing for
            env=dict(os.environ, PYTHONPATH=BUILD))
        parts = re.split(br'^==== (.*) \((\d+) characters\)\n', out, flags=re.M)
        self.assertEqual(parts[0], b'')
        sections = [parts[i:i + 3] for i in range(1, len(parts), 3)]
        self.assertEqual([name.decode('utf-8') for name, _, _ in sections], paths)
        # This process has converted nothing yet: converting the same files in
        # the same order gives the same texts, the carried document sun included.
        for path, (name, count, body) in zip(paths, sections):
            xml = convert_here(path)
            self.assertEqual(int(count), len(xml), path)
            ending = u'\n' if xml and not xml.endswith(u'\n') else u''
            self.assertEqual(body.decode('utf-8', 'surrogatepass' if PY3 else 'strict'), xml + ending)


if __name__ == '__main__':
    unittest.main()
