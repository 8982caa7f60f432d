<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="en">
<context>
    <name></name>
    <message id="settings-test-both">
        <source></source>
        <translation>Both, engineering English</translation>
    </message>
    <message id="settings-test-english">
        <source></source>
        <translation>English only</translation>
    </message>
    <message id="maps-title">
        <source></source>
        <translation>Maps, settings</translation>
    </message>
</context>
</TS>
