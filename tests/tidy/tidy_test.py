#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Feeds tidy.py small projects, each with one thing that it must name, and one that must pass."""

import pathlib
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True

import format as house_format  # noqa: E402
import tidy  # noqa: E402
from cpp import Source  # noqa: E402

PLATFORM = "src/driver/private_inc/drv_tve.h"
LAYER = "src/driver/private_inc/drv_pmx.h"
HEADER = "src/driver/private_inc/drv_other.h"  # neither the layer's nor the platform's

CLEAN = {
    PLATFORM: '#ifdef __cplusplus\nextern "C" {\n#endif\n'
              "/** Show black.\n *  @param u4Tve  encoder\n *  @return 1 */\nUINT32 TVE_Black(UINT32 u4Tve);\n"
              "#ifdef __cplusplus\n}\n#endif\n",
    LAYER: "/** Start.\n *  @context any */\nPMX_API void PMX_Init(void);\n",
    "src/driver/pmx/pmx_if.cpp": "void PMX_Init(void)\n{\n    TVE_Black(0); // before the first picture\n}\n",
    "board/tv_encoder.cpp": "UINT32 TVE_Black(UINT32 u4Tve)\ntry\n{\n"
                            "    BOARD_CALL_R(TVE_Black, u4Tve);\n    return 1;\n}\nBOARD_CALL_END(TVE_Black)\n",
}


class Tidy(unittest.TestCase):
    def found(self, files=None):
        """What is found in the clean project with these files added or replaced."""
        with tempfile.TemporaryDirectory() as directory:
            root = pathlib.Path(directory)
            for name, text in {**CLEAN, **(files or {})}.items():
                path = root / name
                path.parent.mkdir(parents=True, exist_ok=True)
                path.write_text(text, encoding="utf-8")
            return [f"{name}:{line}: {message}" for name, line, message in tidy.complaints(root)]

    def refused(self, text, name, content):
        found = self.found(files={name: content})
        self.assertTrue(any(text in line for line in found), f"{text!r} is not in {found}")

    def accepted(self, name, content):
        self.assertEqual([], self.found(files={name: content}))

    def test_a_clean_project_passes(self):
        self.assertEqual([], self.found())

    def test_white_space(self):
        self.refused("a.txt:1: no newline", "a.txt", "word")
        self.refused("a.txt:2: blanks", "a.txt", "word\nword \n")
        self.refused("a.txt:1: tab", "a.txt", "\tword\n")
        self.refused("a.txt:1: tab or carriage return", "a.txt", "word\r\n")
        self.refused("blank line at the end", "a.txt", "word\n\n")
        self.refused("a.cpp:1: 121 columns", "a.cpp", "x" * 121 + "\n")
        self.accepted("a.cpp", "x" * 120 + "\n")

    def test_binary_files_are_left_alone(self):
        self.accepted("a.bin", "\0\t  \n")

    def test_wording(self):
        for word in ("TO" "DO", "FIX" "ME"):
            self.refused("unfinished", "a.txt", f"a {word} here\n")
        for word in ("the sp" "ec says", "Sp" "ecification", "a req" "uirement", "Req" "uirements", "Part" " 1.2",
                     "issue" " 2", "/tm" "p/x", "share" "d/x"):
            self.refused("out of place here", "a.txt", f"a {word}\n")
        self.refused("the file's name", "sp" "ec.txt", "word\n")
        self.accepted("a.txt", "a special specifier, a part of it, an issue with it, it requires and is required\n")

    def test_commented_out_code(self):
        for comment in ("// x = 1;", "// return;", "// if (x)", "// }", "/* x(); */", "//#include <x>",
                        "/*\n x = 1;\n*/"):
            self.refused("commented-out code", "a.cpp", comment + "\n")
        self.refused("#if 0", "a.cpp", "#if 0\nint x;\n#endif\n")
        self.accepted("a.cpp", "// the reset clears the handle;\n// - not the timer (it has its own);\n")
        self.accepted("a.cpp", "// these are the lines of brief();\n")
        self.accepted("a.h", "/** How to:\n *\n *      call(x);\n *  and so on */\n")

    def test_function_length(self):
        def body(lines):
            return "namespace a\n{\nint f(int x)\n{\n" + "    x++;\n" * lines + "}\n}\n"
        self.refused("a.cpp:4: f: 71 lines", "a.cpp", body(71))
        self.accepted("a.cpp", body(70))
        self.accepted("a.cpp", 'TEST_F(A, B)\n{\n    trace(R"(\n' + "word\n" * 90 + ')");\n}\n')
        self.refused("A.B: 71 lines", "a.cpp", "TEST_F(A, B)\n{\n" + "    x++;\n" * 71 + "}\n")
        self.accepted("a.cpp", "const T ar[] = {\n" + "    { 1 },\n" * 90 + "};\n")

    def test_long_functions_need_a_reason_and_a_cause(self):
        text = "int f(int x)\n{\n" + "    x++;\n" * 71 + "}\n"
        files = {"a.cpp": text, tidy.LONG_FUNCTIONS: "a.cpp f  # one report\n"}
        self.assertEqual([], self.found(files=files))
        self.refused("FILE FUNCTION  # reason", tidy.LONG_FUNCTIONS, "a.cpp f\n")
        self.refused("no longer needed: a.cpp f", tidy.LONG_FUNCTIONS, "a.cpp f  # one report\n")

    def test_what_the_layer_does_without(self):
        for code in ("class A;", "int* p = new int;", "throw 1;", "virtual void f();", "template <int N> int f();",
                     "void* p = malloc(1);", "std::size_t z;", "#include <cstring>",
                     "BOOL fg = _arPmxDispPartStatus.fgTimerAlreadySet;"):
            self.refused("src/driver/pmx/a.cpp:1: ", "src/driver/pmx/a.cpp", code + "\n")
        self.refused("decides by mode", "src/driver/pmx/a.cpp", "void f()\n{\n    switch (ucMode)\n    {\n    }\n}\n")
        self.accepted("src/driver/pmx/a.c", "#include <linux/export.h>\n")
        self.accepted("src/driver/pmx/a.cpp", "#include <stddef.h>\n// a new class of modes\n")

    def test_wings_of_the_tool_stand_on_each_other(self):
        self.refused("a.cpp:1: view does not know language, which is built on it", "tools/pmxboard/view/a.cpp",
                     '#include "tools/pmxboard/language/session.h"\n')
        self.refused("a.cpp:1: widgets is no wing", "tools/pmxboard/view/a.cpp",
                     '#include "tools/pmxboard/widgets/b.h"\n')
        self.accepted("tools/pmxboard/language/a.cpp", '#include "tools/pmxboard/view/output.h"\n')
        self.accepted("tools/pmxboard/main.cpp", '#include "tools/pmxboard/commands/command_line.h"\n')

    def test_contracts_of_the_layer(self):
        head, tail = "/** Do.\n", "PMX_API UINT32 PMX_Init(UCHAR ucPmxId);\n"
        good = " *  @param ucPmxId  id\n *  @return 1\n *  @context any */\n"
        self.accepted(LAYER, head + good + tail)
        self.refused("no contract", LAYER, tail)
        self.refused("no contract", LAYER, head + good + "\n#define X 1\n" + tail)
        self.refused("no @param ucPmxId", LAYER, head + good.replace("ucPmxId", "ucId") + tail)
        self.refused("@param ucId is no parameter", LAYER, head + good.replace("ucPmxId", "ucId") + tail)
        self.refused("no @return", LAYER, head + good.replace("@return", "gives") + tail)
        self.refused("no @context", LAYER, head + good.replace("@context", "from") + tail)
        self.refused("nothing is returned", LAYER, head + good + tail.replace("UINT32", "void"))

    def test_contracts_of_the_platform(self):
        self.refused("no contract", PLATFORM, "UINT32 TVE_Black(UINT32 u4Tve);\n")
        self.refused("no @param u4Tve", PLATFORM, "/** Black. @return 1 */\nUINT32 TVE_Black(UINT32 u4Tve);\n")

    def test_pointers_tell_what_they_mean(self):
        def header(param, type_name="UINT8*", other="UINT32 u4Number", before=""):
            return (f"{before}/** Take.\n *  @param u4Number  a A_T value\n *  {param} */\n"
                    f"void TVE_Take({other}, {type_name} p);\n")

        def refused(text, *arguments, **named):
            self.refused(text, HEADER, header(*arguments, **named))

        for type_name, param in (
                ("UINT8*", "@param[out] p  receives it"), ("const UINT8*", "@param[in] p  [8] eight"),
                ("UINT8*", "@param[in,out] p  [COUNT] all"), ("void*", "@param[out] p  [u4Number bytes] some"),
                ("const CHAR*", "@param[in] p  [text] a name"), ("CHAR*", "@param[out] p  [text of u4Number] a name"),
                ("void*", "@param[in] p  [tag] any"), ("const void*", "@param[in] p  [symbol] a table"),
                ("void**", "@param[out] p  [symbol] a table"), ("void**", "@param[out] p  [tag] its tag"),
                ("UINT32", "@param p  a number")):
            self.accepted(HEADER, header(param, type_name))

        refused("TVE_Take: p is a pointer: @param[in], @param[out] or @param[in,out]", "@param p  receives it")
        refused("TVE_Take: p is a pointer", "@param[inout] p  [8] eight")
        refused("TVE_Take: p is a pointer", "@param[in] q  [8] eight")
        refused("[eight] is none of", "@param[out] p  [eight] items")
        refused("[0] is none of", "@param[out] p  [0] items")
        refused("[bytes of u4Number] is none of", "@param[out] p  [bytes of u4Number] items")
        refused("u4Other is no number that the function is given", "@param[out] p  [u4Other bytes] some")
        refused("[p bytes]: p is no number", "@param[out] p  [p bytes] some", "void*")
        refused("p is const, and not written", "@param[out] p  receives it", "const UINT8*")
        refused("tells no type", "@param[in] p  something", "void*")
        refused("tells no type", "@param[in] p  [8] something", "void*")
        refused("points to UINT32, not to bytes", "@param[in] p  [u4Number bytes] some", "UINT32*")
        refused("p is a text: [text]", "@param[in] p  a name", "const CHAR*")
        refused("is a text: [text] when it is read", "@param[out] p  [text] a name", "CHAR*")
        refused("is a text: [text] when it is read", "@param[in] p  [text of u4Number] a name", "const CHAR*")
        refused("p is no [text]", "@param[in] p  [text] a name", "const UINT8*")
        refused("is no [tag]: that is a void*", "@param[in] p  [tag] any", "UINT8*")
        refused("nobody writes behind a [tag]", "@param[out] p  [tag] any", "void*")
        refused("receives a [tag] or a [symbol]", "@param[out] p  receives it", "void**")
        refused("p is not @param[in]", "@param[in] p  [tag] any", "void**")
        refused("p is no pointer, and needs neither", "@param[in] p  a number", "UINT32")
        refused("p is no pointer, and needs neither", "@param p  [8] numbers", "UINT32")

    def test_pointers_to_what_a_command_says(self):
        def header(enumerators, text="a A_T value", behind="by u4Number"):
            return (f"typedef DRV_ENUM(A_T)\n{{\n{enumerators}\n}} A_T;\n\n/** Take.\n *  @param u4Number  {text}\n"
                    f" *  @param[in] pv  [{behind}] what goes with it */\nvoid TVE_Take(UINT32 u4Number, void* pv);\n")

        good = "    A_ONE = 1, /**< [UINT8] a byte */\n    A_TWO = 2 /**< [UINT32] */"
        self.accepted(HEADER, header(good))
        self.refused("A_ONE does not tell the type", HEADER, header(good.replace("[UINT8] ", "")))
        self.refused("A_TWO does not tell the type", HEADER, header(good.replace(" /**< [UINT32] */", "")))
        self.refused("u4Number does not say of which enumeration", HEADER, header(good, text="a number"))
        self.refused("u4Number does not say of which enumeration", HEADER, header(good, text="a B_T value"))
        self.refused("u4Other is no number", HEADER, header(good, behind="by u4Other"))

    def test_pointers_of_functions_that_are_called_through_a_pointer(self):
        callback = "/** Called.\n *  @param[in] pvArg  [tag] any */\ntypedef void (*callback_fct)(void* pvArg);\n"
        take = "/** Take.\n *  @param[in] pf  [symbol] called */\nvoid TVE_Take(callback_fct pf);\n"
        self.accepted(HEADER, callback + take)
        self.refused("callback_fct: pvArg is a pointer", HEADER, callback.replace("[in]", "") + take)
        self.refused("TVE_Take: pf is a pointer", HEADER, callback + take.replace("[in]", ""))
        self.refused("pf is the address of a function: [symbol]", HEADER, callback + take.replace("[symbol] ", ""))

        def table(member):
            return f"typedef struct\n{{\n    UINT32 u4Size; /**< of it */\n{member}\n}} ITable;\n"

        self.accepted(HEADER, table("    INT32 (*pi4Stop)(void* pvTag, UINT32 u4Case);"))
        for parameters in ("void* pvTag, UINT8* pu1", "UINT8* pu1"):
            self.refused("pi4Get: its pointers need a contract", HEADER, table(f"    INT32 (*pi4Get)({parameters});"))
        contract = "    /** Get.\n     *  @param[in] pvTag  [tag] any\n     *  @param[out] pu1  receives it */\n"
        member = "    INT32 (*pi4Get)(void* pvTag, UINT8* pu1);"
        self.accepted(HEADER, table(contract + member))
        self.refused("pi4Get: pu1 is a pointer", HEADER, table(contract.replace("[out]", "") + member))
        self.refused("pi4Get: as i4PmxGet, which the layer does not offer", HEADER,
                     table(member + " /**< as i4PmxGet */"))
        layer = ("/** Get.\n *  @param[in] pvTag  [tag] any\n *  @param[out] pu1  receives it\n *  @return 1\n"
                 " *  @context any */\nPMX_API INT32 i4PmxGet(void* pvTag, UINT8* pu1);\n")
        files = {LAYER: CLEAN[LAYER] + layer, HEADER: table(member + " /**< as i4PmxGet */")}
        self.assertEqual([], self.found(files=files))
        files[HEADER] = files[HEADER].replace("UINT8* pu1", "UINT16* pu2")
        self.assertIn("with the same parameters", "".join(self.found(files=files)))

    def test_the_board_records_every_call(self):
        def board(body, end="BOARD_CALL_END(TVE_Black)"):
            return {"name": "board/tv_encoder.cpp",
                    "content": f"UINT32 TVE_Black(UINT32 u4Tve)\ntry\n{{\n    {body}\n}}\n{end}\n"}

        self.refused("the first statement is not", **board("return 1;"))
        self.refused("recorded as TVE_White", **board("BOARD_CALL_R(TVE_White, u4Tve);"))
        self.refused("does not fit its result", **board("BOARD_CALL(TVE_Black, u4Tve);"))
        self.refused("u4Tve is not recorded", **board("BOARD_CALL_R(TVE_Black);"))
        for end in ("", "BOARD_CALL_END(TVE_White)"):
            self.refused("ends without BOARD_CALL_END(TVE_Black)", **board("BOARD_CALL_R(TVE_Black, u4Tve);", end))
        self.refused("the board does not have it", "board/tv_encoder.cpp", "void other()\n{\n}\n")


class Format(unittest.TestCase):
    ENUMERATION = ("typedef DRV_ENUM(A_T)\n{\n    A_ONE = 1,\n    A_TWO = 2\n} A_T;\n\n"
                   "DRV_ENUM_UNNAMED\n{\n    B_ONE = 1,\n    B_TWO = 2\n};\n")

    def formatted(self, text):
        return house_format.formatted(house_format.ROOT / "src/system/inc/sample.h", text)

    def test_the_house_style_stays(self):
        for text in (self.ENUMERATION, "void f(void)\n{\n    if (x)\n        y();\n}\n",
                     "#define DRV_ENUM(Name) enum Name\n"):
            self.assertEqual(text, self.formatted(text))

    def test_anything_else_is_brought_into_it(self):
        self.assertEqual(self.ENUMERATION, self.formatted(self.ENUMERATION.replace("\n{\n", " {\n")))
        self.assertEqual("void f(UCHAR* puc)\n{\n    x(1);\n}\n",
                         self.formatted("void f(UCHAR *puc) {\n  x( 1 );\n}\n"))


class Reading(unittest.TestCase):
    def test_functions_are_found_wherever_they_stand(self):
        source = Source('extern "C" {\nvoid a(void)\n{\n}\n}\n'
                        "namespace n\n{\nclass C\n{\n    int b() const { return 1; }\n};\n"
                        "C::C(int x) : m_x(x)\n{\n}\nbool operator==(C, C)\n{\n}\n}\nstruct S s = { 1 };\n"
                        "auto c(int x) -> int\n{\n    auto f = [](int y) { return y; };\n    if (x) { f(x); }\n}\n")
        self.assertEqual(["a", "b", "C::C", "operator==", "c"], [function.name for function in source.functions()])


if __name__ == "__main__":
    unittest.main()
