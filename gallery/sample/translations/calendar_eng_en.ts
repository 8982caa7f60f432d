<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="en">
<context>
    <name></name>
    <message id="calendar-agenda">
        <source></source>
        <translation>Agenda</translation>
    </message>
    <message id="calendar-agenda-description">
        <source></source>
        <translation>What today and tomorrow bring</translation>
    </message>
    <message id="calendar-birthdays">
        <source></source>
        <translation>Birthdays</translation>
    </message>
    <message id="calendar-birthdays-description">
        <source></source>
        <translation>Whom to congratulate this week</translation>
    </message>
    <message id="calendar-agenda-dentist">
        <source></source>
        <translation>Dentist</translation>
    </message>
    <message id="calendar-agenda-lunch">
        <source></source>
        <translation>Lunch with Aino</translation>
    </message>
    <message id="calendar-birthdays-sunday">
        <source></source>
        <translation>Aino turns 30 on Sunday.</translation>
    </message>
</context>
</TS>
