<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="en">
<context>
    <name></name>
    <message id="notes-new">
        <source></source>
        <translation>New note</translation>
    </message>
    <message id="notes-search">
        <source></source>
        <translation>Search notes</translation>
    </message>
</context>
</TS>
