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
        <translation>Zeigt die eingeschalteten Schnellaktionen und löst sie aus wie ein Startbildschirm.</translation>
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
        <translation>Listet alle angebotenen Schnellaktionen auf, zum Ein- und Ausschalten und Ordnen.</translation>
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
        <translation>Listet die Widgets der Ereignisansicht auf, um verfügbare ein- und auszuschalten.</translation>
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
    <message id="gallery-events-widgets-step-counter">
        <source></source>
        <translation>Schrittzähler</translation>
    </message>
    <message id="gallery-events-widgets-step-counter-note">
        <source></source>
        <translation>Solange er da ist, ist das Schritte-Widget verfügbar, sobald die Seite prüft.</translation>
    </message>
    <message id="gallery-titles">
        <source></source>
        <translation>Titel als Satz</translation>
    </message>
    <message id="gallery-titles-about">
        <source></source>
        <translation>Verbindet Titel aus den Zeilen eines Modells zu einer Aufzählung in der gewählten Sprache.</translation>
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
        <translation>Formatiert, leert, hängt eine Speicherkarte ein und aus und sagt, was auf ihr ist.</translation>
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
        <translation>Das ist nicht gelungen.</translation>
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
        <translation>Ein Programm hat eine ihrer Dateien offen</translation>
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
        <translation>Schaltet die Ortungsdienste, sichert die Schalter und kennt die Bedingungen, denen zuzustimmen ist.</translation>
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
        <translation>Verfolgt die smarte Rückschale: welche angebracht ist und ob sie bereit ist.</translation>
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
    <message id="gallery-terms">
        <source></source>
        <translation>Nutzungsbedingungen</translation>
    </message>
    <message id="gallery-terms-about">
        <source></source>
        <translation>Liest die Bedingungen der Plattform und des Herstellers in der Sprache des Benutzers.</translation>
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
        <translation>Liest eine Textdatei, und die Dateien eines Ordners als einen Text.</translation>
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
    <message id="gallery-bluetooth">
        <source></source>
        <translation>Bluetooth</translation>
    </message>
    <message id="gallery-bluetooth-about">
        <source></source>
        <translation>Nennt die Adresse des Bluetooth-Adapters.</translation>
    </message>
    <message id="gallery-bluetooth-address">
        <source></source>
        <translation>Adresse des Adapters</translation>
    </message>
    <message id="gallery-bluetooth-installed">
        <source></source>
        <translation>Die Plattform hat eine Adressdatei</translation>
    </message>
    <message id="gallery-android">
        <source></source>
        <translation>Android-Unterstützung</translation>
    </message>
    <message id="gallery-android-about">
        <source></source>
        <translation>Sagt, ob Ordner von Android-Anwendungen zu zeigen sind.</translation>
    </message>
    <message id="gallery-android-folders">
        <source></source>
        <translation>Android-Datenordner</translation>
    </message>
    <message id="gallery-android-shown">
        <source></source>
        <translation>Sichtbar: Android-Unterstützung ist installiert</translation>
    </message>
    <message id="gallery-android-hidden">
        <source></source>
        <translation>Verborgen: keine Android-Unterstützung</translation>
    </message>
    <message id="gallery-android-installed">
        <source></source>
        <translation>Android-Unterstützung ist installiert</translation>
    </message>
    <message id="gallery-modem">
        <source></source>
        <translation>Modem</translation>
    </message>
    <message id="gallery-modem-about">
        <source></source>
        <translation>Sagt, welche Variante der Modemsoftware das Gerät hat.</translation>
    </message>
    <message id="gallery-modem-variant">
        <source></source>
        <translation>Variante der Software</translation>
    </message>
    <message id="gallery-modem-installed">
        <source></source>
        <translation>Die Modemsoftware ist installiert</translation>
    </message>
    <message id="gallery-unknown">
        <source></source>
        <translation>Unbekannt</translation>
    </message>
    <message id="gallery-text-files-none">
        <source></source>
        <translation>Nichts zu lesen.</translation>
    </message>
    <message id="gallery-text-files-file-installed">
        <source></source>
        <translation>Die Datei ist da</translation>
    </message>
    <message id="gallery-text-files-folder-installed">
        <source></source>
        <translation>Der Ordner ist da</translation>
    </message>
    <message id="gallery-terms-platform-installed">
        <source></source>
        <translation>Die Plattform hat Bedingungen</translation>
    </message>
    <message id="gallery-terms-vendor-installed">
        <source></source>
        <translation>Der Hersteller hat Bedingungen</translation>
    </message>
    <message id="gallery-stage">
        <source></source>
        <translation>Die Bühne</translation>
    </message>
    <message id="gallery-stage-note">
        <source></source>
        <translation>Spielt das Gerät um die Seite. Nichts davon gehört auf eine Seite.</translation>
    </message>
    <message id="gallery-stage-reload">
        <source></source>
        <translation>Seite neu öffnen</translation>
    </message>
    <message id="gallery-stage-constant">
        <source></source>
        <translation>Die Seite liest dies, wenn sie geöffnet wird.</translation>
    </message>
    <message id="gallery-log">
        <source></source>
        <translation>Protokoll: %1</translation>
    </message>
    <message id="gallery-log-clear">
        <source></source>
        <translation>Leeren</translation>
    </message>
    <message id="gallery-quick-actions-installed">
        <source></source>
        <translation>Schnellaktionen sind installiert</translation>
    </message>
    <message id="gallery-quick-actions-not-installed">
        <source></source>
        <translation>Keine Schnellaktion ist installiert.</translation>
    </message>
    <message id="gallery-quick-actions-fail">
        <source></source>
        <translation>Dienste antworten mit einem Fehler</translation>
    </message>
    <message id="gallery-quick-actions-absent">
        <source></source>
        <translation>Der Navigationsdienst ist nicht installiert: Seine Aktion fragt im Store nach dem Paket.</translation>
    </message>
    <message id="gallery-quick-actions-broken">
        <source></source>
        <translation>Eine leere Definitionsdatei ist da</translation>
    </message>
    <message id="gallery-quick-actions-keys">
        <source></source>
        <translation>Außer durch Ziehen wandert eine Zeile mit Strg und den Pfeiltasten. Geänderte Dateien werden nach einer Sekunde bemerkt.</translation>
    </message>
    <message id="gallery-events-widgets-none">
        <source></source>
        <translation>Kein Widget ist installiert.</translation>
    </message>
    <message id="gallery-events-widgets-check">
        <source></source>
        <translation>Verfügbarkeit prüfen</translation>
    </message>
    <message id="gallery-events-widgets-installed">
        <source></source>
        <translation>Widgets sind installiert</translation>
    </message>
    <message id="gallery-events-widgets-broken">
        <source></source>
        <translation>Eine kaputte Definitionsdatei ist da</translation>
    </message>
    <message id="gallery-titles-language">
        <source></source>
        <translation>In einer anderen Sprache sind die Sätze neu, wenn die Seite neu geöffnet wird.</translation>
    </message>
    <message id="gallery-card-none">
        <source></source>
        <translation>Keine Karte ist eingelegt.</translation>
    </message>
    <message id="gallery-card-empty">
        <source></source>
        <translation>Alle Dateien entfernen</translation>
    </message>
    <message id="gallery-card-empty-question">
        <source></source>
        <translation>Alle Dateien entfernen?</translation>
    </message>
    <message id="gallery-card-empty-question-text">
        <source></source>
        <translation>Alle Dateien und Ordner der Karte gehen verloren. Ihr Dateisystem bleibt.</translation>
    </message>
    <message id="gallery-card-remove">
        <source></source>
        <translation>Entfernen</translation>
    </message>
    <message id="gallery-card-real">
        <source></source>
        <translation>Eine echte Karte: %1, ein ext4-Dateisystem im Speicher, und der echte Datenträgerdienst</translation>
    </message>
    <message id="gallery-card-played">
        <source></source>
        <translation>Karte und Datenträgerdienst sind gespielt. Ausgehängt vergisst die Karte ihre Dateien.</translation>
    </message>
    <message id="gallery-card-files">
        <source></source>
        <translation>Die Karte ist eingehängt. Dateien und Ordner zuoberst: %1</translation>
    </message>
    <message id="gallery-card-is-unmounted">
        <source></source>
        <translation>Die Karte ist nicht eingehängt.</translation>
    </message>
    <message id="gallery-card-fill">
        <source></source>
        <translation>Dateien auf die Karte legen</translation>
    </message>
    <message id="gallery-card-inserted">
        <source></source>
        <translation>Die Karte ist eingelegt</translation>
    </message>
    <message id="gallery-card-helper">
        <source></source>
        <translation>Das Hilfsprogramm ist installiert</translation>
    </message>
    <message id="gallery-card-helper-waits">
        <source></source>
        <translation>Das Hilfsprogramm lässt sich Zeit</translation>
    </message>
    <message id="gallery-card-service-works">
        <source></source>
        <translation>Arbeitet</translation>
    </message>
    <message id="gallery-card-service-forbids">
        <source></source>
        <translation>Verbietet alles</translation>
    </message>
    <message id="gallery-card-service-silent">
        <source></source>
        <translation>Antwortet nicht</translation>
    </message>
    <message id="gallery-card-service-absent">
        <source></source>
        <translation>Ist nicht da</translation>
    </message>
    <message id="gallery-location-mls-installed">
        <source></source>
        <translation>Die Bedingungen von MLS sind installiert</translation>
    </message>
    <message id="gallery-location-here-installed">
        <source></source>
        <translation>Die Bedingungen von HERE sind installiert</translation>
    </message>
    <message id="gallery-cover-no-daemon">
        <source></source>
        <translation>Kein Dienst</translation>
    </message>
    <message id="gallery-cover-removed">
        <source></source>
        <translation>Keine Rückschale angebracht</translation>
    </message>
    <message id="gallery-cover-attached">
        <source></source>
        <translation>Eine Rückschale, die nicht bereit ist</translation>
    </message>
    <message id="gallery-cover-attached-ready">
        <source></source>
        <translation>Eine Rückschale, die bereit ist</translation>
    </message>
    <message id="gallery-cover-note">
        <source></source>
        <translation>Geht der Dienst, behält eine offene Seite, was sie wusste.</translation>
    </message>
</context>
</TS>
