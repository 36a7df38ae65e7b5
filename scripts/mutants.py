"""The changed forms of a source file that scripts/mutate.py tries, and the marks that explain some.

What cannot be told apart is not made in the first place where a simple rule says so; the rules stand
where they are applied. What is left is marked in the source, in front of a statement or behind it:

    // mutate(false, 9 to 10): the longer way gives the same result.

The brackets hold the names of the changes as the check reports them, or "any". With "exchanged" the mark
is about statements and about conditions and calls, with "exchanged statements" about these alone.
"""

import pathlib
import re

from cxx_pieces import DECLARATION, JUMP, KEYWORD, LOOKS
from cxx_pieces import Effect, blocks, closing, end_of_head, guards, lasting_calls, masked, pieces, statements

MARK = re.compile(r"// mutate\(([^)]*)\):")
# What is not changed.
LEFT_OUT = re.compile(
    "|".join((
        # What never runs, and the branches that are never taken, as in scripts/coverage.sh.
        r"// GCOVR_EXCL_START.*?// GCOVR_EXCL_STOP",
        r"^[^\n]*// GCOVR_EXCL_BR_LINE",
        r"(?<=,  // GCOVR_EXCL_BR_LINE)[^;]*",
        r"^ +__extension__ std::printf\([^;]*;",
        # Room for a text shows only when memory runs out, and what is usual decides only which of two
        # equal ways is taken.
        r"^ +[\w.]+\.reserve\([^;]*;",
        r"^constexpr \w+ kUsual[^;]*;",
        # The compiler checks what is static.
        r"^ +static_assert\([^;]*;",
    )),
    re.S | re.M,
)  # fmt: skip

TOKEN = re.compile(
    r"""(?P<text>"[ ]*")|(?P<char>'[ ]+')|(?P<number>(?<=[ (])-\d+\b|(?<![\w.])(?:0x[0-9A-Fa-f]+|\d+))"""
    r"|(?P<word>[A-Za-z_]\w*)|(?P<operator>&&|\|\||[<>=!]=|\+\+|--|\+=|-=|<<|>>|->|::| [<>] |[+!-])"
)
OTHER = {
    " < ": [" <= ", " > "], " > ": [" >= ", " < "], "<=": ["<"], ">=": [">"], "==": ["!="], "!=": ["=="],
    "&&": ["||"], "||": ["&&"], "++": ["--"], "--": ["++"], "+=": ["-="], "!": [""],
    "true": ["false"], "false": ["true"], "isObject": ["isArray"], "empty": ["isNull"],
}  # fmt: skip
CONDITION = re.compile(r"\b(?:if|while|VORN_FAIL_IF|VORN_WARN_IF|VORN_FAIL_IF_TEXT) ?\(")
# Calls that change nothing when they are made twice.
TWICE_IS_ONCE = re.compile(
    r"(?:clear|Clear|CheckEmpty|Forget\w*|fill|reset|resize|assign|exceptions|removeMember|getString|snprintf"
    r"|throwLogicError|RefuseAlways|SetAffinity|SetGenerated"
    r"|Set|Fill|FillDefaults|pfnRead|Read|SetRight|SetUnknown|SetNull|SetText|GiveInteger|GiveText|WritePlain|Judge|strictMode"
    r"|sqlite3_reset|sqlite3_clear_bindings|sqlite3_table_column_metadata)$"
)
# Log lines may come of these, and a name that nobody knew is known afterwards.
LOOK_UP = re.compile(r"(?:\w+(?:\.|->|::))*(?:recType|LookUp|LookUpTable)\(")
# Of the result of these the sign is asked.
OPERATION = re.compile(r"\b0 (?:>|<=) (?:\(\w+ = )?((?:\w+(?:\.|->|::))*\w+\()")


class Change:
    def __init__(self, source, begin, end, new, name):
        self.path, self.begin, self.name = source.path, begin, name
        self.line = source.text.count("\n", 0, begin) + 1
        self.text = source.text[:begin] + new + source.text[end:]
        first = source.text.rfind("\n", 0, begin) + 1
        last = source.text.find("\n", end)
        self.before = " ".join(source.text[first:last].split())
        self.after = " ".join((source.text[first:begin] + new + source.text[end:last]).split())
        self.mark = next((mark for mark in source.marks if mark.explains(self)), None)

    def __str__(self):
        return f"{self.path}:{self.line}: {self.name}\n- {self.before}\n+ {self.after}"


class Mark:
    """One comment that explains changes, and the stretch of code that it is about."""

    def __init__(self, path, text, code, match):
        self.path, self.line = path, text.count("\n", 0, match.start()) + 1
        self.names = {name.strip() for name in match.group(1).split(",")}
        self.unused = set(self.names)
        start = text.rfind("\n", 0, match.start()) + 1
        if code[start : match.start()].strip():
            self.begin, self.end = start, match.start()
            return
        self.begin = re.compile(r"\s*").match(code, match.end()).end()
        self.end = end_of_head(code, self.begin)

    def explains(self, change):
        names = {change.name, change.name.replace(" statements", ""), "any"}
        fitting = names & self.names if self.begin <= change.begin <= self.end else set()
        self.unused -= fitting
        return bool(fitting)


class Source:
    """A file, its marks and all its changes."""

    def __init__(self, path, text=None):
        self.path = pathlib.Path(path)
        self.text = self.path.read_text() if text is None else text
        self.code = masked(self.text)
        self.blocks = blocks(self.code)
        self.marks = [Mark(self.path, self.text, self.code, match) for match in MARK.finditer(self.text)]
        left_out = [match.span() for match in LEFT_OUT.finditer(self.text)]
        made = {}
        for begin, end, new, name in self.edits():
            if not any(first < end and begin < last for first, last in left_out):
                change = Change(self, begin, end, new, name)
                made.setdefault(change.text, change)
        self.changes = [change for text, change in made.items() if text != self.text]

    def edits(self):
        """All changes, as (begin, end, new text, name)."""
        for match in TOKEN.finditer(self.code):
            yield from self.changed_token(match)
        for match in CONDITION.finditer(self.code):
            end = pieces(self.code, match.end(), closing(self.code, match.end() - 1) - 1, ",")[0][1]
            yield match.end(), end, "true", "true"
            yield match.end(), end, "false", "false"
        yield from self.changed_conditions()
        yield from self.changed_chains()
        for begin, end, _ in self.blocks:
            for run in statements(self.code, begin, end):
                yield from self.changed_statements(run)

    # ---- words, signs, numbers, texts ----

    def changed_token(self, match):
        begin, end = match.span()
        old = self.text[begin:end]
        if match.lastgroup == "text":
            for new, name in changed_text(old):
                yield begin, end, new, name
            return
        if match.lastgroup == "number":
            others = self.changed_number(begin, end, old)
        elif match.lastgroup == "char":
            others = ["'x'"] if len(old) == 3 else []
        else:
            others = OTHER.get(old, [])
        for new in others:
            yield begin, end, new, f"{old.strip()} to {new.strip() or 'nothing'}"

    def changed_number(self, begin, end, old):
        value = int(old, 0)
        is_result = re.search(r"(?:\breturn|[?:]) ?$", self.code[:begin])
        if is_result and not self.is_in_public_function(begin):
            # Of what the library's own functions return only the sign is asked.
            return ["0"] if value else ["-1"]
        if value < 0:
            return ["0"] + ([str(value - 1)] if is_result else [])
        # The next number beside a "<" is the "<=" that is tried anyway.
        compared = re.search(r"[<>]=? $", self.code[:begin]) or re.match(r" [<>]", self.code[end:])
        return ([] if compared else [str(value + 1)]) + (["0"] if value else [])

    def is_in_public_function(self, at):
        """Whether the innermost function is a member of the public class or namespace, and no lambda."""
        heads = [head for begin, end, head in self.blocks if begin <= at < end and not KEYWORD.match(head)]
        return bool(heads) and re.search(r"\b(?:VornJsonDbApi|VORN_JSON_DB)::\w+\(", heads[-1]) is not None

    # ---- conditions and chains of calls ----

    def changed_conditions(self):
        """Neighbours in "a && b" and "a || b"."""
        for match in re.finditer(r"\(|\breturn |(?<![=!<>+|-])= ", self.code):
            begin = match.end()
            end = closing(self.code, match.start()) - 1 if match.group() == "(" else self.code.find(";", begin)
            for argument in pieces(self.code, begin, end, ","):
                alternatives = pieces(self.code, *pieces(self.code, *argument, " ? ")[0], "||")
                for parts in [alternatives] + [pieces(self.code, *each, "&&") for each in alternatives]:
                    for left, right in zip(parts, parts[1:]):
                        if guards(self.code[slice(*left)], self.code[slice(*right)]):
                            yield self.exchange(left, right)

    def changed_chains(self):
        """Neighbours and single calls in "x.append(a).append(b)"."""
        for match in re.finditer(r"\.(\w+)\(", self.code):
            if LOOKS.match(match.group(1)):
                continue
            end = closing(self.code, match.end() - 1)
            following = re.compile(rf"\s*(\.{match.group(1)}\()").match(self.code, end)
            if following:
                right = (following.start(1), closing(self.code, following.end() - 1))
                yield self.exchange((match.start(), end), right)
            if following or self.code[match.start() - 1] == ")":
                yield match.start(), end, "", "dropped"

    def exchange(self, left, right, name="exchanged"):
        between = self.text[left[1] : right[0]]
        return left[0], right[1], self.text[slice(*right)] + between + self.text[slice(*left)], name

    # ---- statements ----

    def changed_statements(self, run):
        effects = [Effect(self.code[slice(*each)]) for each in run]
        local = self.local_names(run[0][0]) if run else set()
        for place, effect in zip(run, effects):
            yield from self.changed_statement(*place, effect)
        for index in range(len(run) - 1):
            first, second = effects[index], effects[index + 1]
            # A jump cannot come first, and a name cannot be used before it is declared.
            if JUMP.match(second.text) or first.is_needed_by(second):
                continue
            if first.order_matters(second, local):
                yield self.exchange(run[index], run[index + 1], "exchanged statements")

    def local_names(self, at):
        """The names of the innermost function: nobody sees them after it has returned."""
        names = set()
        for begin, end, head in reversed(self.blocks):
            if begin <= at < end:
                for run in statements(self.code, begin, end):
                    names.update(Effect(self.code[slice(*each)]).declared for each in run)
                if not KEYWORD.match(head):
                    break
        return names

    def changed_statement(self, begin, end, effect):
        code, text = effect.text, self.text[begin:end]
        is_loop = re.match(r"(?:for|while|do)\b", code)
        is_plain = not (KEYWORD.match(code) or effect.declared or code.startswith("VORN_FAIL_IF"))
        if is_loop or is_plain:
            yield begin, end, ";", "dropped"
        if is_plain and not re.search(r"(?<![<>=!+-])= ", code):
            if not any(TWICE_IS_ONCE.match(name) for _, _, name in lasting_calls(code)):
                yield begin, end, text + " " + text, "doubled"
        elif not is_loop:
            head = code.split("{\n")[0]
            for match in [*OPERATION.finditer(head), *LOOK_UP.finditer(head)]:
                call = match.start(match.lastindex or 0)
                yield begin, begin, text[call : closing(code, match.end() - 1)] + "; ", "doubled"
        if is_loop or code.startswith("if"):
            yield from self.moved_out(begin, end)

    def moved_out(self, begin, end):
        """The first statement of a block in front of it, the last one behind it."""
        for first, last, _ in self.blocks:
            run = [place for each in statements(self.code, first, last) for place in each] if begin < first < end else []
            if not run:
                continue
            inner = self.text[slice(*run[0])]
            if self.code.find("{", begin) + 1 == first and not (JUMP.match(inner) or DECLARATION.match(inner)):
                yield begin, run[0][1], inner + " " + self.text[begin : run[0][0]], "hoisted"
            inner = self.text[slice(*run[-1])]
            if last == end - 1 and not JUMP.match(inner):
                rest = self.text[begin : run[-1][0]] + self.text[run[-1][1] : end]
                yield begin, end, rest + " " + inner, "sunk"


def changed_text(literal):
    """Each character of a text is another, or the first or the last is missing."""
    spans = [(match.start() + 1, match.end() + 1) for match in re.finditer(r"\\.|[^\\]", literal[1:-1])]
    for begin, end in spans:
        yield literal[:begin] + ("x" if literal[begin:end] != "x" else "y") + literal[end:], "text"
    for begin, end in {spans[0], spans[-1]} if spans else ():
        yield literal[:begin] + literal[end:], "cut"


def sources(folder, only=""):
    """All files of the folder whose name holds the text."""
    paths = sorted(path for path in pathlib.Path(folder).rglob("*") if path.suffix in (".cpp", ".h"))
    return [Source(path) for path in paths if only in str(path)]
