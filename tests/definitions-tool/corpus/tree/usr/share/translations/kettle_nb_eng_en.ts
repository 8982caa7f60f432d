<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="en">
<context>
    <name></name>
    <message id="kettle-pro">
        <source>Pro</source>
        <translation>Pro</translation>
    </message>
</context>
</TS>
