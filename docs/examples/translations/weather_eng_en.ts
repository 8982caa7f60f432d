<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="en">
<context>
    <name></name>
    <message id="weather-widget-title">
        <source>Weather</source>
        <translation>Weather</translation>
    </message>
    <message id="weather-widget-description">
        <source>The weather of the day</source>
        <translation>The weather of the day</translation>
    </message>
    <message id="weather-widget-forecast">
        <source>Sunny, with a light wind</source>
        <translation>Sunny, with a light wind</translation>
    </message>
</context>
</TS>
