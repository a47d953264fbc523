"""Scripts of symbolic dimensions.

usage: dims_test.py QLTYPES
"""

import json
import os
import pathlib
import pty
import subprocess
import sys
import tempfile
import unittest

ROOT = pathlib.Path(__file__).resolve().parents[2]
QLTYPES = sys.argv[1]
EXAMPLE = "examples/filter_bank.dims"


def run(*arguments, script=""):
    result = subprocess.run([QLTYPES, "dims", *arguments], input=script, capture_output=True, text=True, cwd=ROOT)
    return result.returncode, result.stdout, result.stderr


def answers(script):
    """What the statements of a script that is well-formed answer."""
    code, out, err = run("--json", script=script)
    assert code != 2, err
    return json.loads(out)["statements"]


class Dims(unittest.TestCase):
    def test_example(self):
        code, out, err = run(EXAMPLE)
        self.assertEqual(code, 1)
        self.assertEqual(out, """\
register kernels(33, 16) = [taps, bands] -> [taps bands]
register padded(512, 16) = [frame + taps - 1, 16] -> [frame + taps - 1 16]
show bank -> [bands ceil((frame + taps - 1)/decimation)]
simplify (frame*bands + bands*taps - bands)/bands - taps + 1 -> frame
simplify work/(2*thinned) -> bands
equal? padded, filtered*16 -> yes
greater? frame, decimation -> yes
greater? block_size, decimation -> not known
equal? channels, bands -> yes
equal? channels*hop, bank -> yes
range? frame -> 64 to 4096
range? taps -> 2 to 128
list code ->
  bands == channels  (by Overlap)
  frame == block_size  (by Overlap)
  ceil((taps + frame - 1)/decimation) == hop  (by Overlap)
  bands*ceil((taps + frame - 1)/decimation) == channels*hop  (by Overlap)
  taps > decimation
  frame > taps  (by Decimator)
  frame > 63  (by Source)
  decimation > 1  (by Decimator)
  taps < 129  (by Filter)
  frame < 4097  (by Source)
  decimation < 2147483647  (by Decimator)
eval bank -> [16 128]
eval work -> 4096
""")
        self.assertEqual(err, f"""\
{EXAMPLE}:50:1: refused: decimation cannot be greater than frame: it is known to be less than frame
  contradicts {EXAMPLE}:24:1: greater frame, taps
  contradicts {EXAMPLE}:26:1: greater taps, decimation
""")

    def test_expressions(self):
        for statement, answer in (
                ("show K*(L+1) # a comment", "K*(L + 1)"),
                ("show K % L", "K % L  (host language: rem(K, L))"),
                ("show INHERIT", "INHERIT"),
                ("simplify [K+K 3*K/K]", "[2*K 3]"),
                ("eval [7/2 -3]", "[3.5 -3]"),
                ("eval min(2, 3)", "2"),
                ("eval K*L - K", "not known, no value of K, L"),
                ("range? K", "anything"),
                ("list", "nothing"),
                ("list code", "nothing"),
                ("list block B", "nothing")):
            with self.subTest(statement):
                shown = statement.split(" #")[0]
                self.assertEqual(run(script=statement), (0, f"{shown} -> {answer}\n", ""))

    def test_names(self):
        script = "let a = K + 1\nlet b = a*a\nshow b/a\nlet K = L\nshow b + K\nlet a = 7\nshow [a K]\nlet s = [a M]\nshow s\n"
        self.assertEqual([s["expression"] for s in answers(script) if "expression" in s],
                         ["(K + 1)*(K + 1)/(K + 1)", "(K + 1)*(K + 1) + L", "[7 L]", "[7 M]"])
        # Names that name each other a hundred thousand times over.
        deep = "let x = K\n" + "let x = x + x*x\n" * 2000 + "bind K = 0\neval x\n"
        self.assertEqual(run(script=deep), (0, "eval x -> 0\n", ""))

    def test_texts_of_the_host_language(self):
        for statement, answer in (
                ("register a(480, 640) = [rows, cols]", "[rows cols]"),
                ("register a(4, 3) = [N+1 3]", "[N + 1 3]"),
                ("register a(4, 3) = [N^2; 3]", "[pow(N, 2) 3]"),
                ("register a(4) = [1 4]", "not symbolic"),
                ("register a(4) = [K L 3]", "K  (without L)  (without 3)"),
                ("register a() = K", "K"),
                ("register a(0) = K", "NOSYMBOLIC"),
                ("register a(3) = 0.5*K", "0.5*K  (literal 0.5 is no whole number)")):
            with self.subTest(statement):
                self.assertEqual(run(script=statement), (0, f"{statement} -> {answer}\n", ""))
        self.assertEqual(answers("let N = 2*M\nregister a(5, 3) = [N+1 3]\nshow a\n")[1:], [
            {"line": 2, "statement": "register a(5, 3) = [N+1 3]", "expression": "[2*M + 1 3]", "lost": []},
            {"line": 3, "statement": "show a", "expression": "[2*M + 1 3]", "hostExpression": "[2*M + 1 3]"}])

    def test_values(self):
        self.assertEqual(run(script="bind K = 2*3\nbind L = 0.5\neval [K*L K/0]\nbind K = -1\neval K\n"),
                         (0, "eval [K*L K/0] -> [3 inf]\neval K -> -1\n", ""))
        self.assertEqual(answers("eval [K 1]\n"), [
            {"line": 1, "statement": "eval [K 1]", "values": None, "unbound": ["K"]}])

    def test_facts(self):
        script = """
            equal [K L], [M 4]
            greater M, N
            less P, 10
            range Q, *, 512
            equal? K, M
            equal? L, 4
            greater? K, N
            greater? M, N
            less? N, M
            less? P, 10
            range? P
            range? Q
            range? L
        """
        self.assertEqual([s.get("known", (s.get("min"), s.get("max"))) for s in answers(script)][4:],
                         [True, True, False, True, True, True, (None, 9), (None, 512), (4, 4)])

    def test_lists(self):
        script = "block A\nequal K, L\nblock B\nrange M, 2, 9, without upper\ngreater M, N\nlist\nlist code\nlist block B\n"
        model, code, block = answers(script)[-3:]
        self.assertEqual(model["facts"], [{"expression": "K == L", "blocks": ["A"]},
                                          {"expression": "M > N", "blocks": ["B"]},
                                          {"expression": "M > 1", "blocks": ["B"]},
                                          {"expression": "M < 10", "blocks": ["B"]}])
        self.assertEqual(code["equal"], [{"first": "K", "second": "L", "blocks": ["A"]}])
        self.assertEqual([(p["first"], p["second"]) for p in code["greater"]], [("M", "1"), ("M", "N")])
        self.assertEqual(code["less"], [])
        self.assertEqual(block["facts"], [{"expression": "M > N"}])

    def test_refusals_name_what_they_contradict(self):
        for script, message, against in (
                ("equal 3, 4", "3 does not equal 4", []),
                ("greater K, L\nrange K, 1, 5\ngreater L, M\ngreater M, K", None, [1, 3]),
                ("equal K, L\nequal M, N\nequal L, M\ngreater K, L", None, [1]),
                ("range K, 1, 9\nrange L, 1, 9\nrange K, 1, 5\nrange K, 7, 8", None, [3]),
                ("range K, 1, 9\nless K, 5\ngreater K, 4", None, [2]),
                # The first pair of the refused list is linked all the same.
                ("range L, 1, 3\nequal [K L], [M 4]\ngreater K, M", None, [2])):
            with self.subTest(script):
                code, out, err = run("--json", script=script)
                self.assertEqual(code, 1)
                last = json.loads(out)["statements"][-1]["refused"]
                self.assertEqual([c["line"] for c in last["contradicts"]], against)
                if message:
                    self.assertEqual(last["message"], message)
                self.assertIn(f"(standard input):{len(script.splitlines())}:1: refused: {last['message']}\n", err)

    def test_a_refused_statement_changes_nothing(self):
        self.assertEqual(run(script="range K, 1, 5\ngreater K, 9\nrange? K\nlist\n")[:2],
                         (1, "range? K -> 1 to 5\nlist ->\n  K < 6\n"))

    def test_what_is_wrong_with_a_script(self):
        for script, complaint in (
                ("foo K", "1:1: there is no statement 'foo'; help lists them"),
                ("show K\n  show  K+", "2:11: expected an operand, found the end of the text"),
                ("show K L", "1:8: expected an operator or the end of the text, found 'L'"),
                ("equal K", "1:7: expected equal A, B"),
                ("equal K, L, M", "1:7: expected equal A, B"),
                ("equal min(K, L), [K, L] + 1", "1:25: expected the end of the text behind a list of dimensions,"
                 " found '+'"),
                ("show", "1:5: expected show A"),
                ("let K", "1:5: expected let NAME = A"),
                ("let 3 = K", "1:5: expected a name, found '3'"),
                ("let K =", "1:8: expected an operand, found the end of the text"),
                ("bind K = L", "1:10: expected a number, found 'L'"),
                ("register a(4, 5) = [1 K/2]", "1:24: the division in 'K/2' is not supported"),
                ("register a(4, 5) = [K,", "1:23: expected an operand, found the end of the text"),
                ("register a(4) = 1 + f(K)", "1:21: 'f' is no function that symbolic expressions have"),
                ("register a(x) = K", "1:12: expected an integer of 32 bits, or * for no bound, found 'x'"),
                ("register a = K", "1:10: expected register NAME(D, ...) = TEXT"),
                ("register a(3) x = K", "1:15: expected '=', found 'x'"),
                ("register 4(3) = K", "1:10: expected a name, found '4'"),
                ("range K, 1, x", "1:13: expected an integer of 32 bits, or * for no bound, found 'x'"),
                ("range K, 1, 2147483648", "1:13: expected an integer of 32 bits, or * for no bound,"
                 " found '2147483648'"),
                ("range K, 1, 2, 3", "1:16: expected 'without lower', 'without upper' or 'without both', found '3'"),
                ("list all", "1:6: expected nothing, 'code', or 'block' and its name behind 'list'"),
                ("list block", "1:11: expected a name, found ''"),
                ("block", "1:6: expected a name, found ''"),
                ("quit now", "1:6: expected nothing behind 'quit'"),
                ("equal INHERIT, K", "1:1: nothing can be stated of INHERIT and NOSYMBOLIC"),
                ("let s = [K L]\nshow s + 1", "2:6: a name that stands for a list of dimensions must stand alone"),
                ("show K\0L", "1:7: found the byte 0x00")):
            with self.subTest(script):
                self.assertEqual(run(script=script), (2, "", f"(standard input):{complaint}\n"))

    def test_calls(self):
        with tempfile.TemporaryDirectory() as folder:
            script = pathlib.Path(folder, "a.dims")
            script.write_text("show K")  # no line end
            self.assertEqual(run(str(script)), (0, "show K -> K\n", ""))
            self.assertEqual(run(folder), (2, "", f"{folder}: cannot be read: Is a directory\n"))
        self.assertEqual(run("-", script="show K\nquit\nshow L\n"), (0, "show K -> K\n", ""))
        self.assertEqual(run("/no/such")[::2], (2, "/no/such: cannot be read: No such file or directory\n"))
        self.assertEqual(run("--format", "svg")[0], 2)
        self.assertEqual(run("--json", script=""), (0, '{\n  "statements": []\n}\n', ""))
        self.assertIn("equal? A, B", run("--help")[1])

    def test_graph(self):
        script = 'block A\ngreater K, L\nequal L, M\nrange K, 2, 9\nequal N, 4\nequal [P Q], [R S]\n'
        self.assertEqual(run("--format", "dot", script=script), (0, """\
digraph facts {
  node [shape=box, style="rounded,filled", fillcolor=white, fontname="Helvetica"];
  edge [label=">", fontname="Helvetica", fontsize=10];
  n0 [label="K\\n2 to 9"];
  subgraph cluster_0 {
    label="equal"; style="rounded,filled"; color="#c8d6e5"; fillcolor="#eef3f8"; fontname="Helvetica"; fontsize=10;
    n1 [label="L"];
    n2 [label="M"];
  }
  n3 [label="N\\n= 4"];
  subgraph cluster_1 {
    label="equal"; style="rounded,filled"; color="#c8d6e5"; fillcolor="#eef3f8"; fontname="Helvetica"; fontsize=10;
    n4 [label="P*Q"];
    n5 [label="R*S"];
  }
  subgraph cluster_2 {
    label="equal"; style="rounded,filled"; color="#c8d6e5"; fillcolor="#eef3f8"; fontname="Helvetica"; fontsize=10;
    n6 [label="P"];
    n7 [label="R"];
  }
  subgraph cluster_3 {
    label="equal"; style="rounded,filled"; color="#c8d6e5"; fillcolor="#eef3f8"; fontname="Helvetica"; fontsize=10;
    n8 [label="Q"];
    n9 [label="S"];
  }
  n0 -> n1 [label="> A"];
}
""", ""))

    def test_a_terminal_gets_a_prompt(self):
        ours, theirs = pty.openpty()
        process = subprocess.Popen([QLTYPES, "dims"], stdin=theirs, stdout=subprocess.PIPE, stderr=subprocess.PIPE,
                                   text=True)
        os.close(theirs)
        os.write(ours, b"show K+\nequal K, 3\ngreater K, 4\nrange? K\nlist\nhelp\nquit\n")
        out, err = process.communicate(timeout=60)
        os.close(ours)
        self.assertEqual(process.returncode, 0)
        self.assertIn("dims> dims> dims> dims> = 3\ndims> K == 3\ndims>   let NAME = A", out)
        self.assertEqual(err.splitlines(), [
            "(standard input):1:8: expected an operand, found the end of the text",
            "(standard input):3:1: refused: K cannot be greater than 4: it is known to be less than 4",
            "  contradicts (standard input):2:1: equal K, 3"])


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
