<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="en">
<context>
    <name></name>
    <message id="kettle-action">
        <source>Boil</source>
        <translation>Boil</translation>
    </message>
    <message id="kettle-title">
        <source>Kettle</source>
        <translation>Kettle</translation>
    </message>
    <message id="kettle-description">
        <source>Shows the temperature</source>
        <translation>Shows the temperature</translation>
    </message>
</context>
</TS>
