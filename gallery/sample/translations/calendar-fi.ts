<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="fi">
<context>
    <name></name>
    <message id="calendar-agenda">
        <source></source>
        <translation>Päivyri</translation>
    </message>
    <message id="calendar-agenda-description">
        <source></source>
        <translation>Tämän päivän ja huomisen tapahtumat</translation>
    </message>
    <message id="calendar-birthdays">
        <source></source>
        <translation>Syntymäpäivät</translation>
    </message>
    <message id="calendar-birthdays-description">
        <source></source>
        <translation>Tämän viikon päivänsankarit</translation>
    </message>
</context>
</TS>
