# -*- coding: utf-8 -*-
"""Running out of memory inside a conversion is the interpreter's MemoryError,
and the interpreter goes on: tried in a child interpreter under an address
space limit. The command says "out of memory" for the file and goes on."""
import os
import struct
import subprocess
import sys
import unittest

from support import BUILD, COMMAND, EXAMPLES, ScratchTest, example, explain, read, PyOrvXml

LIMIT_MB = 400

CHILD = """
import resource, sys
import PyOrvXml
big, small = [p if sys.version_info[0] >= 3 else p.decode('utf-8') for p in sys.argv[1:3]]
limit = int(sys.argv[3]) << 20
function = getattr(PyOrvXml, sys.argv[4])
resource.setrlimit(resource.RLIMIT_AS, (limit, limit))
for attempt in range(2):
    try:
        function(big)
        sys.stdout.write('converted ')
    except MemoryError:
        sys.stdout.write('MemoryError ')
sys.stdout.write('%d' % len(PyOrvXml.getOrvmatXml(small)))
"""


class MemoryLimit(ScratchTest):
    def large_library(self, copies):
        """The materials of a version 2 example, over and over: a few MB of
        file that give hundreds of MB of XML."""
        data = read(os.path.join(EXAMPLES, 'materials_old_records_v2.orvmat'))
        count = struct.unpack('<I', data[4:8])[0]
        return self.write('large.orvmat',
                          data[:4] + struct.pack('<I', count * copies) + data[8:] * copies)

    def test_allocation_failure_raises_and_the_next_call_works(self):
        big = self.large_library(40000)
        small = example('materials_all_layers.orvmat')
        for function in ('getOrvmatXml', 'getXmlWithOutcome'):
            out = subprocess.check_output(
                [sys.executable, '-c', CHILD, big.encode('utf-8'), small.encode('utf-8'),
                 str(LIMIT_MB), function], env=dict(os.environ, PYTHONPATH=BUILD))
            self.assertEqual(out.decode('ascii').split(),
                             ['MemoryError', 'MemoryError', str(len(PyOrvXml.getOrvmatXml(small)))])

    def test_command_gives_out_of_memory_as_the_reason(self):
        def limit():
            import resource
            resource.setrlimit(resource.RLIMIT_AS, (LIMIT_MB << 20, LIMIT_MB << 20))
        self.assertEqual(explain(self.large_library(40000), self.dir, limit),
                         'unreadable: out of memory')

    def test_the_batch_goes_on_after_a_file_that_ran_out_of_memory(self):
        def limit():
            import resource
            resource.setrlimit(resource.RLIMIT_AS, (LIMIT_MB << 20, LIMIT_MB << 20))
        small = example('materials_all_layers.orvmat')
        out = os.path.join(self.dir, 'out')
        for jobs in ('1', '2'):  # in this process, and in workers
            p = subprocess.Popen([COMMAND, '--jobs', jobs, '-o', out, small, self.large_library(40000),
                                  example('render_settings.orvopt')],
                                 stdout=subprocess.PIPE, stderr=subprocess.PIPE, preexec_fn=limit)
            err = p.communicate()[1].decode('utf-8')
            self.assertEqual(p.returncode, 3, err)
            self.assertIn('large.orvmat: out of memory\n', err)
            self.assertIn('orvxml: 2 converted, 0 fell back to text, 1 unreadable', err)
            self.assertEqual(sorted(os.listdir(out)),
                             ['materials_all_layers.orvmat.xml', 'render_settings.orvopt.xml'])

    def test_the_same_file_converts_without_the_limit(self):
        # The library is valid: what fails above is memory, not the file.
        big = self.large_library(200)
        xml = PyOrvXml.getOrvmatXml(big)
        self.assertTrue(xml.startswith(u'<orvmat>\n'))
        self.assertEqual(xml.count(u'\n  <Assets>\n'), 2 * 200)


if __name__ == '__main__':
    unittest.main()
