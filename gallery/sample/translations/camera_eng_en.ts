<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="en">
<context>
    <name></name>
    <message id="camera-take-photo">
        <source></source>
        <translation>Take a photo</translation>
    </message>
</context>
</TS>
