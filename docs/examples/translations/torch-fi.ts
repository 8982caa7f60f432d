<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="fi">
<context>
    <name></name>
    <message id="torch-quick-action">
        <source>Torch</source>
        <translation>Taskulamppu</translation>
    </message>
</context>
</TS>
