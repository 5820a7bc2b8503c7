#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The mutants are those that one expects; each is judged as it behaves, once; and the list of equivalents is one."""

import collections
import contextlib
import io
import json
import pathlib
import subprocess
import sys
import tempfile
import unittest
import unittest.mock

sys.dont_write_bytecode = True

import kill  # noqa: E402
import mutants  # noqa: E402
import mutate  # noqa: E402

ROOT = pathlib.Path(__file__).resolve().parents[2]
FLAGS = ["-std=c++20", "-ffreestanding", "-Werror=return-type"]
READ = ["clang++", *FLAGS, "-w", "-fsyntax-only", "-Xclang", "-ast-dump=json"]

LAYER = """
#include "count.h"
constexpr int STEPS[] = { 1, 2 };
int iCount(int iFrom, int iTo)
{
    int iSum = 0;
    for (long i = iFrom; i != iTo; i++)
        iSum += STEPS[0];
    return iSum;
}
int iFourfold(int iValue)
{
    return iTwice(iTwice(iValue));
}
bool fgOverlooked(int iValue)
{
    return iValue > 3;
}
int iSumOfThree(const int* piValues)
{
    int iSum = 0;
    for (int i = 0; i < 3; i++)
        iSum += piValues[i] != 0;
    return iSum > 0;
}
"""
HEADER = """
int iCount(int iFrom, int iTo);
int iFourfold(int iValue);
bool fgOverlooked(int iValue);
int iSumOfThree(const int* piValues);
static inline int iTwice(int iValue)
{
    return iValue * 2;
}
"""

# Prints what the runner reads of a test program. A loop that goes the wrong way hangs.
PROGRAM = """
#include <cstdio>
#include <cstdlib>
#include "count.h"
static void vExpect(bool fgHolds)
{
    if (!fgHolds)
        std::abort();
}
int main()
{
    std::puts("[ RUN      ] Count.Counts");
    std::fflush(stdout);
    vExpect(iCount(2, 5) == 3 && iCount(0, 0) == 0 && iFourfold(3) == 12);
    fgOverlooked(4);
    int* pi = (int*)std::calloc(3, sizeof(int));
    iSumOfThree(pi);
    std::free(pi);
}
"""
CASES = """
static int iShared = 3;
TEST(Count, Counts)
{
    EXPECT_EQ(iShared, iCount(2, 5));
}
"""

# Notes what runs, as runs.cpp does it for real tests.
RUNS = """
#include <cstdio>
#include <cstdlib>
static struct Runs
{
    FILE* pr = std::fopen(std::getenv("PMX_RUNS"), "w");
    Runs() { std::fputs("Count.Counts 1 tests/layer/count_test.cpp 3", pr); }
    ~Runs() { std::fputs("\\n", pr); }
} rRuns;
extern "C" void __cyg_profile_func_enter(void* pv, void*) { std::fprintf(rRuns.pr, " %p", pv); }
extern "C" void __cyg_profile_func_exit(void*, void*) {}
"""


def read(text, header=None):
    with tempfile.TemporaryDirectory() as directory:
        folder = pathlib.Path(directory).resolve()
        (folder / "x.cpp").write_text(text, encoding="utf-8")
        if header:
            (folder / "x.h").write_text(header, encoding="utf-8")
        texts = {"x.cpp": text, "x.h": header}
        return [(mutant, mutant.applied(texts[mutant.file])) for mutant in mutants.of_layer(folder, READ)[0]]


class Reading(unittest.TestCase):
    def becomes(self, kind, before, *after, around="void f(int a, int b, unsigned c) {{ {} }}"):
        """The changes of that kind are these and no others."""
        heads = "#define FALSE 0\n#define TRUE 1\ntypedef unsigned char BOOL; typedef unsigned char UCHAR;\n" \
                "typedef unsigned short UINT16; typedef unsigned UINT32; typedef int INT32;\n" \
                "enum E { E_A, E_B }; void vCall(int x, int y); void g(); extern BOOL fg; bool fgIs();\n"
        text = heads + around.format(before)
        found = [changed for mutant, changed in read(text) if mutant.kind == kind]
        self.assertEqual(sorted(heads + around.format(each) for each in after), sorted(found))

    def test_operators(self):
        self.becomes("operator", "if (a < b) g();", "if (a <= b) g();", "if (a >= b) g();")
        self.becomes("operator", "b = a /* < */ + b;", "b = a /* < */ - b;")
        self.becomes("operator", "if (a && b) g();", "if (a || b) g();", "if ((a)) g();", "if ((b)) g();")
        self.becomes("operator", "b = a ? 1 : 2;", "b = (a ? 2 : 1);")
        self.becomes("operator", "c <<= 2;", "c >>= 2;")
        self.becomes("operator", "b = ~a;", "b = (a);")
        self.becomes("operator", "b++;", "b--;")

    def test_constants(self):
        self.becomes("constant", "b = 4;", "b = 0;", "b = 3;", "b = 5;")
        self.becomes("constant", "b = 0x10u;", "b = 0x0u;", "b = 0xfu;", "b = 0x11u;")
        self.becomes("constant", "b = TRUE;", "b = FALSE;")
        self.becomes("constant", "b = E_A;", "b = ((decltype(E_A))(E_A + 1));", "b = ((decltype(E_A))(E_A - 1));")
        self.becomes("text", 'const char* sz = "x";', 'const char* sz = "~" "x";')

    def test_cells(self):
        self.becomes("cell", "{ 1, 5 }", "{ 0, 5 }", "{ 2, 5 }", "{ 1, 0 }", "{ 1, 4 }", "{ 1, 6 }", "{ 5, 1 }",
                     around="int arRow[] = {};")

    def test_truths(self):
        self.becomes("truth", "if (fg != FALSE) g();", "if (fg == TRUE) g();")
        self.becomes("truth", "if (a == 1) g();", "if (a != 0) g();")
        self.becomes("truth", "if (a) g();", "if ((a) == 1) g();")
        self.becomes("truth", "BOOL fgOther = fg;", "BOOL fgOther = (fg != FALSE);", "BOOL fgOther = (fg == TRUE);")
        self.becomes("truth", "if (fgIs()) g();")

    def test_conditions(self):
        self.becomes("condition", "if (fgIs()) g();", "if (!(fgIs())) g();", "if (true) g();", "if (false) g();")
        self.becomes("condition", "for (; a < b; a++) g();", "for (; false; a++) g();")

    def test_statements(self):
        self.becomes("statement", "g(); a = b;", "{} a = b;", "g(); {}")
        self.becomes("order", "g(); a = b;", "a = b; g();")
        self.becomes("order", "int d = a; g(); b = d;", "g(); int d = a; b = d;", "int d = a; b = d; g();")
        self.becomes("order", "int d = a; b = d;")
        self.becomes("argument", "vCall(a, b);", "vCall(b, a);")

    def test_types(self):
        self.becomes("narrow", "UINT32 d = c;", "UINT16 d = c;", "UINT32 d = (UINT16)(c);")
        self.becomes("narrow", "INT32 d = a;", "short d = a;", "INT32 d = (short)(a);")
        self.becomes("narrow", "b = (UCHAR)a;", "b = (a);")

    def test_what_is_nothing_in_what_ships_is_left_out(self):
        found = read("#define PMX_NOTE(x) ((void)0)\nvoid g();\nvoid f()\n{\n    PMX_NOTE(A);\n    g();\n}\n")
        self.assertEqual(["statement"], [mutant.kind for mutant, _ in found])

    def test_arguments_of_a_macro_are_where_they_are_written(self):
        found = read("#define WHY(Name, Answer) (Answer)\nint f()\n{\n    return WHY(MIXER, 7);\n}\n")
        self.assertIn("    return WHY(MIXER, 8);", [changed.splitlines()[3] for _, changed in found])

    def test_names_outlive_edits_elsewhere(self):
        text = "void g();\nint f(int a)\n{\n    if (a < 3)\n        g();\n    return a;\n}\n"
        edited = "// more\n" + text.replace("    return", "    g();\n    return").replace("int f", "int e();\nint f")
        names = {mutant.name for mutant, _ in read(text)}
        self.assertTrue(names)
        self.assertEqual(names, names & {mutant.name for mutant, _ in read(edited)})
        self.assertEqual(len(names), len(read(text)))


class Planting(unittest.TestCase):
    def setUp(self):
        directory = tempfile.TemporaryDirectory()
        self.addCleanup(directory.cleanup)
        self.folder = pathlib.Path(directory.name).resolve()
        self.layer, self.made = self.folder / "layer", self.folder / "made"
        self.layer.mkdir()
        self.made.mkdir()
        for name, text in (("count.cpp", LAYER), ("count.h", HEADER)):
            (self.layer / name).write_text(text, encoding="utf-8")
        self.cases = self.folder / "tests/layer/count_test.cpp"
        self.cases.parent.mkdir(parents=True)
        self.cases.write_text(CASES, encoding="utf-8")
        self.build("rest", PROGRAM)
        self.build("runs", RUNS)
        settings = {"root": str(self.folder), "layer": str(self.layer), "read": READ, "compile": ["g++", *FLAGS],
                    "product": ["g++", *FLAGS, "-O2"], "link": ["g++", "-no-pie"], "behind": [], "without": "",
                    "guards": ["-fsanitize=address"], "rest": [], "options": {}, "checks": [],
                    "programs": {"tests": str(self.folder / "rest.o")}, "runs": str(self.folder / "runs.o")}
        (self.made / "settings.json").write_text(json.dumps(settings), encoding="utf-8")
        self.equivalents = self.folder / "equivalent.txt"
        self.equivalents.write_text("", encoding="utf-8")

    def build(self, name, text):
        source = self.folder / f"{name}.cpp"
        source.write_text(text, encoding="utf-8")
        subprocess.run(["g++", f"-I{self.layer}", "-c", source, "-o", source.with_suffix(".o")], check=True)

    def mutate(self, *words):
        """(answer, what was printed)"""
        printed = io.StringIO()
        arguments = [str(self.folder / "cache"), str(self.made), "--equivalents", str(self.equivalents), *words]
        with contextlib.redirect_stdout(printed), contextlib.redirect_stderr(printed):
            try:
                answer = mutate.carry_out(mutate.asked_for(arguments))
            except mutants.Failed as reason:
                return 1, str(reason)
        return answer, printed.getvalue()

    def results(self):
        lines = (self.folder / "cache/results.jsonl").read_text(encoding="utf-8").splitlines()
        return {result["name"]: result for result in map(json.loads, lines)}

    def name(self, *words):
        found = [name for name in self.results() if all(word in name for word in words)]
        self.assertTrue(found, words)
        return found

    def test_each_is_judged_as_it_behaves(self):
        answer, printed = self.mutate()
        self.assertEqual(1, answer)
        of = {name: result["verdict"] for name, result in self.results().items()}
        self.assertIn(f"survived: {self.name('fgOverlooked:operator')[0]}", printed)
        self.assertEqual({"survived"}, {of[name] for name in self.name("fgOverlooked:operator")})
        self.assertEqual({"killed", "refused"}, {of[name] for name in self.name("iCount:statement")})
        self.assertIn("hung", {of[name] for name in self.name("iCount:operator")})
        self.assertEqual({"killed"}, {of[name] for name in self.name("count.h:iTwice:operator")})
        self.assertEqual({"tests:Count.Counts", "tests.guarded:Count.Counts"},
                         {result["by"] for result in self.results().values() if result["by"]})
        self.assertRegex(printed, rf"(?m)^{len(of)} mutants, 0 of them judged before;")

    def test_one_that_does_not_compile_is_no_killed_one(self):
        (self.layer / "count.cpp").write_text(LAYER + "static_assert(STEPS[1] == 2);\n", encoding="utf-8")
        self.mutate("STEPS:cell")
        verdicts = collections.Counter(result["verdict"] for result in self.results().values())
        self.assertEqual({"killed": 2, "refused": 4}, verdicts)

    def test_what_compiles_to_the_same_is_no_survivor(self):
        (self.layer / "count.cpp").write_text(LAYER.replace("iValue > 3", "(unsigned)iValue >= 0u"), encoding="utf-8")
        self.mutate("fgOverlooked:narrow")
        self.assertEqual({"same code"}, {result["verdict"] for result in self.results().values()})

    def test_what_was_judged_is_not_judged_again(self):
        self.mutate("fgOverlooked")
        before = (self.folder / "cache/results.jsonl").read_text(encoding="utf-8")
        _, printed = self.mutate("fgOverlooked")
        self.assertEqual(before, (self.folder / "cache/results.jsonl").read_text(encoding="utf-8"))
        number = len(before.splitlines())
        self.assertRegex(printed, rf"(?m)^{number} mutants, {number} of them judged before;")
        with (self.folder / "cache/results.jsonl").open("a", encoding="utf-8") as file:
            file.write('{"key": "broken off')
        self.assertEqual(self.mutate("fgOverlooked")[0], 1)
        (self.layer / "count.cpp").write_text(LAYER + "int iMore;\n", encoding="utf-8")
        self.assertRegex(self.mutate("fgOverlooked")[1], rf"(?m)^{number} mutants, 0 of them judged before;")

    def test_what_was_seen_stays_seen_when_tests_are_added(self):
        self.mutate("fgOverlooked", "iFourfold")
        of = collections.Counter(result["verdict"] == "survived" for result in self.results().values())
        self.assertTrue(of[True] and of[False])
        self.cases.write_text(CASES + "\nTEST(Count, More)\n{\n    EXPECT_TRUE(!fgOverlooked(3));\n}\n", "utf-8")
        self.build("rest", PROGRAM.replace("fgOverlooked(4);", "vExpect(!fgOverlooked(3) && fgOverlooked(4));"))
        _, printed = self.mutate("fgOverlooked", "iFourfold")
        self.assertRegex(printed, rf"(?m)^{of.total()} mutants, {of[False]} of them judged before;")
        self.assertEqual("killed", self.results()[self.name("fgOverlooked:operator")[0]]["verdict"])

    def test_what_a_case_saw_is_judged_again_when_the_case_is_another(self):
        self.mutate("iTwice:operator")
        for text in (CASES.replace("iCount(2, 5)", "iCount(1, 4)"), CASES.replace("iShared = 3", "iShared = 1 + 2")):
            self.cases.write_text(text, encoding="utf-8")
            self.assertRegex(self.mutate("iTwice:operator")[1], r"(?m)^1 mutants, 0 of them judged before;")
            self.assertRegex(self.mutate("iTwice:operator")[1], r"(?m)^1 mutants, 1 of them judged before;")

    def test_what_cases_include_and_checks_import_is_part_of_them(self):
        self.mutate("iTwice:operator", "fgOverlooked:operator")
        number = len(self.results())
        for file, lost in (("tests/core/numbers.h", 1), ("board/board.h", number), ("cmake/functions.py", number - 1)):
            path = self.folder / file
            path.parent.mkdir(parents=True)
            path.write_text("// more\n", encoding="utf-8")
            _, printed = self.mutate("iTwice:operator", "fgOverlooked:operator")
            self.assertRegex(printed, rf"(?m)^{number} mutants, {number - lost} of them judged before;")

    def test_another_compiler_or_judge_judges_anew(self):
        compiler, judge = self.folder / "compiler", self.folder / "judge.py"
        settings = kill.Settings(self.made / "settings.json")
        settings.compile = [str(compiler)]
        keys = set()
        for version, text in ((1, "a"), (2, "a"), (2, "b")):
            compiler.write_text(f"#!/bin/sh\necho {version}\n", encoding="utf-8")
            compiler.chmod(0o755)
            judge.write_text(text, encoding="utf-8")
            with unittest.mock.patch.object(kill, "JUDGES", (judge,)):
                keys.add(settings.layer_key())
        self.assertEqual(3, len(keys))

    def test_one_that_passes_but_cannot_be_guarded_is_no_refused_one(self):
        guarded = "constexpr int LIMIT = 3;\n#ifdef __SANITIZE_ADDRESS__\nstatic_assert(LIMIT == 3);\n#endif\n"
        (self.layer / "count.cpp").write_text(
            LAYER.replace("return iValue > 3", guarded + "return iValue > LIMIT"), encoding="utf-8")
        answer, printed = self.mutate("fgOverlooked:constant")
        self.assertEqual(1, answer)
        self.assertIn("passes the tests, but cannot be made as tests.guarded", printed)

    def test_a_fault_that_leaves_an_object_is_seen_by_whoever_guards_it(self):
        self.mutate("iSumOfThree:operator")
        of = {result["by"] for result in self.results().values() if result["verdict"] == "killed"}
        self.assertIn("tests.guarded:Count.Counts", of)

    def test_a_fault_that_a_check_of_what_ships_sees(self):
        (self.layer / "count.cpp").write_text(LAYER + 'const char* szName() { return "count"; }\n', encoding="utf-8")
        self.mutate("szName:text")
        self.assertEqual({"survived"}, {result["verdict"] for result in self.results().values()})
        check = self.folder / "check_names.py"
        check.write_text("import pathlib, sys\n"
                         "sys.exit(any(b'~count' in pathlib.Path(made).read_bytes() for made in sys.argv[1:]))\n",
                         encoding="utf-8")
        settings = json.loads((self.made / "settings.json").read_text(encoding="utf-8"))
        settings["checks"] = [[sys.executable, str(check)]]
        (self.made / "settings.json").write_text(json.dumps(settings), encoding="utf-8")
        self.mutate("szName:text")
        self.assertEqual({"check:check_names.py"}, {result["by"] for result in self.results().values()})

    def test_equivalents_are_no_survivors(self):
        self.mutate("fgOverlooked")
        names = [name for name, result in self.results().items() if result["verdict"] == "survived"]
        self.equivalents.write_text("# all\n" + "".join(f"{name} nobody looks at it\n" for name in names), "utf-8")
        self.assertEqual(0, self.mutate("fgOverlooked")[0])

    def test_a_list_of_equivalents_that_is_wrong(self):
        self.mutate("fgOverlooked:operator", "iCount:statement")
        killed = [name for name, result in self.results().items() if result["verdict"] == "killed"][0]
        name = self.name("fgOverlooked:operator")[0]
        for text, message in ((f"{killed} it is so\n", "is on the list of equivalents, and tests:Count.Counts sees it"),
                              ("count.cpp:f:cell:1-0 it is so\n", "and there is no such mutant"),
                              (f"{name}\n", f"equivalent.txt:1: {name} has no reason"),
                              (f"{name} it is so\n" * 2, "equivalent.txt:2")):
            self.equivalents.write_text(text, encoding="utf-8")
            answer, printed = self.mutate("fgOverlooked:operator", "iCount:statement")
            self.assertEqual(1, answer)
            self.assertIn(message, printed)

    def test_a_sample_is_the_same_every_time_and_spread(self):
        _, printed = self.mutate("9", "--seed", "4")
        self.assertIn("drawn with --seed 4\n", printed)
        self.assertEqual(9, len(self.results()))
        self.assertGreater(len({name.split(":")[2] for name in self.results()}), 4)
        self.assertRegex(self.mutate("9", "--seed", "4")[1], r"(?m)^9 mutants, 9 of them judged before;")

    def test_a_mutant_is_shown(self):
        self.mutate("fgOverlooked:operator")
        answer, printed = self.mutate("--show", sorted(self.name("fgOverlooked:operator"))[0])
        self.assertEqual(0, answer)
        self.assertIn("-    return iValue > 3;\n+    return iValue >= 3;\n", printed)
        self.assertEqual((1, "there is no mutant x"), self.mutate("--show", "x"))

    def test_tests_that_fail_anyway_see_nothing(self):
        for change, program in ((("iSum = 0", "iSum = 1"), "tests"), (("i < 3", "i < 4"), "tests.guarded")):
            (self.layer / "count.cpp").write_text(LAYER.replace(*change), encoding="utf-8")
            answer, printed = self.mutate("fgOverlooked")
            self.assertEqual(1, answer)
            self.assertIn(f"the tests fail without any mutant ({program}: ", printed)


class List(unittest.TestCase):
    def test_every_equivalent_is_there(self):
        includes = [f"-I{ROOT / folder}" for folder in ("src/system/inc", "src/driver/inc", "src/driver/private_inc")]
        language = (ROOT / "examples/layer.flags").read_text(encoding="utf-8").split()
        found, _ = mutants.of_layer(ROOT / "src/driver/pmx", ["clang++", *language, *includes, *READ[-4:]])
        self.assertGreater(len(found), 3000)
        self.assertEqual(len(found), len({mutant.name for mutant in found}))
        self.assertEqual([], mutate.gone(mutate.read_equivalents(mutate.EQUIVALENT), found))
        self.assertEqual(set(mutants.KINDS), {mutant.kind for mutant in found})
        types = (ROOT / "src/system/inc/x_typedef.h").read_text(encoding="utf-8")
        named = [each for each in mutants.NARROWER.values() if each != "short"]
        self.assertEqual([], [each for each in named if f" {each};" not in types])


if __name__ == "__main__":
    unittest.main()
