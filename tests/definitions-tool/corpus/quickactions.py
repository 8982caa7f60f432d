# SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
# SPDX-License-Identifier: BSD-3-Clause
"""Definition files of quick actions, each with what marlo-definitions finds in it."""

from write import Corpus

corpus = Corpus("quickaction", ".conf")
case = corpus.case

GOOD = {
    "title": "maps-title",
    "translation-catalog": "maps",
    "icon": "icon-m-lamp",
    "priority": "10",
    "remote-service": "org.example.lamp",
    "remote-path": "/lamp",
    "remote-interface": "org.example.Lamp",
    "remote-method": "toggle",
}


def action(**changes):
    """A good definition, in which some keys have another value, or None."""
    values = GOOD | {key.replace("_", "-"): value for key, value in changes.items()}
    return "".join(f"{key}={value}\n" for key, value in values.items() if value is not None)


def arguments(*values, size=None):
    """The arguments of the call; the lines begin behind the eight of a good definition."""
    lines = [f"{i}\\argument={value}\n" for i, value in enumerate(values, 1)]
    return f"[remote-arguments]\nsize={size if size is not None else len(values)}\n{''.join(lines)}"


NO_PRIORITY = '1: warning: without "priority" the action comes last [priority]'
NO_TITLE = '1: warning: without "title" the action shows no text [title]'
NO_CATALOG = (
    '1: warning: without "translation-catalog" the title is only looked up in catalogs that happen '
    "to be loaded [catalog]"
)
NO_CALL = [
    '1: error: the call cannot be sent without "remote-service" [call]',
    '1: error: the call cannot be sent without "remote-path" [call]',
    '1: error: the call cannot be sent without "remote-method" [call]',
]
NO_KEY = "error: this line is not a key and is ignored"
LATIN1 = (
    "error: bytes outside ASCII are read as Latin-1; write \\x and the character's number [encoding]"
)
MARKED = "1: error: the byte-order mark becomes a part of the key [encoding]"
NO_INTEGER = '4: error: "priority" is not an integer: the action comes last [type]'
TOO_MANY = "10: error: the call cannot be sent: The call has too many arguments [call]"
RESERVED_PATH = "6: error: the call cannot be sent: The path is reserved [call]"
PACKED = "9: error: a packed value: nothing of the file is read [unreadable]"


def comma(line, key):
    return (
        f'{line}: error: an unquoted comma makes "{key}" a list, which is not a text; put it in double '
        "quotes [comma]"
    )


def no_text(line, key):
    return f'{line}: error: "{key}" is not read as a text; write a leading @ twice [type]'


def no_name(line, value, what):
    return f'{line}: error: the call cannot be sent: "{value}" is not a valid {what} [call]'


# Values.
case("good", action() + "requires-package=lamp\n")
case("good-quoted", action(icon='"/usr/share/icons/a,b.svg"') + 'requires-package="a;b"\n')
case("good-continued", action() + "requires-package=lamp\\\n-tools\n")
case("good-comment-behind", action(priority="10 ; in the middle"))
case(
    "warn-zero",
    action(title="La\0mp", translation_catalog=None, icon="/usr/share/x.png", priority="1"),
    NO_CATALOG,
)
case("bad-title-comma", action(title="Lamp, bright"), comma(1, "title"))
case("bad-catalog-comma", action(translation_catalog="maps, atlas"), comma(2, "translation-catalog"))
case("bad-icon-comma", action(icon="/usr/share/a,b.svg"), comma(3, "icon"))
case(
    "bad-service-comma",
    action(remote_service="org.example.lamp, org.example.light"),
    comma(5, "remote-service"),
)
case("bad-package-comma", action() + "requires-package=lamp,\n", comma(9, "requires-package"))
case("bad-title-type", action(title="@Size(1 2)"), no_text(1, "title"))
case("bad-title-invalid", action(title="@Invalid()"), no_text(1, "title"))
case("bad-icon-type", action(icon="@Rect(1 2 3 4)"), no_text(3, "icon"))
case("bad-packed", action() + "requires-package=@Variant(\\0\\0\\0\\x7f)\n", PACKED)
case("bad-packed-in-list", action() + 'x=a, "@DateTime(1)"\n', PACKED)
case(
    "bad-semicolon",
    action() + arguments("a;b"),
    "11: error: an unquoted semicolon ends the value; put it in double quotes [semicolon]",
)

# Encoding.
case("good-comment-utf8", "; äöü\n" + action())
case("good-utf8-mark-section", "\ufeff[General]\n" + action())
case("good-utf8-mark-comment", "\ufeff; A lamp.\n" + action() + arguments("café"))
case("good-crlf", action().replace("\n", "\r\n"))
case(
    "bad-utf8",
    action(title="Lampe für alle", translation_catalog=None),
    f"1: {LATIN1}",
    NO_CATALOG,
)
case("bad-utf8-argument", action() + arguments("ä"), f"11: {LATIN1}")
case("bad-latin1", action() + "requires-package=l\udce4mp\n", f"9: {LATIN1}")
case("bad-utf8-mark", "\ufeff" + action() + arguments("café"), MARKED, NO_TITLE)
case("bad-utf8-mark-space", "\ufeff  " + action(), MARKED, NO_TITLE)
case(
    "bad-binary",
    bytes(range(1, 256)) + b"\n" + bytes(range(255, 0, -1)),
    f"1: {NO_KEY} [no-key]",
    NO_TITLE,
    NO_PRIORITY,
    *NO_CALL,
    f"2: {NO_KEY} [no-key]",
    f"2: {NO_KEY} [no-key]",
    f"2: {LATIN1}",
    f"3: {NO_KEY} [no-key]",
    f"4: {NO_KEY} [no-key]",
)

# Lines, keys and sections.
case("good-general", "; A comment.\n[General]\n" + action())
case("good-no-newline", action().rstrip())
case(
    "good-spaces",
    "\n\n  title = maps-title  \n\ttranslation-catalog=maps\n priority =10\n"
    + action(title=None, translation_catalog=None, priority=None),
)
case("bad-empty", "", NO_TITLE, NO_PRIORITY, *NO_CALL)
case("bad-no-key", action() + "requires-package\n", f"9: {NO_KEY} [no-key]")
case(
    "bad-hash-comment",
    "# A lamp\n" + action(),
    f'1: {NO_KEY}; comments begin with ";" [no-key]',
)
case(
    "warn-hash-key",
    "# title=old\n" + action(),
    '1: warning: unknown key "# title"; is "title" meant? [unknown-key]',
)
case(
    "bad-repeated-key",
    action() + "title=maps-english\n",
    '1: error: the key "title" is repeated in line 9, and only that one counts [repeated-key]',
)
case(
    "bad-repeated-in-general",
    action() + "[x]\ny=1\n[general]\nicon=other\n",
    '3: error: the key "icon" is repeated in line 12, and only that one counts [repeated-key]',
    '9: warning: unknown section "x" [unknown-key]',
)
case(
    "bad-desktop-entry",
    "[Quick Action]\n" + action(),
    '1: warning: unknown section "Quick Action" [unknown-key]',
    NO_TITLE,
    NO_PRIORITY,
    *NO_CALL,
)
case(
    "bad-unclosed-section",
    action() + "[remote-arguments\nsize=0\n",
    "9: error: the header of a section is not closed: nothing of the file is read [unreadable]",
)
case(
    "warn-unknown-key",
    action() + "require-package=lamp\nName=Lamp\n",
    '9: warning: unknown key "require-package"; is "requires-package" meant? [unknown-key]',
    '10: warning: unknown key "Name" [unknown-key]',
)
case(
    "warn-unknown-case",
    action() + "Requires-Package=lamp\n",
    '9: warning: unknown key "Requires-Package"; is "requires-package" meant? [unknown-key]',
)
case(
    "warn-unknown-argument-key",
    action() + arguments("a") + "1\\value=b\nSize=2\n01\\argument=c\n",
    r'12: warning: unknown key "1\value" [unknown-key]',
    '13: warning: unknown key "Size"; is "size" meant? [unknown-key]',
    r'14: warning: unknown key "01\argument"; is "1\argument" meant? [unknown-key]',
)
case(
    "warn-unknown-section",
    action() + arguments("a").replace("arguments", "argument") + "[Desktop Entry]\nIcon=x\n",
    '9: warning: unknown section "remote-argument"; is "remote-arguments" meant? [unknown-key]',
    '12: warning: unknown section "Desktop Entry" [unknown-key]',
)
case(
    "warn-white-space-around-keys",
    action() + "\vcolour=x\nshape\f=x\n",
    r'9: warning: unknown key "\u000bcolour" [unknown-key]',
    r'10: warning: unknown key "shape\u000c" [unknown-key]',
)

# Title, catalog, icon and priority.
case("good-url-icon", action(icon="image://theme/icon-m-lamp"))
case(
    "warn-negative-priority",
    action(priority="-1"),
    '4: warning: "priority" is negative: the action comes last [priority]',
)
case("warn-no-title", action(title=None), NO_TITLE)
case("warn-empty-title", action(title=""), NO_TITLE)
case("warn-no-catalog", action(translation_catalog=None), NO_CATALOG)
case(
    "warn-catalog-suffix",
    action(translation_catalog="maps_eng_en"),
    '2: warning: the catalog "maps_eng_en" is named with the suffix of its engineering English; only '
    'with "maps" are other languages shown [catalog]',
)
case(
    "warn-catalog",
    action(translation_catalog="nowhere"),
    '2: warning: the catalog "nowhere" is not installed in /usr/share/translations [catalog]',
)
case(
    "warn-language-only",
    action(translation_catalog="islands"),
    '2: warning: "islands_eng_en.qm" is not installed in /usr/share/translations: languages without '
    "a catalog of their own show identifiers [catalog]",
)
case(
    "warn-text-id",
    action(title="maps-titel"),
    '1: warning: the catalog "maps" does not hold the text "maps-titel" [text-id]',
)
for name, icon in [("", "icons/lamp.svg"), ("-name", "lamp.png")]:
    case(
        f"warn-relative-icon{name}",
        action(icon=icon),
        f'3: warning: the icon "{icon}" is a relative path [relative-path]',
    )
case("warn-no-priority", action(priority=None), NO_PRIORITY)
for name, priority in {
    "empty": "",
    "fraction": "1.5",
    "large": "99999999999",
    "list": "1,0",
    "word": "high",
}.items():
    case(f"bad-priority-{name}", action(priority=priority), NO_INTEGER)

# The call.
case("good-no-interface", action(remote_interface=None))
case("good-unlimited-path", action(remote_path="/" + "x" * 300))
case("bad-no-call", "".join(action().splitlines(keepends=True)[:4]), *NO_CALL)
case(
    "bad-no-method",
    action(remote_method=""),
    '8: error: the call cannot be sent without "remote-method" [call]',
)
for name, service in {"word": "lamp", "digit": "org.1example.lamp"}.items():
    case(
        f"bad-service-{name}",
        action(remote_service=service),
        no_name(5, service, "name of a service"),
    )
LONG = "org." + "x" * 252
case(
    "bad-service-long",
    action(remote_service=LONG),
    no_name(5, LONG[:80] + "…", "name of a service"),
)
for name, path in {"word": "lamp", "dash": "/la-mp", "slash": "/lamp/"}.items():
    case(f"bad-path-{name}", action(remote_path=path), no_name(6, path, "path of an object"))
for name, interface in {"word": "Lamp", "dash": "org.ex-ample.Lamp"}.items():
    case(
        f"bad-interface-{name}",
        action(remote_interface=interface),
        no_name(7, interface, "name of an interface"),
    )
case(
    "bad-method",
    action(remote_method="org.example.toggle"),
    no_name(8, "org.example.toggle", "name of a method"),
)
case("bad-reserved-path", action(remote_path="/org/freedesktop/DBus/Local"), RESERVED_PATH)
case(
    "bad-reserved-interface",
    action(remote_interface="org.freedesktop.DBus.Local"),
    "7: error: the call cannot be sent: The interface is reserved [call]",
)

# Its arguments.
case("good-arguments", action() + arguments("bright", '"warm, white"'))
case("good-empty-array", action() + arguments())
case("good-escapes", action() + arguments(r"caf\xe9 \"x\" a\\b"))
case("good-multi-line", action() + arguments('"one\ntwo = 2\n; three"'))
case(
    "good-order",
    "[remote-arguments]\n2\\argument=b\n1\\argument=a\nsize=2\n[General]\n" + action(),
)
case(
    "good-list-argument",
    action() + arguments("a, b, c"),
    "11: note: argument 1 is sent as a list of 3 texts [argument-type]",
)
case(
    "good-number-arguments",
    action() + arguments("1", "true", "-1.5e3", "1.2.3"),
    '11: note: argument 1 is sent as the text "1" [argument-type]',
    '12: note: argument 2 is sent as the text "true" [argument-type]',
    '13: note: argument 3 is sent as the text "-1.5e3" [argument-type]',
)
case(
    "bad-argument-type",
    action() + arguments("a", "@Point(1 2)"),
    "12: error: argument 2 is not read as a text; write a leading @ twice [arguments]",
)
case(
    "bad-key-named-as-the-arguments",
    action() + "remote-arguments=@Invalid(), a\n",
    "1: error: the call cannot be sent: An argument is not text [call]",
    '9: warning: unknown key "remote-arguments" [unknown-key]',
)
case(
    "bad-no-size",
    action() + arguments("a", "b").replace("size=2\n", ""),
    '11: error: without "size" the call has no arguments [arguments]',
)
for name, size in {"small": "1", "word": "two"}.items():
    case(
        f"bad-size-{name}",
        action() + arguments("a", "b", size=size),
        '10: error: "size" leaves out argument 2 [arguments]',
    )
case(
    "bad-size-huge",
    action() + arguments("a", size=2000000000),
    '10: error: "size" counts argument 2, which is missing [arguments]',
)
case(
    "bad-size-without-arguments",
    action() + arguments(size=1),
    '10: error: "size" counts argument 1, which is missing [arguments]',
)
case(
    "bad-gap",
    action() + arguments("a", "b", "c").replace("2\\argument=b\n", ""),
    '10: error: "size" counts argument 2, which is missing [arguments]',
)
case(
    "bad-small-size-reserved-path",
    action(remote_path="/org/freedesktop/DBus/Local") + arguments("a", "b", size=1),
    RESERVED_PATH,
    '10: error: "size" leaves out argument 2 [arguments]',
)
case("bad-too-many", action() + arguments(*["x"] * 256), TOO_MANY)
case("bad-many-arguments", action() + arguments(*["a"] * 300), TOO_MANY)
case(
    "bad-long-signature",
    action() + arguments(*["x,y"] * 130),
    TOO_MANY,
    *(
        f"{10 + i}: note: argument {i} is sent as a list of 2 texts [argument-type]"
        for i in range(1, 131)
    ),
)
