<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="de">
<context>
    <name></name>
    <message id="outdoors-weather">
        <source></source>
        <translation>Wetter</translation>
    </message>
    <message id="outdoors-weather-description">
        <source></source>
        <translation>Der Himmel der nächsten Stunden</translation>
    </message>
    <message id="outdoors-steps">
        <source></source>
        <translation>Schritte</translation>
    </message>
    <message id="outdoors-steps-description">
        <source></source>
        <translation>Wie weit der Tag geführt hat, vom Gerät gezählt</translation>
    </message>
</context>
</TS>
