"""Statements, conditions and calls in C++ text, for scripts/mutants.py.

No parser: the sources are laid out by clang-format, so brackets and a few patterns are enough. All
positions are those of the original text.
"""

import re

# Everything that is no code: comments, directives, the head of a macro, the inside of texts.
NO_CODE = re.compile(
    r'//[^\n]*|/\*.*?\*/|"(?:\\.|[^"\\\n])*"|\'(?:\\.|[^\'\\\n])+\'|^#define \w+(?:\([^)\n]*\))?'
    r"|^#(?:[^\n]*\\\n)*[^\n]*|\\\n",
    re.S | re.M,
)
KEYWORD = re.compile(r"(?:if|for|while|do|switch|try|else|return|break|continue|throw|case|default|using|struct"
                     r"|class|enum|namespace|template|static_assert|public|private)\b")  # fmt: skip
JUMP = re.compile(r"(?:return|break|continue|throw)\b")
LEAVES = re.compile(r"\b(?:return|break|continue|throw|VORN_FAIL_IF\w*)\b")
# What stands before the brace of a block of statements; any other brace is of a class or a value.
BEFORE_BLOCK = re.compile(r"(?:\)|\belse|\bdo|\btry|\bconst|\bnoexcept|-> [\w:*& ]+|\)\s*:[^{};]*)$")
DECLARATION = re.compile(r"(?:static |constexpr |const )*[\w:]+(?:<[^;=]*>)?(?: const)?[ &*]+(\w+)(?=[ ;({\[])")
# Neighbours that set members of one value; each of another name, so in any order.
SETS_MEMBER = re.compile(r'[\w.]+\[" +"\] = [^();]*;$')
# A member of a value or of what it points to is set, to something without it.
SETS_FIELD = re.compile(r"(\w+(?:\.\w+)*)(?:\.|->)(\w+) = ((?:(?!\b\1\b)[^;])*);$")
# A lambda that takes what it names by reference: where it stands it does nothing yet.
LAMBDA = re.compile(r"const auto \w+ = \[&\]")
CALL = re.compile(r"((?:\w+(?:\.|->|::))*)(\w+)\(")
# Calls that only look, the library's own in the last lines; macros and casts are no calls.
LOOKS = re.compile(
    r"(?:if|for|while|switch|catch|sizeof|static_cast|const_cast|move|VORN_FAIL_IF\w*|VORN_WARN_IF"
    r"|(?:is|as|Is)[A-Z]\w*|size|length|empty|begin|end|data|c_str|find|type|front|back|get|name|str\w*cmp|str\w*chr"
    r"|strlen|strstr|mem(?:cmp|chr|berName)|max|min|equal|nullSingleton"
    r"|Length|Is|NameOf|Find|FindMember|Members|Declared|DeclaredMembers|AreNamed|Type\w*|Compare|LacksDefaults|ToString"
    r"|Joined|Ignore|Ok|Key|Has|At|Kind|Code|Names|Size|BehindValue|BytesOf|BoundText|CollationOf|ColumnOf"
    r"|FindColumn|FindGroupKey|HasCollates|HasDefaults|HasRowidKey|fnIndex|fnSame|HasOwnIndex|HasScan"
    r"|Name|QuotedTable|RangeOf|Root|Table|TextColumn|TextOf"
    r"|Below|Concat|DigitsOf|Do|Enclosed|Quoted|Shown|ShownText"
    r"|Lower|milliseconds|zero|isalnum|isdigit|isfinite|fabs|all_of|any_of|count|compare|string|string_view"
    r"|sqlite3_(?:column_int|db_handle|get_autocommit|stricmp))$"
)


def masked(text):
    """The text with blanks for all that is no code, so that positions stay.

    >>> masked('f("a)", x);  // ;')
    'f("  ", x);      '
    """

    def blanks(match):
        old = match.group()
        new = re.sub(r"[^\n]", " ", old)
        return old[0] + new[1:-1] + old[0] if old[0] in "\"'" else new

    return NO_CODE.sub(blanks, text)


def closing(code, start):
    """The position behind the bracket that closes the one at start."""
    depth = 0
    for match in re.compile(r"[(){}\[\]]").finditer(code, start):
        depth += 1 if match.group() in "([{" else -1
        if depth == 0:
            return match.end()
    return len(code)


def beginning(code, at):
    """The position behind the statement or brace before the one whose block begins at at.

    >>> beginning("a(); for (;;) { b();", 14)
    4
    """
    depth = 0
    for start in range(at - 1, -1, -1):
        if code[start] in ")]":
            depth += 1
        elif code[start] in "([":
            depth -= 1
        elif depth <= 0 and code[start] in ";{}":
            return start + 1
    return 0


def stripped(code, begin, end):
    """The stretch without the blanks around it."""
    inside = code[begin:end]
    return begin + len(inside) - len(inside.lstrip()), begin + len(inside.rstrip())


def pieces(code, begin, end, separator):
    """The stretches between the separators that are in no bracket.

    >>> [("a && f(b && c)")[b:e] for b, e in pieces("a && f(b && c)", 0, 14, "&&")]
    ['a', 'f(b && c)']
    """
    found, start, at = [], begin, begin
    while at < end:
        if code[at] in "([{":
            at = closing(code, at)
        elif code.startswith(separator, at):
            found.append((start, at))
            at = start = at + len(separator)
        else:
            at += 1
    return [stripped(code, *each) for each in found + [(start, end)]]


def end_of_statement(code, start, limit):
    """The position behind the statement that begins at start."""
    ends_in_brace = re.compile(r"(?:if|for|while|switch|try|namespace)\b|\{").match(code, start)
    at = start
    while at < limit:
        if code[at] == ";":
            return at + 1
        brace = code[at] == "{"
        at = closing(code, at) if code[at] in "([{" else at + 1
        if brace and ends_in_brace and not re.compile(r"\s*(?:else|catch)\b").match(code, at, limit):
            return at
    return limit


def end_of_head(code, start):
    """The position of the first semicolon or brace that is in no bracket.

    >>> end_of_head("for (;;) { a(); }", 0)
    9
    """
    at = start
    while at < len(code) and code[at] not in ";{}":
        at = closing(code, at) if code[at] in "([" else at + 1
    return at


def statements(code, begin, end):
    """The statements of a block in runs that no label interrupts.

    >>> code = "a(); if (x) { b(); } else { c(); } case 1: d();"
    >>> [[code[b:e] for b, e in run] for run in statements(code, 0, len(code))]
    [['a();', 'if (x) { b(); } else { c(); }'], ['d();']]
    """
    runs, at = [[]], begin
    while True:
        at, _ = stripped(code, at, end)
        if at >= end:
            return runs
        label = re.compile(r"(?:case\b[^;{}]*?[^:]|default):(?!:)").match(code, at, end)
        if label:
            runs.append([])
            at = label.end()
        else:
            stop = end_of_statement(code, at, end)
            runs[-1].append((at, stop))
            at = stop


def blocks(code):
    """The blocks of statements, as (begin, end, head), the outer ones first."""
    found = []
    for match in re.finditer(r"{", code):
        head = code[beginning(code, match.start()) : match.start()].strip()
        if BEFORE_BLOCK.search(head):
            found.append((match.end(), closing(code, match.start()) - 1, head))
    return found


def lasting_calls(text):
    """The calls in a piece of code that do more than look, as (begin, object, name)."""
    declared = DECLARATION.match(text)
    for match in CALL.finditer(text):
        is_declared = declared and match.start(2) == declared.start(1)
        if not is_declared and not LOOKS.match(match.group(2)):
            yield match.start(), match.group(1), match.group(2)


class Effect:
    """Roughly what a statement reads and writes."""

    def __init__(self, text):
        declaration = DECLARATION.match(text)
        self.text = text
        self.declared = declaration.group(1) if declaration and not KEYWORD.match(text) else None
        if LAMBDA.match(text):
            self.names = self.written = {self.declared}
            self.leaves = self.anything = False
            return
        # No types and calls; a type stands before another word.
        self.names = set(re.findall(r"(?<![.:>\w])[a-z_]\w*\b(?!\s*(?:::|\(|<)|[&*]? \w)", text))
        self.names.update(re.findall(r"\b[A-Z]\w*(?=\.|->|\[)", text), {self.declared} - {None})
        self.leaves = LEAVES.search(text) is not None
        self.anything = self.leaves or "VORN_WARN_IF" in text
        self.written = {self.declared} - {None}
        self.written.update(re.findall(r"(\w+)(?:\.\w+|\[[^\]]*\])* (?:[-+|]?=) ", text))
        if "++" in text or "--" in text:
            self.written |= self.names
        for start, of, name in lasting_calls(text):
            self.add_call(start + len(of), of, name)

    def add_call(self, start, of, name):
        """A call may change its object and what it is given; without an object anything else, too.

        >>> e = Effect('VORN_LOG_PLAIN("n=%d", n);'); e.anything, e.written
        (True, set())
        >>> e = Effect("strText.append(strA).append(strB);"); e.anything, e.written
        (False, {'strText'})
        """
        if self.text.startswith(").", start - 2):
            return  # of a chain, whose first call it was
        if name.startswith("VORN_LOG"):
            self.anything = True
            return
        begin = self.text.find("(", start)
        given = self.names & set(re.findall(r"\w+", self.text[begin : closing(self.text, begin)]))
        object_name = re.match(r"(\w+)(?:\.|->)", of)
        if object_name is None:
            self.anything = True
        elif not name.startswith("pfn"):
            self.written.add(object_name.group(1))
        if not name.startswith(("append", "emplace", "push")):
            self.written |= given

    def is_needed_by(self, other):
        return self.declared is not None and re.search(rf"\b{self.declared}\b", other.text) is not None

    def order_matters(self, other, local):
        """Whether exchanging the two may show; local: the names that nobody sees after leaving."""
        if SETS_MEMBER.match(self.text) and SETS_MEMBER.match(other.text):
            return False
        if sets_other_fields(self.text, other.text):
            return False
        return (
            (self.anything and other.anything)
            or bool(self.written & other.names or other.written & self.names)
            or (self.leaves and bool(other.written - local))
            or (other.leaves and bool(self.written - local))
        )


def sets_other_fields(first, second):
    """Whether two statements set two members of one value, in any order.

    >>> sets_other_fields("Out.n = a.n;", "Out.s = b;"), sets_other_fields("Out.n = a;", "Out.s = Out.n;")
    (True, False)
    """
    one, two = SETS_FIELD.match(first), SETS_FIELD.match(second)
    if one is None or two is None or one[1] != two[1] or one[2] == two[2]:
        return False
    return not any(lasting_calls(one[3])) and not any(lasting_calls(two[3]))


def guards(first, second):
    """Whether the order of two conditions may show: one of them does something, or the first keeps the
    second from looking behind a pointer or iterator. A text has no behind.

    >>> guards("p != nullptr", "p->x"), guards("a > 0", "b > 0"), guards("a", "f(b)")
    (True, False, True)
    >>> guards("a == 1", "(a == 2 && b)"), guards("p != q", "(!IsSet(p) || b)")
    (False, True)
    >>> guards("IsOf(strA)", "strA.find(b)"), guards("IsIn(itA)", "itA.find(b)")
    (False, True)
    """
    if any(lasting_calls(first)) or any(lasting_calls(second)) or re.search(r"[^=!<>]=[^=]", first + second):
        return True
    names = set(re.findall(r"(?<![\w*.>])\w+\b(?!\s*(?:\(|\[|->|\.|::))", first))
    behind = {name: r"\[|->" if name.startswith("str") else r"\[|->|\." for name in names}
    return any(re.search(rf"(?:\*|\w\((?:[^()]*, )?){name}\b|\b{name}(?:{behind[name]})", second) for name in names)
