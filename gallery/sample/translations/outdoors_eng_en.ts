<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="en">
<context>
    <name></name>
    <message id="outdoors-weather">
        <source></source>
        <translation>Weather</translation>
    </message>
    <message id="outdoors-weather-description">
        <source></source>
        <translation>The sky over the next hours</translation>
    </message>
    <message id="outdoors-steps">
        <source></source>
        <translation>Steps</translation>
    </message>
    <message id="outdoors-steps-description">
        <source></source>
        <translation>How far today has led, as counted by the device</translation>
    </message>
    <message id="outdoors-steps-done">
        <source></source>
        <translation>%1 of %2 steps</translation>
    </message>
</context>
</TS>
