<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="de">
<context>
    <name></name>
    <message id="notes-new">
        <source></source>
        <translation>Neue Notiz</translation>
    </message>
    <message id="notes-search">
        <source></source>
        <translation>Notizen durchsuchen</translation>
    </message>
</context>
</TS>
