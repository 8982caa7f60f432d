<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="it">
<context>
    <name></name>
    <message id="kettle-action">
        <source>Boil</source>
        <translation>Kook</translation>
    </message>
    <message id="kettle-title">
        <source>Kettle</source>
        <translation>Ketel</translation>
    </message>
    <message id="kettle-description">
        <source>Shows the temperature</source>
        <translation>Toont de temperatuur</translation>
    </message>
</context>
</TS>
