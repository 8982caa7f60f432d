<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="fi">
<context>
    <name></name>
    <message id="kettle-title">
        <source>Kettle</source>
        <translation>Keitin</translation>
    </message>
</context>
</TS>
