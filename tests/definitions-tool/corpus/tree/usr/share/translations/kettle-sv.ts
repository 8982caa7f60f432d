<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="sv">
<context>
    <name></name>
    <message id="kettle-action">
        <source>Boil</source>
        <translation>Koka</translation>
    </message>
    <message id="kettle-title">
        <source>Kettle</source>
        <translation>Kokare</translation>
    </message>
    <message id="kettle-description">
        <source>Shows the temperature</source>
        <translation type="unfinished"></translation>
    </message>
</context>
</TS>
