<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="de">
<context>
    <name></name>
    <message id="kettle-action">
        <source>Boil</source>
        <translation>Kochen</translation>
    </message>
    <message id="kettle-title">
        <source>Kettle</source>
        <translation>Kocher</translation>
    </message>
    <message id="kettle-description">
        <source>Shows the temperature</source>
        <translation>Zeigt die Temperatur</translation>
    </message>
</context>
</TS>
