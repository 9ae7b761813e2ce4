"""The scenario format (tests/scenarios/README.md): a device tree before,
kestrel's arguments, the standard error and exit expected, a memory bound,
and the tree after."""

import os
import re

from . import SOURCE
from . import tree as trees

SECTIONS = ("before", "arguments", "stderr", "exit", "after", "memory")
UNITS = {"": 1, "Ki": 1 << 10, "Mi": 1 << 20}
QUOTED = re.compile(r'"(?:[^"\\]|\\.)*"')
REPEAT = re.compile(r"\s*\*\s*([0-9]+)(Ki|Mi)?")
PLUS = re.compile(r"\s*\+\s*")
RANGE = re.compile(r"\{([0-9]+)\.\.([0-9]+)\}")
SCENARIOS = os.path.join(SOURCE, "tests", "scenarios")


class ScenarioError(Exception):
    pass


def unquote(text, where):
    """Decodes one double-quoted string with C-style escapes."""
    body = text[1:-1]
    try:
        return body.encode("latin-1").decode("unicode_escape").encode("latin-1")
    except (UnicodeError, ValueError) as error:
        raise ScenarioError(f"{where}: bad escape in content: {error}")


def parse_bytes(text, where):
    """Reads an expression at the start of text: quoted strings joined by
    '+', each optionally repeated with '* COUNT' (COUNT may end in Ki or Mi).
    Returns the bytes and the text after the expression."""
    pieces = []
    while True:
        quoted = QUOTED.match(text)
        if not quoted:
            raise ScenarioError(f"{where}: expected a string in double quotes")
        piece, text = unquote(quoted.group(), where), text[quoted.end() :]
        repeat = REPEAT.match(text)
        if repeat:
            piece *= int(repeat.group(1)) * UNITS[repeat.group(2) or ""]
            text = text[repeat.end() :]
        pieces.append(piece)
        plus = PLUS.match(text)
        if not plus:
            return b"".join(pieces), text.strip()
        text = text[plus.end() :]


def parse_whole(text, where):
    data, rest = parse_bytes(text, where)
    if rest:
        raise ScenarioError(f"{where}: unexpected '{rest}' after the string")
    return data


def parse_path(text, where):
    """A path: a bare word, or a string expression. Returns (path, rest)."""
    if text.startswith('"'):
        data, rest = parse_bytes(text, where)
        return os.fsdecode(data), rest
    path, _, rest = text.partition(" ")
    return path, rest.strip()


def expand_ranges(path):
    """Every path that the {FIRST..LAST} ranges of a bare path stand for."""
    found = RANGE.search(path)
    if not found:
        return [path]
    first, last = int(found.group(1)), int(found.group(2))
    head, tail = path[: found.start()], path[found.end() :]
    return [
        head + str(number) + expanded
        for number in range(first, last + 1)
        for expanded in expand_ranges(tail)
    ]


def parse_entry(line, where):
    """One tree line: a list of (path, entry)."""
    kind, _, rest = line.partition(" ")
    bare = not rest.strip().startswith('"')
    path, rest = parse_path(rest.strip(), where)
    if kind == "link":
        if not rest.startswith("->") or not rest[2:].strip():
            raise ScenarioError(f"{where}: expected 'link PATH -> TARGET'")
        target = rest[2:].strip()
        if target.startswith('"'):
            target = os.fsdecode(parse_whole(target, where))
        entry = ("link", target)
    elif kind in trees.DEFAULT_MODES:
        mode = trees.DEFAULT_MODES[kind]
        if rest.startswith("mode "):
            _, mode_text, rest = (rest + " ").split(" ", 2)
            mode = int(mode_text, 8)
            rest = rest.strip()
        if kind != "file" and rest:
            raise ScenarioError(f"{where}: a {kind} has no content")
        entry = (kind, mode)
        if kind == "file":
            entry = (kind, mode, parse_whole(rest, where) if rest else b"")
    else:
        raise ScenarioError(f"{where}: unknown entry kind '{kind}'")
    paths = expand_ranges(path) if bare else [path]
    return [(one, entry) for one in paths]


def parse(file_name):
    """The sections of a scenario file: name -> [(text, where)]."""
    sections = {}
    current = None
    with open(file_name, encoding="utf-8") as scenario:
        for number, raw in enumerate(scenario, 1):
            line = raw.rstrip("\n")
            where = f"{file_name}:{number}"
            if not line.strip() or line.startswith("#"):
                continue
            if not line[0].isspace():
                name, colon, value = line.partition(":")
                if not colon or name not in SECTIONS:
                    raise ScenarioError(f"{where}: unknown section '{line}'")
                current = sections.setdefault(name, [])
                if value.strip():
                    current.append((value.strip(), where))
                continue
            if current is None:
                raise ScenarioError(f"{where}: line outside a section")
            # Only the two-space indentation goes: a standard-error line
            # may begin with blanks of its own.
            text = line[2:] if line.startswith("  ") else line.lstrip()
            current.append((text.rstrip(), where))
    for required in ("before", "stderr", "exit", "after"):
        if required not in sections:
            raise ScenarioError(f"{file_name}: missing section '{required}:'")
    return sections


def tree_from(lines):
    """The tree that the lines of a before: or after: section describe."""
    tree = {}
    for line, where in lines:
        for path, entry in parse_entry(line, where):
            if path.startswith("/") or path in tree:
                raise ScenarioError(f"{where}: bad or repeated path '{path}'")
            tree[path] = entry
            parent = os.path.dirname(path)
            while parent and parent not in tree:
                tree[parent] = ("dir", 0o755)
                parent = os.path.dirname(parent)
    for path, entry in tree.items():
        parent = os.path.dirname(path)
        if parent and tree[parent][0] != "dir":
            raise ScenarioError(f"'{path}' lies below '{parent}', not a dir")
    return tree


def before_tree(stem):
    """The "before:" tree of the scenario named stem in tests/scenarios."""
    return tree_from(parse(os.path.join(SCENARIOS, stem + ".scenario"))["before"])


def expected_stderr_line(line, where):
    if line.startswith('"'):
        return parse_whole(line, where).decode("latin-1")
    return line


def memory_limit(lines):
    """The 'memory: below N MiB' bound in KiB, or None."""
    if not lines:
        return None
    text, where = lines[0]
    found = re.fullmatch(r"below ([0-9]+) (Ki|Mi)B", text)
    if len(lines) != 1 or not found:
        raise ScenarioError(f"{where}: expected 'memory: below N MiB'")
    return int(found.group(1)) * UNITS[found.group(2)] // 1024
