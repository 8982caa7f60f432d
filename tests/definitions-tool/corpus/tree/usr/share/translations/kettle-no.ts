<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="no">
<context>
    <name></name>
    <message id="kettle-action">
        <source>Boil</source>
        <translation>Kok</translation>
    </message>
    <message id="kettle-title">
        <source>Kettle</source>
        <translation>Kjele</translation>
    </message>
    <message id="kettle-description">
        <source>Shows the temperature</source>
        <translation>Viser temperaturen</translation>
    </message>
</context>
</TS>
