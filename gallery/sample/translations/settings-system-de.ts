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
    <message id="gallery-events-widgets">
        <source></source>
        <translation>Ereignis-Widgets</translation>
    </message>
    <message id="gallery-events-widgets-about">
        <source></source>
        <translation>Widgets für die Ereignisansicht wählen und sehen, welche verfügbar sind.</translation>
    </message>
    <message id="gallery-events-widgets-available">
        <source></source>
        <translation>In der Ereignisansicht</translation>
    </message>
    <message id="gallery-events-widgets-unavailable">
        <source></source>
        <translation>Auf diesem Gerät nicht verfügbar</translation>
    </message>
    <message id="gallery-events-widgets-first-choice">
        <source></source>
        <translation>Bis zur ersten Wahl gilt für jedes Widget seine Vorgabe. Die erste Wahl schaltet alle anderen ein.</translation>
    </message>
    <message id="gallery-events-widgets-device">
        <source></source>
        <translation>Das Gerät</translation>
    </message>
    <message id="gallery-events-widgets-step-counter">
        <source></source>
        <translation>Schrittzähler</translation>
    </message>
    <message id="gallery-events-widgets-step-counter-note">
        <source></source>
        <translation>Das Schritte-Widget ist verfügbar, solange es die Datei des Schrittzählers gibt. Der Schalter legt sie an und entfernt sie.</translation>
    </message>
    <message id="gallery-titles">
        <source></source>
        <translation>Titel als Satz</translation>
    </message>
    <message id="gallery-titles-about">
        <source></source>
        <translation>Was eingeschaltet ist, aufgezählt in der gewählten Sprache.</translation>
    </message>
    <message id="gallery-titles-widgets">
        <source></source>
        <translation>Eingeschaltete Widgets</translation>
    </message>
    <message id="gallery-titles-actions">
        <source></source>
        <translation>Eingeschaltete Schnellaktionen</translation>
    </message>
    <message id="gallery-titles-none">
        <source></source>
        <translation>Nichts ist eingeschaltet.</translation>
    </message>
    <message id="gallery-card">
        <source></source>
        <translation>Speicherkarte</translation>
    </message>
    <message id="gallery-card-about">
        <source></source>
        <translation>Eine Karte formatieren, einhängen und aushängen und die Schritte verfolgen.</translation>
    </message>
    <message id="gallery-card-state">
        <source></source>
        <translation>Karte</translation>
    </message>
    <message id="gallery-card-status">
        <source></source>
        <translation>Zustand</translation>
    </message>
    <message id="gallery-card-file-system">
        <source></source>
        <translation>Dateisystem</translation>
    </message>
    <message id="gallery-card-unknown">
        <source></source>
        <translation>Noch nicht bekannt</translation>
    </message>
    <message id="gallery-card-format">
        <source></source>
        <translation>Formatieren: %1</translation>
    </message>
    <message id="gallery-card-mount">
        <source></source>
        <translation>Einhängen</translation>
    </message>
    <message id="gallery-card-unmount">
        <source></source>
        <translation>Aushängen</translation>
    </message>
    <message id="gallery-card-question">
        <source></source>
        <translation>Karte löschen?</translation>
    </message>
    <message id="gallery-card-question-text">
        <source></source>
        <translation>Alles auf der Karte geht verloren.</translation>
    </message>
    <message id="gallery-card-erase">
        <source></source>
        <translation>Löschen</translation>
    </message>
    <message id="gallery-card-cancel">
        <source></source>
        <translation>Abbrechen</translation>
    </message>
    <message id="gallery-card-steps">
        <source></source>
        <translation>Schritte</translation>
    </message>
    <message id="gallery-card-idle">
        <source></source>
        <translation>Bereit</translation>
    </message>
    <message id="gallery-card-unmounting">
        <source></source>
        <translation>Wird ausgehängt</translation>
    </message>
    <message id="gallery-card-formatting">
        <source></source>
        <translation>Wird formatiert</translation>
    </message>
    <message id="gallery-card-removing-files">
        <source></source>
        <translation>Dateien werden entfernt</translation>
    </message>
    <message id="gallery-card-mounting">
        <source></source>
        <translation>Wird eingehängt</translation>
    </message>
    <message id="gallery-card-probing">
        <source></source>
        <translation>Karte wird untersucht</translation>
    </message>
    <message id="gallery-card-error">
        <source></source>
        <translation>Fehlgeschlagen</translation>
    </message>
    <message id="gallery-card-failed">
        <source></source>
        <translation>Die Karte konnte nicht ein- oder ausgehängt werden.</translation>
    </message>
    <message id="gallery-card-device-busy">
        <source></source>
        <translation>Die Karte wird benutzt. Schließen, was sie benutzt, und noch einmal versuchen.</translation>
    </message>
    <message id="gallery-card-already-mounted">
        <source></source>
        <translation>Die Karte ist schon eingehängt.</translation>
    </message>
    <message id="gallery-card-not-mounted">
        <source></source>
        <translation>Die Karte ist nicht eingehängt.</translation>
    </message>
    <message id="gallery-card-other-user">
        <source></source>
        <translation>Jemand anderes hat die Karte eingehängt.</translation>
    </message>
    <message id="gallery-card-not-authorized">
        <source></source>
        <translation>Das ist nicht erlaubt.</translation>
    </message>
    <message id="gallery-card-not-supported">
        <source></source>
        <translation>Die Karte lässt sich auf diesem Gerät nicht einhängen.</translation>
    </message>
    <message id="gallery-card-timed-out">
        <source></source>
        <translation>Die Karte hat zu lange gebraucht.</translation>
    </message>
    <message id="gallery-card-service">
        <source></source>
        <translation>Datenträgerdienst</translation>
    </message>
    <message id="gallery-card-in-use">
        <source></source>
        <translation>Karte wird benutzt</translation>
    </message>
    <message id="gallery-card-forbidden">
        <source></source>
        <translation>Niemand darf das</translation>
    </message>
    <message id="gallery-card-service-note">
        <source></source>
        <translation>Das ist keine echte Karte: die Galerie spielt den Datenträgerdienst und das Programm, das formatiert.</translation>
    </message>
    <message id="gallery-sample-new-alarm">
        <source></source>
        <translation>Neuer Wecker</translation>
    </message>
    <message id="settings_location-la-no_agreement_text_found">
        <source></source>
        <translation>Die Bedingungen dieses Dienstes wurden nicht gefunden.</translation>
    </message>
    <message id="gallery-location">
        <source></source>
        <translation>Standort</translation>
    </message>
    <message id="gallery-location-about">
        <source></source>
        <translation>Ortungsdienste schalten, die Schalter speichern und wiederherstellen, und lesen, welchen Bedingungen zuzustimmen ist.</translation>
    </message>
    <message id="gallery-location-services">
        <source></source>
        <translation>Ortungsdienste</translation>
    </message>
    <message id="gallery-location-gps">
        <source></source>
        <translation>Satellitenortung (GPS)</translation>
    </message>
    <message id="gallery-location-mls">
        <source></source>
        <translation>Netzwerkortung (MLS)</translation>
    </message>
    <message id="gallery-location-mls-online">
        <source></source>
        <translation>MLS-Onlineunterstützung</translation>
    </message>
    <message id="gallery-location-here">
        <source></source>
        <translation>HERE-Ortung</translation>
    </message>
    <message id="gallery-location-agree-first">
        <source></source>
        <translation>Ein Onlinedienst lässt sich schalten, sobald seinen Bedingungen zugestimmt wurde.</translation>
    </message>
    <message id="gallery-location-custom">
        <source></source>
        <translation>Eigene Einstellungen</translation>
    </message>
    <message id="gallery-location-custom-enabled">
        <source></source>
        <translation>Eigene Einstellungen nutzen</translation>
    </message>
    <message id="gallery-location-save">
        <source></source>
        <translation>Speichern</translation>
    </message>
    <message id="gallery-location-restore">
        <source></source>
        <translation>Wiederherstellen</translation>
    </message>
    <message id="gallery-location-custom-note">
        <source></source>
        <translation>Die gespeicherten Schalter lassen sich später wiederherstellen, auch von anderen Anwendungen.</translation>
    </message>
    <message id="gallery-location-mls-terms">
        <source></source>
        <translation>Bedingungen von MLS online</translation>
    </message>
    <message id="gallery-location-here-terms">
        <source></source>
        <translation>Bedingungen von HERE</translation>
    </message>
    <message id="gallery-location-agree">
        <source></source>
        <translation>Ich stimme zu</translation>
    </message>
    <message id="gallery-location-withdraw">
        <source></source>
        <translation>Zustimmung widerrufen</translation>
    </message>
    <message id="gallery-cover">
        <source></source>
        <translation>Smarte Rückschale</translation>
    </message>
    <message id="gallery-cover-about">
        <source></source>
        <translation>Eine Rückschale anbringen und abnehmen und sehen, wie die Seite dem Rückschalendienst folgt.</translation>
    </message>
    <message id="gallery-cover-info">
        <source></source>
        <translation>Was der Dienst mitteilt</translation>
    </message>
    <message id="gallery-cover-id">
        <source></source>
        <translation>Kennung</translation>
    </message>
    <message id="gallery-cover-none">
        <source></source>
        <translation>Keine Rückschale</translation>
    </message>
    <message id="gallery-cover-daemon">
        <source></source>
        <translation>Rückschalendienst</translation>
    </message>
    <message id="gallery-cover-ready">
        <source></source>
        <translation>Bereit</translation>
    </message>
    <message id="gallery-cover-not-ready">
        <source></source>
        <translation>Nicht bereit</translation>
    </message>
    <message id="gallery-cover-device">
        <source></source>
        <translation>Am Gerät</translation>
    </message>
    <message id="gallery-cover-device-note">
        <source></source>
        <translation>Der Dienst am Systembus bemerkt die Rückschale und meldet sie der Seite.</translation>
    </message>
    <message id="gallery-cover-attach">
        <source></source>
        <translation>Rückschale anbringen</translation>
    </message>
    <message id="gallery-cover-remove">
        <source></source>
        <translation>Rückschale abnehmen</translation>
    </message>
    <message id="gallery-device">
        <source></source>
        <translation>Gerät</translation>
    </message>
    <message id="gallery-device-about">
        <source></source>
        <translation>Bluetooth-Adresse und Modemvariante sehen, und ob Android unterstützt wird.</translation>
    </message>
    <message id="gallery-device-radio">
        <source></source>
        <translation>Funk</translation>
    </message>
    <message id="gallery-device-bluetooth">
        <source></source>
        <translation>Bluetooth-Adresse</translation>
    </message>
    <message id="gallery-device-modem">
        <source></source>
        <translation>Modemvariante</translation>
    </message>
    <message id="gallery-device-unknown">
        <source></source>
        <translation>Unbekannt</translation>
    </message>
    <message id="gallery-device-storage">
        <source></source>
        <translation>Speicher</translation>
    </message>
    <message id="gallery-device-android">
        <source></source>
        <translation>Android-Datenordner</translation>
    </message>
    <message id="gallery-device-android-shown">
        <source></source>
        <translation>Sichtbar: Android-Unterstützung ist installiert</translation>
    </message>
    <message id="gallery-device-android-hidden">
        <source></source>
        <translation>Verborgen: keine Android-Unterstützung</translation>
    </message>
    <message id="gallery-terms">
        <source></source>
        <translation>Nutzungsbedingungen</translation>
    </message>
    <message id="gallery-terms-about">
        <source></source>
        <translation>Die Bedingungen der Plattform und des Herstellers in einer wählbaren Sprache lesen.</translation>
    </message>
    <message id="gallery-terms-locale">
        <source></source>
        <translation>Sprache der Bedingungen</translation>
    </message>
    <message id="gallery-terms-locale-note">
        <source></source>
        <translation>Bedingungen, die es in der Sprache nicht gibt, erscheinen auf Englisch.</translation>
    </message>
    <message id="gallery-terms-none">
        <source></source>
        <translation>Keine Bedingungen</translation>
    </message>
    <message id="gallery-text-files">
        <source></source>
        <translation>Textdateien</translation>
    </message>
    <message id="gallery-text-files-about">
        <source></source>
        <translation>Eine Datei lesen, und einen Ordner, dessen Dateien zu einem Text werden.</translation>
    </message>
    <message id="gallery-text-files-file">
        <source></source>
        <translation>Eine Datei</translation>
    </message>
    <message id="gallery-text-files-note">
        <source></source>
        <translation>Zeilenumbrüche einer Datei entfallen: Ein Text mit Absätzen wird in HTML geschrieben.</translation>
    </message>
    <message id="gallery-text-files-folder">
        <source></source>
        <translation>Ein Ordner</translation>
    </message>
    <message id="gallery-text-files-prefix">
        <source></source>
        <translation>Lizenzen der Beispieldateien:</translation>
    </message>
</context>
</TS>
