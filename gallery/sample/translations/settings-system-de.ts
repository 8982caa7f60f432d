<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="de">
<context>
    <name></name>
    <message id="gallery-title">
        <source></source>
        <translation>Einstellungsgalerie</translation>
    </message>
    <message id="gallery-back">
        <source></source>
        <translation>Zurück</translation>
    </message>
    <message id="gallery-language">
        <source></source>
        <translation>Sprache</translation>
    </message>
    <message id="gallery-quick-actions">
        <source></source>
        <translation>Schnellaktionen</translation>
    </message>
    <message id="gallery-quick-actions-about">
        <source></source>
        <translation>Eine Aktion antippen wie auf dem Startbildschirm und sehen, welcher Aufruf hinausgeht.</translation>
    </message>
    <message id="gallery-quick-actions-home">
        <source></source>
        <translation>Auf dem Startbildschirm</translation>
    </message>
    <message id="gallery-quick-actions-none">
        <source></source>
        <translation>Keine Schnellaktion ist eingeschaltet.</translation>
    </message>
    <message id="gallery-quick-actions-language">
        <source></source>
        <translation>In einer anderen Sprache behalten Aktionen mit eigenem Katalog ihren Titel, bis die Seite neu geöffnet wird.</translation>
    </message>
    <message id="gallery-received-calls">
        <source></source>
        <translation>Empfangene Aufrufe</translation>
    </message>
    <message id="gallery-received-calls-none">
        <source></source>
        <translation>Noch nichts: eine Aktion antippen.</translation>
    </message>
    <message id="gallery-quick-actions-settings">
        <source></source>
        <translation>Schnellaktionen wählen</translation>
    </message>
    <message id="gallery-quick-actions-settings-about">
        <source></source>
        <translation>Aktionen ein- und ausschalten und durch Ziehen ordnen.</translation>
    </message>
    <message id="gallery-quick-actions-order">
        <source></source>
        <translation>Reihenfolge auf dem Startbildschirm</translation>
    </message>
    <message id="gallery-quick-actions-available">
        <source></source>
        <translation>Verfügbare Aktionen</translation>
    </message>
    <message id="gallery-sample-new-alarm">
        <source></source>
        <translation>Neuer Wecker</translation>
    </message>
</context>
</TS>
