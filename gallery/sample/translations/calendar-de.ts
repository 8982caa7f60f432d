<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="de">
<context>
    <name></name>
    <message id="calendar-agenda">
        <source></source>
        <translation>Termine</translation>
    </message>
    <message id="calendar-agenda-description">
        <source></source>
        <translation>Was heute und morgen ansteht</translation>
    </message>
    <message id="calendar-birthdays">
        <source></source>
        <translation>Geburtstage</translation>
    </message>
    <message id="calendar-birthdays-description">
        <source></source>
        <translation>Wem diese Woche zu gratulieren ist</translation>
    </message>
</context>
</TS>
