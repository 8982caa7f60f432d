<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="fi">
<context>
    <name></name>
    <message id="outdoors-weather">
        <source></source>
        <translation>Sää</translation>
    </message>
    <message id="outdoors-weather-description">
        <source></source>
        <translation>Lähituntien sää</translation>
    </message>
    <message id="outdoors-steps">
        <source></source>
        <translation>Askeleet</translation>
    </message>
    <message id="outdoors-steps-description">
        <source></source>
        <translation>Laitteen laskemat päivän askeleet</translation>
    </message>
    <message id="outdoors-steps-done">
        <source></source>
        <translation>%1 / %2 askelta</translation>
    </message>
</context>
</TS>
