# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes the program whose instructions are counted, from what was recorded of each path: the floors, and around them
functions of the platform that answer at once what was answered then.

The floor of a path is the cheapest layer that could be: a straight line of the same calls with the same arguments,
compiled like the layer. The program runs each path twice, once through the layer and once through its floor, and holds
every call of both against the recording: function, order, arguments and result.
"""

import itertools

import signatures


def c_text(content):
    """A C string literal of these bytes."""
    escapes = {0x22: '\\"', 0x5C: "\\\\", 0x0A: "\\n", 0x3F: "\\?"}
    return '"' + "".join(escapes.get(byte) or (chr(byte) if 0x20 <= byte < 0x7F else f"\\{byte:03o}")
                         for byte in content) + '"'


def number(value):
    return f"{value}ll" if -2**31 <= value < 2**32 else f"{value}ull" if value >= 2**63 else f"{value}ll"


class Data:
    """The objects that arguments point to: one for each content, a fresh one for each place that is written."""

    def __init__(self, prefix):
        self.prefix = prefix
        self.declared = []
        self.contents = {}

    def of(self, content):
        if content not in self.contents:
            self.contents[content] = self._declare(len(content), ", ".join(f"0x{byte:02x}" for byte in content))
        return self.contents[content]

    def place(self):
        return self._declare(512, "")

    def _declare(self, size, values):
        name = f"{self.prefix}{len(self.declared)}"
        self.declared.append(f"alignas(8) static unsigned char {name}[{size}] = {{ {values} }};")
        return name


def expression(parameter_type, value, data):
    """An argument as it was recorded, in C++."""
    cast = f"({parameter_type})" if parameter_type else ""
    if value is None:
        return f"{cast or '(const char*)'}nullptr"
    if isinstance(value, int):
        return f"{cast or '(int)'}{number(value)}"
    if "long" in value:
        return f"{value['long']}l"
    if "text" in value:
        return c_text(bytes.fromhex(value["text"]))
    if "symbol" in value:
        return f"{cast}&{value['symbol']}"
    if "data" in value:
        return f"{cast}{data.of(bytes.fromhex(value['data']))}"
    return f"{cast}{data.place()}"


def arguments(function, recorded, data):
    """All arguments of a call. What is variadic stands at the end; a list of values is made of the caller's own."""
    recorded = iter(recorded)
    for parameter in function.parameters:
        if parameter.kind == "list":
            yield "values"
        elif parameter.kind == "values":
            for value in recorded:
                yield expression("", value, data)
        else:
            yield expression(parameter.type, next(recorded), data)


def floor(index, path, data):
    """A straight line of calls."""
    operation = signatures.operations()[path["name"]]
    lines = []
    for call in path["calls"]:
        function = signatures.platform()[call["name"]]
        lines.append(f"{call['name']}({', '.join(arguments(function, call['arguments'], data))});")
    if any(call["name"] == "x_vsnprintf" for call in path["calls"]):
        lines = ["va_list values;", "va_start(values, format_string);", *lines, "va_end(values);"]
    if operation.has_result:
        lines.append(f"return ({operation.result}){number(path['result'])};")
    body = "".join(f"    {line}\n" for line in lines)
    return f"extern \"C\" {operation.declaration(f'floor_{index}')}\n{{\n{body}}}\n"


def floors(paths):
    """The source of all floors; it is compiled with the product's flags."""
    data = Data("data_")
    functions = "\n".join(floor(index, path, data) for index, path in enumerate(paths))
    return f"""{_includes()}
extern "C" UINT32 {signatures.PLANE_CALL}(void* pvTag, DRV_PMX_COLOR_SPACE_T eColorSpace);
{chr(10).join(data.declared)}
{functions}"""


def _includes():
    return "#include <stdarg.h>\n" + "".join(f'#include "{header}"\n' for header in signatures.HEADERS)


def _stand_in(number_of, function):
    """A function of the platform: it checks that it is its turn and what it is given, and answers as recorded."""
    lines = [f"const Answer& answer = turn({number_of});"]
    previous = ""
    for index, parameter in enumerate(function.parameters):
        name = parameter.name
        if parameter.kind in ("number", "tag"):
            lines.append(f"take((uintptr_t){name});")
        elif parameter.kind == "text":
            lines.append(f"take_text({name});")
        elif parameter.kind == "symbol":
            lines.append(f"take((uintptr_t){name});")
        elif parameter.kind == "values":
            lines += ["va_list values;", f"va_start(values, {previous});", f"take_values({previous}, values);",
                      "va_end(values);"]
        elif parameter.kind == "data":
            lines.append(f"take_data({name}, {name} == nullptr ? 0 : {parameter.read});")
        if parameter.written and function.name != "x_vsnprintf":
            lines.append(f"write(answer, {index}, {name});")
        previous = name
    if function.name == "x_vsnprintf":
        lines.append("write(answer, 0, szBuffer);")
    if function.name == "i4ImQueryInterface":
        lines += ["write(answer, 4, ppvTag);", "if (answer.result >= 0)\n        *ppvIf = const_cast<IVdp*>(&plane);"]
    lines.append(f"return ({function.result})answer.result;" if function.has_result else "(void)answer;")
    body = "\n    ".join(lines)
    return f"{function.declaration()}\n{{\n    {body}\n}}\n"


def _answers(index, path, order):
    """What the platform answers on a path: one row a call, its outputs in a list of their own."""
    outputs, rows = [], []
    for call in path["calls"]:
        first = len(outputs)
        outputs += [f'{{ {at}, {len(content) // 2}, {c_text(bytes.fromhex(content))} }}'
                    for at, content in call["outputs"].items()]
        rows.append(f"{{ {order[call['name']]}, {number(call['result'] or 0)}, {first}, {len(outputs)} }}")
    return (f"static const Output outputs_{index}[] = {{ {', '.join([*outputs, '{ 0, 0, nullptr }'])} }};\n"
            f"static const Answer answers_{index}[] = {{ {', '.join([*rows, '{ -1, 0, 0, 0 }'])} }};\n")


def _run(index, path, of_floor, data):
    """A function that makes the path's call, through the layer or through its floor."""
    operation = signatures.operations()[path["name"]]
    given = ", ".join(arguments(operation, path["arguments"], data))
    name = f"floor_{index}" if of_floor else path["name"]
    call = f"(int64_t){name}({given})" if operation.has_result else f"({name}({given}), int64_t(0))"
    return f"static int64_t run_{'floor' if of_floor else 'layer'}_{index}() {{ return {call}; }}\n"


HARNESS = r"""
struct Output { int parameter; unsigned size; const char* content; };
struct Answer { int function; long long result; int first; int last; };
struct Path { const char* name; int64_t (*layer)(); int64_t (*floor)(); const Answer* answers; const Output* outputs;
              long long result; };

static const Answer* next;
static const Output* outputs;
static uint64_t heard;

[[noreturn]] static void fail(const char* what)
{
    fprintf(stderr, "%s\n", what);
    exit(1);
}

static void take(uint64_t value) { heard = (heard ^ value) * 0x100000001b3u; }

static void take_data(const void* first, size_t size)
{
    take(first != nullptr);
    for (size_t i = 0; i < size; i++)
        take(((const unsigned char*)first)[i]);
}

static void take_text(const char* text) { take_data(text, text == nullptr ? 0 : strlen(text)); }

static void take_values(const char* format, va_list values)
{
    for (const char* at = strchr(format, '%'); at != nullptr; at = strchr(at, '%'))
    {
        at += 1 + strspn(at + 1, "0123456789-+ #.");
        bool is_long = *at == 'l';
        at += strspn(at, "l");
        if (*at == '%')
            at++;
        else if (*at == 's')
            take_text(va_arg(values, const char*));
        else if (is_long)
            take(va_arg(values, long));
        else
            take(va_arg(values, int));
    }
}

static const Answer& turn(int function)
{
    if (next->function != function)
        fail("a call that was not recorded");
    take(function);
    return *next++;
}

static void write(const Answer& answer, int parameter, void* place)
{
    for (int i = answer.first; i < answer.last; i++)
        if (outputs[i].parameter == parameter)
            memcpy(place, outputs[i].content, outputs[i].size);
}
"""

MAIN = r"""
static void begin(const Path& path)
{
    next = path.answers;
    outputs = path.outputs;
    heard = 0;
    CALLGRIND_ZERO_STATS;
}

static uint64_t end(const Path& path, const char* who, int64_t result)
{
    char name[200];
    snprintf(name, sizeof name, "%s/%s", who, path.name);
    CALLGRIND_DUMP_STATS_AT(name);
    if (next->function != -1 || result != path.result)
        fail(name);
    return heard;
}

int main(int, char** arguments)
{
    FILE* states = fopen(arguments[1], "rb");
    if (states == nullptr)
        fail("no states");
    for (const Path& path : PATHS)
    {
        for (const Object& object : OBJECTS)
            if (fread(object.first, 1, object.size, states) != object.size)
                fail("too few states");
        begin(path);
        uint64_t layer = end(path, "layer", path.layer());
        begin(path);
        if (end(path, "floor", path.floor()) != layer)
            fail(path.name);
    }
    return 0;
}
"""


def harness(paths, names, objects):
    """The source of everything else: platform, answers, paths, the loop over them."""
    order = {name: i for i, name in enumerate(signatures.platform())}
    data = Data("given_")
    runs = "".join(_run(i, path, of_floor, data) for i, path in enumerate(paths) for of_floor in (False, True))
    declared = "\n".join(f"extern \"C\" {signatures.operations()[path['name']].declaration(f'floor_{i}')};"
                         for i, path in enumerate(paths))
    results = [number(path["result"] or 0) for path in paths]
    rows = "\n".join(f'    {{ "{name}", run_layer_{i}, run_floor_{i}, answers_{i}, outputs_{i}, {results[i]} }},'
                     for i, name in enumerate(names))
    state = "\n".join(f'extern "C" unsigned char state_{i}[{size}] __asm__("{name}");'
                      for i, (name, size) in enumerate(objects))
    state_rows = ", ".join(f"{{ state_{i}, {size} }}" for i, (_, size) in enumerate(objects))
    stand_ins = "\n".join(_stand_in(order[name], function) for name, function in signatures.platform().items())
    return "".join(itertools.chain([f"""#include <cstdarg>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <valgrind/callgrind.h>

{_includes()}
{HARNESS}
extern "C" UINT32 {signatures.PLANE_CALL}(void* pvTag, DRV_PMX_COLOR_SPACE_T eColorSpace);
static const IVdp plane = {{ .pu4SetColorMode = {signatures.PLANE_CALL} }};
extern "C"
{{
{stand_ins}
}}
{declared}
"""], (_answers(i, path, order) for i, path in enumerate(paths)), [f"""
{state}
struct Object {{ unsigned char* first; size_t size; }};
static const Object OBJECTS[] = {{ {state_rows} }};
""", "\n".join(data.declared), "\n", runs, f"""
static const Path PATHS[] = {{
{rows}
}};
""", MAIN]))
