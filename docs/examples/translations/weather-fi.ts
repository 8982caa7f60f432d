<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="fi">
<context>
    <name></name>
    <message id="weather-widget-title">
        <source>Weather</source>
        <translation>Sää</translation>
    </message>
    <message id="weather-widget-description">
        <source>The weather of the day</source>
        <translation>Päivän sää</translation>
    </message>
    <message id="weather-widget-forecast">
        <source>Sunny, with a light wind</source>
        <translation>Aurinkoista ja heikkoa tuulta</translation>
    </message>
</context>
</TS>
