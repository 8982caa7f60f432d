# SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
# SPDX-License-Identifier: BSD-3-Clause
"""Definition files of events widgets, each with what marlo-definitions finds in it."""

from write import Corpus

corpus = Corpus("eventswidgetsfile", ".json")
case = corpus.case

GOOD = {
    "path": '"/usr/share/lamp.qml"',
    "title": '"Lamp"',
    "translation_id": '"maps-title"',
    "description_id": '"maps-english"',
    "icon": '"image://theme/icon-m-lamp"',
    "order": "10",
    "default_enabled": "true",
    "available_path": '"/usr/bin/lamp"',
}


def widget(**changes):
    """A good widget on ten lines, in which some members have another value."""
    members = (GOOD | changes).items()
    return "{\n" + ",\n".join(f'"{key}": {value}' for key, value in members) + "\n}"


def short(name="a"):
    """A good widget on one line."""
    return f'{{ "path": "/usr/share/{name}.qml", "title": "Lamp", "order": 1 }}'


def file(*widgets):
    """A good file, whose first widget begins in line 4."""
    return '{\n"translation_catalog": "maps",\n"widgets": [\n' + ",\n".join(widgets) + "\n]\n}\n"


def no_json(line):
    return f"{line}: error: from here on this is not JSON: nothing of the file is read [json]"


def no_object(line):
    return f"{line}: error: this is not an object: nothing of the file is read [json]"


def no_widget(line):
    return f"{line}: error: this is not an object and is ignored [widget]"


def no_value(line):
    return f"{line}: error: no value follows this comma: nothing of the file is read [json]"


def missing_widgets(line):
    return f'{line}: error: there is no "widgets": no widget is listed [no-widget]'


def no_title(line):
    return (
        f'{line}: warning: without "title" and "translation_id" the widget has no title [title]'
    )


def no_catalog(line):
    return (
        f'{line}: warning: without "translation_catalog" this text is not translated [catalog]'
    )


def relative(line, what, path):
    return f'{line}: warning: the {what} "{path}" is a relative path [relative-path]'


def wrong_type(line, key, what):
    return f'{line}: error: the value of "{key}" is not {what} and is ignored [type]'


INTEGER = "an integer of 32 bits"
BOOLEAN = "true or false"

# Not JSON.
case("bad-empty", "", no_json(1))
case("bad-binary", bytes(range(256)), no_json(1))
case("bad-utf16", '{ "widgets": [] }'.encode("utf-16"), no_json(1))
case("bad-utf8", '{ "widgets": [ %s,\n { "path": "\udcff" } ] }' % short(), no_json(2))
case("bad-comma", file(widget()).replace('Lamp",', 'Lamp"'), no_json(7))
case("bad-trailing-comma", file(widget(available_path='"/usr/bin/lamp",')), no_value(12))
case("bad-trailing-comma-of-entries", file(short(), ""), no_value(4))
case("bad-no-value", '{ "widgets":\n}', no_json(2))
case("bad-comma-in-unclosed-text", '{ "widgets": [],\n"x": "a,\n}', no_json(3))
case("bad-comma-before-bad-byte", '{ "widgets": [],\n"x": ",\n]\udcff" }', no_json(3))
case("bad-comment", '{\n// The lamp.\n"widgets": []\n}', no_json(2))
case("bad-quotes", "{\n'widgets': []\n}", no_json(2))
case("bad-cut-off", '{\n"widgets": [\n{ "path": "a" }\n', no_json(3))
case("bad-unclosed-text", '{\n"widgets": [ {\n"path": "a,\n"order": 1 } ]\n}', no_json(4))
case("bad-line-breaks-around", "\n\n{\n\n", no_json(3))
case("bad-behind", '{ "widgets": [] }\n}\n', no_json(2))
case("bad-deep", "[" * 2000 + "]" * 2000, no_json(1))
case("bad-deep-objects", '{"a":' * 2000, no_json(1))

# Not an object.
case("bad-null", "null", no_object(1))
case("bad-text", '"widgets"', no_object(1))
case("bad-number", "\ufeff\n 7", no_object(2))
case("bad-array", '\n[ { "path": "a" } ]\n', no_object(2))

# The content of a file.
case("good", file(widget()))
case("good-crlf", file(widget()).replace("\n", "\r\n"))
case("good-mark", "\ufeff" + file(short("maßä")))
case("bad-no-widgets", '\n{ "translation_catalog": "maps" }\n', missing_widgets(2))
case("bad-nothing", "{}", missing_widgets(1))
case(
    "warn-empty-array",
    file(""),
    '3: warning: "widgets" is empty: no widget is listed [no-widget]',
)
case("good-schema-key", file(short()).replace("{\n", '{\n"$schema": "x.json",\n', 1))
case(
    "bad-catalog-type",
    '{ "translation_catalog": [ "maps" ],\n"widgets": [ %s ] }' % short(),
    wrong_type(1, "translation_catalog", "a text"),
    no_catalog(2),
)
case(
    "bad-widgets-type",
    '{ "widgets": {\n"path": "a" } }',
    wrong_type(1, "widgets", "an array"),
)
case(
    "bad-repeated-widgets",
    '{ "widgets": "none",\n"widgets": [ %s, 5 ], "translation_catalog": "maps" }' % short(),
    wrong_type(1, "widgets", "an array"),
    '1: error: the key "widgets" is repeated in line 2, and only that one counts [repeated-key]',
    no_widget(2),
)
case(
    "bad-entries",
    file("1", short(), "[]", "null", '"b"', "true"),
    *(no_widget(line) for line in (4, 6, 7, 8, 9)),
)

# The content of a widget.
case("good-empty-texts", file(widget(description_id='""', icon='""', available_path='""')))
case("good-escapes", file(widget(title=r'"L\u00e4mp \"x\" \ud83d\ude00 \/"')))
case("good-utf8", file(widget(title='"Lämpchen ☀"')))
case(
    "good-integers",
    file(
        *(
            '{ "path": "/usr/share/%d.qml", "title": "A", "order": %s }' % numbered
            for numbered in enumerate(["0", "5.0", "5e2", "2147483647"])
        )
    ),
)
case(
    "bad-types",
    file(
        widget(
            title="5",
            translation_id="null",
            description_id='[ "x" ]',
            icon='{ "source": "x" }',
            order='"10"',
            default_enabled='"true"',
            available_path="false",
        )
    ),
    no_title(4),
    wrong_type(6, "title", "a text"),
    wrong_type(7, "translation_id", "a text"),
    wrong_type(8, "description_id", "a text"),
    wrong_type(9, "icon", "a text"),
    wrong_type(10, "order", INTEGER),
    wrong_type(11, "default_enabled", BOOLEAN),
    wrong_type(12, "available_path", "a text"),
)
case("bad-enabled-number", file(widget(default_enabled="1")), wrong_type(11, "default_enabled", BOOLEAN))
for name, order in {"fraction": "5.5", "large": "2147483648", "huge": "1e300"}.items():
    case(f"bad-order-{name}", file(widget(order=order)), wrong_type(10, "order", INTEGER))
case(
    "bad-no-path",
    file(short("a"), '{\n"order": 1 }', short("b")),
    '5: error: there is no "path": the widget is ignored [path]',
)
case(
    "bad-empty-path",
    file(short("a"), '{ "order": 1,\n"path": "" }', short("b")),
    '6: error: "path" is empty: the widget is ignored [path]',
)
case(
    "bad-path-type",
    file(short("a"), '{ "order": 1,\n"path": 7 }', short("b")),
    '6: error: "path" is not a text: the widget is ignored [path]',
)
case(
    "bad-repeated-key",
    file(widget(order='10,\n"title": "Torch"')),
    '6: error: the key "title" is repeated in line 11, and only that one counts [repeated-key]',
)
case(
    "bad-several",
    file('{ "title": 3, "order": "x" }', widget(default_enabled='"yes"'), "7"),
    wrong_type(4, "title", "a text"),
    wrong_type(4, "order", INTEGER),
    '4: error: there is no "path": the widget is ignored [path]',
    wrong_type(12, "default_enabled", BOOLEAN),
    no_widget(15),
)
case(
    "warn-no-order",
    file(short(), '{ "path": "/usr/share/b.qml", "title": "B" }'),
    '5: warning: without "order" the widget comes last [order]',
)
for order in "-1", "-2147483648":
    case(
        f"warn-order{order}",
        file(widget(order=order)),
        '10: warning: with a negative "order" the widget comes last [order]',
    )
case("warn-no-title", file(short(), '{ "path": "/b", "order": 1 }'), no_title(5))
case("warn-empty-title", file(widget(title='""', translation_id='""')), no_title(4))
case("good-identifier-only", file(widget(title='""')))
case("good-title-only", file(widget(translation_id='""', description_id='""')))
case("good-path-url", file(widget(path='"qrc:/lamp.qml"')))
case(
    "warn-duplicate-path",
    file(short("a"), short("b"), short("a")),
    '6: warning: the path "/usr/share/a.qml" is also in warn-duplicate-path.json:4; only one of '
    "the two widgets is listed [duplicate-path]",
)
case("warn-relative-path", file(widget(path='"lamp.qml"')), relative(5, "path", "lamp.qml"))
for name, icon in {"": "icons/lamp", "-name": "lamp.SVG"}.items():
    case(f"warn-relative-icon{name}", file(widget(icon=f'"{icon}"')), relative(9, "icon", icon))
case(
    "warn-relative-available-path",
    file(widget(available_path='"bin/lamp"')),
    relative(12, "available path", "bin/lamp"),
)
case(
    "warn-unknown-key",
    """{
"translation-catalog": "maps",
"widget": [],
"widgets": [ {
  "path": "/a", "title": "A", "order": 1,
  "defaultEnabled": true,
  "tilte": "x",
  "colour": "red"
} ]
}""",
    '2: warning: unknown key "translation-catalog"; is "translation_catalog" meant? [unknown-key]',
    '3: warning: unknown key "widget"; is "widgets" meant? [unknown-key]',
    no_catalog(5),
    '6: warning: unknown key "defaultEnabled"; is "default_enabled" meant? [unknown-key]',
    '7: warning: unknown key "tilte"; is "title" meant? [unknown-key]',
    '8: warning: unknown key "colour" [unknown-key]',
)
case(
    "warn-unknown-key-of-a-file",
    file(short()).replace("{\n", '{\n"widget": [],\n', 1),
    '2: warning: unknown key "widget"; is "widgets" meant? [unknown-key]',
)
case(
    "warn-escaped-unknown-key",
    file('{ "path": "/a", "title": "A", "order": 1,\n "a\\nb\\u001b[31m": 2 }'),
    r'5: warning: unknown key "a\u000ab\u001b[31m" [unknown-key]',
)

# Catalogs.
case(
    "warn-catalog",
    file(short()).replace("maps", "nowhere"),
    '2: warning: the catalog "nowhere" is not installed in /usr/share/translations [catalog]',
)
case(
    "warn-catalog-suffix",
    file(short()).replace("maps", "maps_eng_en"),
    '2: warning: the catalog "maps_eng_en" is named with the suffix of its engineering English; only '
    'with "maps" are other languages shown [catalog]',
)
case(
    "warn-text-id",
    file(widget(translation_id='"maps-titel"', description_id='"maps-nothing"')),
    '7: warning: the catalog "maps" does not hold the text "maps-titel" [text-id]',
    '8: warning: the catalog "maps" does not hold the text "maps-nothing" [text-id]',
)
NO_CATALOG = '{\n"widgets": [\n%s\n]\n}\n'
case("warn-title-without-catalog", NO_CATALOG % widget(), no_catalog(5))
case(
    "warn-identifier-without-catalog",
    NO_CATALOG % '{ "path": "/a", "order": 1,\n"translation_id": "a",\n"description_id": "b" }',
    no_catalog(4),
)
case(
    "warn-description-without-catalog",
    '{ "translation_catalog": "", "widgets": [\n'
    '{ "path": "/a", "order": 1, "title": "",\n"description_id": "b" }]}',
    no_title(2),
    no_catalog(3),
)
case("warn-empty-catalog", file(short()).replace("maps", ""), no_catalog(4))
