<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="cs">
<context>
    <name></name>
    <message id="kettle-other">
        <source>Other</source>
        <translation>Jiné</translation>
    </message>
</context>
</TS>
