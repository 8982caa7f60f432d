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
    <message id="calendar-agenda-dentist">
        <source></source>
        <translation>Hammaslääkäri</translation>
    </message>
    <message id="calendar-agenda-lunch">
        <source></source>
        <translation>Lounas Ainon kanssa</translation>
    </message>
    <message id="calendar-birthdays-sunday">
        <source></source>
        <translation>Aino täyttää sunnuntaina 30 vuotta.</translation>
    </message>
</context>
</TS>
