<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="pt_BR">
<context>
    <name></name>
    <message id="kettle-action">
        <source>Boil</source>
        <translation>Ferver</translation>
    </message>
    <message id="kettle-title">
        <source>Kettle</source>
        <translation>Chaleira</translation>
    </message>
    <message id="kettle-description">
        <source>Shows the temperature</source>
        <translation>Mostra a temperatura</translation>
    </message>
</context>
</TS>
