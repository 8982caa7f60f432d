<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="fi">
<context>
    <name></name>
    <message id="notes-new">
        <source></source>
        <translation>Uusi muistiinpano</translation>
    </message>
    <message id="notes-search">
        <source></source>
        <translation>Hae muistiinpanoista</translation>
    </message>
</context>
</TS>
