<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="en">
<context>
    <name></name>
    <message id="maps-title">
        <source></source>
        <translation>Maps</translation>
    </message>
    <message id="maps-english">
        <source></source>
        <translation>Maps, English only</translation>
    </message>
</context>
</TS>
