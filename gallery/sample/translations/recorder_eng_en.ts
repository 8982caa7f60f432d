<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="en">
<context>
    <name></name>
    <message id="recorder-record">
        <source></source>
        <translation>Record sound</translation>
    </message>
</context>
</TS>
