"""The kinds of mutants: each finder yields (start, end, new text) for every place in a source."""

import random
import re

from cpp_text import split_list

_NEGATED_OPERATOR = {
    "==": "!=", "!=": "==", "&&": "||", "||": "&&", "<": ">=", ">=": "<", ">": "<=", "<=": ">",
}
_BOUND_OPERATOR = {"<": "<=", "<=": "<", ">": ">=", ">=": ">"}
# The format sets operators between blanks, which brackets of templates are not.
_OPERATOR = re.compile(r"(?<=\s)(==|!=|&&|\|\||<=|>=|<|>)(?=\s)")
_COMPARISON = re.compile(r"(?<=\s)(==|!=|<=|>=|<|>)(?=\s)")


def _exchanged(source, table):
    for match in _OPERATOR.finditer(source.blanked):
        if match[1] in table and source.in_body(match.start()):
            yield match.start(1), match.end(1), table[match[1]]


def _negated(source, start, end):
    """The condition at that place negated; nothing for what cannot be, or what an exchanged operator
    already is."""
    blanked = source.blanked[start:end]
    if not blanked.strip() or re.search(r"(?<![=!<>])=(?!=)", blanked):
        return  # no condition, or a declaration
    joined = "&&" in blanked or "||" in blanked
    if len(_COMPARISON.findall(blanked)) == 1 and not joined and not blanked.startswith("!"):
        return
    text = source.text[start:end]
    if text.startswith("!") and not joined and not _COMPARISON.search(blanked):
        yield start, end, text[1:]
    else:
        yield start, end, f"!({text})"


def _statement_conditions(source):
    for match in re.finditer(r"\b(if|while|for) \(", source.blanked):
        start = match.end()
        end = source.closing(start - 1)
        if end is None:
            continue
        if match[1] != "for":
            yield start, end
            continue
        parts = [at.start() for at in re.finditer(";", source.blanked[start:end])]
        if len(parts) == 2:
            yield start + parts[0] + 2, start + parts[1]


_BEFORE = re.compile(r"((?<![=!<>])= |\breturn )$")


def _selections(source):
    """Where what stands before a `?` begins and ends."""
    for match in re.finditer(r" \? ", source.blanked):
        place, depth = match.start(), 0
        while place > 0:
            char = source.blanked[place - 1]
            if char in ")]}":
                depth += 1
            elif char in "([{":
                if depth == 0:
                    break
                depth -= 1
            elif depth == 0 and (char in ",;:?" or _BEFORE.search(source.blanked[max(place - 8, 0) : place])):
                break
            place -= 1
        text = source.blanked[place : match.start()]
        yield place + len(text) - len(text.lstrip()), match.start()


def conditions(source):
    yield from _exchanged(source, _NEGATED_OPERATOR)
    for start, end in [*_statement_conditions(source), *_selections(source)]:
        if source.in_body(start):
            yield from _negated(source, start, end)


def bounds(source):
    yield from _exchanged(source, _BOUND_OPERATOR)


_CALL = re.compile(r"(?<=[;{})])\s*(?:else )?(?P<name>(?:\w+(?:::|\.|->))*[A-Za-z_]\w*)\(")
_NO_CALL = {"if", "for", "while", "switch", "return", "sizeof", "catch", "static_assert"}


def _call_statements(source):
    """(name, start, end) of the statements that are one call, without the semicolon."""
    for match in _CALL.finditer(source.blanked):
        if match["name"] in _NO_CALL or not source.in_body(match.start("name")):
            continue
        end = source.closing(match.end() - 1)
        if end is not None and source.blanked[end + 1] == ";":
            yield match["name"], match.start("name"), end + 1


def calls(source):
    for name, start, end in _call_statements(source):
        # The one is of the locks, the other checks the code and is none.
        if name not in ("pthread_mutex_lock", "ExpectHeld"):
            yield start, end, "(void)0"


def constants(source):
    for match in re.finditer(r"(?<![\w.'])(\d[\d']*|true|false)(?![\w.'])", source.blanked):
        if not source.in_code(match.start()):
            continue
        if match[1] in ("true", "false"):
            new = "false" if match[1] == "true" else "true"
        else:
            new = str(int(match[1].replace("'", "")) + 1)
        yield match.start(), match.end(), new


_RESULTS = ["RESULT_OK", "RESULT_BAD_ARGUMENT", "RESULT_NO_MEMORY", "RESULT_NOT_FOUND",
            "RESULT_ARRAY_FULL", "RESULT_FIFO_FULL", "RESULT_NOTHING"]


def codes(source):
    for match in re.finditer(r"\b(RESULT_[A-Z_]+|CMPI_RC_\w+)\b", source.blanked):
        if not source.in_body(match.start()):
            continue
        if match[1] in _RESULTS:
            new = _RESULTS[(_RESULTS.index(match[1]) + 1) % len(_RESULTS)]
        else:
            new = "CMPI_RC_ERR_FAILED" if match[1] != "CMPI_RC_ERR_FAILED" else "CMPI_RC_OK"
        yield match.start(), match.end(), new


def priorities(source):
    names = ("LOG_ERR", "LOG_INFO", "LOG_DEBUG")
    for match in re.finditer(r"\bLOG_(ERR|WARNING|NOTICE|INFO|DEBUG)\b", source.blanked):
        if source.in_body(match.start()):
            for new in names:
                if new != match[0]:
                    yield match.start(), match.end(), new


def _other(char):
    if char.isdigit():
        return str((int(char) + 1) % 10)
    if char.isalpha():
        return chr(ord(char) - 1) if char in "zZ" else chr(ord(char) + 1)
    return "_" if char != "_" else "-"


def texts(source):
    """One character of each literal, neither of an escape nor of a conversion. Which one hangs on
    the literal alone, so that it stays when lines move."""
    for match in re.finditer(r'"(_+)"', source.blanked):
        start, end = match.span(1)
        if not source.in_code(start) or source.blanked[: start - 1].endswith("extern "):
            continue
        literal = source.text[start:end]
        fixed = re.compile(r"\\(?:x[0-9a-fA-F]+|.)|%[-+ #0-9.*]*(?:hh|ll|[hljztL])?[a-zA-Z%]")
        free = set(range(len(literal)))
        for conversion in fixed.finditer(literal):
            free -= set(range(*conversion.span()))
        if free:
            place = random.Random(literal).choice(sorted(free))
            yield start + place, start + place + 1, _other(literal[place])


_NO_LIFE = (
    "alignas(LifeGuard) char asItWas[sizeof(LifeGuard)]; "
    "{ const LifeGuard now; __builtin_memcpy(asItWas, static_cast<const void*>(&now), sizeof now); } "
    "const LifeGuard& {name} = reinterpret_cast<const LifeGuard&>(asItWas)"
)


def locks(source):
    """Guards that guard nothing: those of a mutex get one of their own, those of the life let go at
    once; other guards go altogether, as does the call that takes a mutex."""
    for match in re.finditer(r"\b(?:MutexGuard|ClassLock) (\w+)\(", source.blanked):
        end = source.closing(match.end() - 1)
        if end is None or not source.in_body(match.start()) or source.blanked[end + 1] != ";":
            continue
        given = split_list(source.text[match.end() : end])
        given[0 if len(given) == 1 else 1] = "unheld"
        yield match.start(), end + 1, (
            "pthread_mutex_t unheld = PTHREAD_MUTEX_INITIALIZER; "
            f"{source.text[match.start():match.end()]}{', '.join(given)})"
        )
    for match in re.finditer(r"\bconst (\w+) (\w+);", source.blanked):
        if source.in_body(match.start()):
            left = _NO_LIFE.replace("{name}", match[2]) if match[1] == "LifeGuard" else ""
            yield match.start(), match.end() - 1, left
    for name, start, end in _call_statements(source):
        if name == "pthread_mutex_lock":
            yield start, end, "(void)0"


def atomics(source):
    for match in re.finditer(r"\b(LoadShared|StoreShared)\(", source.blanked):
        end = source.closing(match.end() - 1)
        if end is None or not source.in_body(match.start()):
            continue
        given = split_list(source.text[match.end() : end])
        plain = f"({given[0]})" if match[1] == "LoadShared" else f"{given[0]} = {given[-1]}"
        yield match.start(), end + 1, plain
    for match in re.finditer(r"\b__atomic_(load|store)_n\(", source.blanked):
        end = source.closing(match.end() - 1)
        given = split_list(source.text[match.end() : end])
        word = given[0].removeprefix("&")
        yield match.start(), end + 1, word if match[1] == "load" else f"{word} = {given[1]}"
    for match in re.finditer(r"\bstd::atomic<([^<>]+)>", source.blanked):
        yield match.start(), match.end(), source.text[match.start(1) : match.end(1)]


KINDS = {
    "condition": conditions,
    "bound": bounds,
    "call": calls,
    "constant": constants,
    "code": codes,
    "priority": priorities,
    "text": texts,
    "lock": locks,
    "atomic": atomics,
}


def mutants_of(source, kinds):
    """All mutants of a source, of those kinds, each change once, in the order of their places."""
    found = {}
    for kind in kinds:
        for start, end, new in KINDS[kind](source):
            found.setdefault((start, end, new), source.mutant(kind, start, end, new))
    return [found[place] for place in sorted(found)]
