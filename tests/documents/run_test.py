#!/usr/bin/python3
"""That documents with mistakes in their blocks are noticed: small documents, each with one."""

import sys
import tempfile
import unittest

sys.dont_write_bytecode = True  # the tree stays as it is
from blocks import Mistake, blocks_of
from run import Document
from scratch import Scratch


def block(text, *told, language="sh"):
    comments = "".join(f"<!-- {each} -->\n" for each in told)
    return f"{comments}```{language}\n{text}\n```\n\n"


class Documents(unittest.TestCase):
    def run_document(self, text):
        with tempfile.TemporaryDirectory() as folder:
            return Document(blocks_of(text, "page.md"), Scratch(folder, {})).run()

    def refuses(self, text, message):
        with self.assertRaisesRegex(Mistake, message):
            self.run_document(text)

    def test_counts_what_is_run(self):
        self.assertEqual(self.run_document(block("true") + block("false", "not run: wrong")), (1, 1))

    def test_a_command_fails(self):
        self.refuses("\n" + block("true; false; true"), r"^page.md:2: exit status 1")
        self.refuses(block("no_such_command"), "not found")
        self.refuses(block("true", "status: 2"), "exit status 0")
        self.assertEqual(self.run_document(block("exit 2", "status: 2")), (1, 0))

    def test_nobody_knows_how(self):
        self.refuses(block("x", language=""), "without a language")
        self.refuses(block("x", language="c"), "a block of c")
        self.refuses("```sh\ntrue\n", "no end")

    def test_a_comment_is_misspelt(self):
        for told in ("outptu", "output: x", "cut", "notrun: x"):
            self.refuses(block("true", told), "is nothing that a block can be told")

    def test_a_module_is_run_by_each_simulator(self):
        def module(statement, names="iverilog"):
            text = f"module m; initial begin {statement} $finish; end endmodule"
            return block(text, "file: m.v", f"simulate: {names}", language="verilog")

        rows = block("printf '12\\n34\\n' >rows.memh")
        beyond = 'reg [7:0] row [0:0]; initial $readmemh("rows.memh", row, 0, 0);'  # which Verilator does not take
        self.run_document(module('$display("12");') + block("12", "output", language=""))
        self.refuses(module('$display("12");') + block("13", "output", language=""), "is not what is printed")
        self.refuses(module("no such statement"), "exit status")
        self.refuses(module("", "icarus"), "nobody knows the simulator icarus")
        self.run_document(rows + module("").replace("initial", f"{beyond} initial"))
        self.refuses(rows + module("", "iverilog, verilator").replace("initial", f"{beyond} initial"), "beyond bounds")

    def test_output(self):
        def shown(printed, text, *told):
            return block(f"printf '{printed}'") + block(text, *(told or ("output",)), language="")

        self.run_document(shown("a\\nb\\n", "a\nb"))
        self.run_document(shown("a\\nb\\nc\\nd\\n", "a\n...\nd"))
        self.run_document(shown("a b c\\n", "a b ..."))
        self.run_document(shown("done, 2.5 Mbit/s\\n", "done, 17 Mbit/s"))
        self.run_document(shown("x\\n", "y", "output of: echo y"))
        for printed, text in (("a\\nb\\n", "a"), ("a\\n", "a\nb"), ("a 1\\n", "a 2"), ("b\\nc\\n", "a\n..."), ("a+\\n", "aa")):
            self.refuses(shown(printed, text), "is not what is printed")
        self.refuses(shown("x\\n", "y", "output of: echo x"), "is not what is printed")
        self.refuses(block("x", "output", language=""), "nothing was run")
        self.refuses(block("echo x", "not run: y") + block("x", "output", language=""), "nothing was run")

    def test_promised_lines(self):
        self.run_document(block("echo first    # prints: first\necho place: second    # prints: second"))
        self.refuses(block("echo other    # prints: first"), "does not print 'first'")
        self.refuses(block("echo not first    # prints: first"), "does not print 'first'")
        self.refuses(block("echo b; echo a    # prints: a\ntrue    # prints: b"), "does not print 'b'")

    def test_files(self):
        source = block("int x;", "file: x.c", language="c")
        self.run_document(source + block("grep int x.c"))
        self.run_document(block("int x;", "file: x.c", "check: grep int x.c", language="c"))
        self.refuses(source, "no command uses x.c")
        self.refuses(block("grep int x.c") + source, "No such file")
        self.refuses(source + block("grep int x.c", "not run: why"), "no command uses x.c")
        self.refuses(block("int x;", "file: x.c", "check: grep float x.c", language="c"), "exit status 1")

    def test_cuts(self):
        self.run_document(block("sleep 1000", "cut: s/1000/0/"))
        self.refuses(block("true", "cut: s/1000/0/"), "changes nothing")

    def test_python(self):
        self.run_document(block(">>> a = 1", language="python") + block(">>> a\n1", language="python"))
        self.run_document(block("assert True", language="python"))
        self.refuses(block(">>> 1\n2", language="python"), "Expected")
        self.refuses(block(">>> b", language="python"), "NameError")
        self.refuses(block("assert False", language="python"), "AssertionError")

    def test_json(self):
        self.run_document(block("{}", language="json"))
        self.refuses(block("{,}", language="json"), "page.md:1")


if __name__ == "__main__":
    unittest.main()
