<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="en">
<context>
    <name></name>
    <message id="gallery-title">
        <source></source>
        <translation>Settings gallery</translation>
    </message>
    <message id="gallery-back">
        <source></source>
        <translation>Back</translation>
    </message>
    <message id="gallery-language">
        <source></source>
        <translation>Language</translation>
    </message>
    <message id="gallery-quick-actions">
        <source></source>
        <translation>Quick actions</translation>
    </message>
    <message id="gallery-quick-actions-about">
        <source></source>
        <translation>Tap an action as on the home screen, and see the call that goes out.</translation>
    </message>
    <message id="gallery-quick-actions-home">
        <source></source>
        <translation>On the home screen</translation>
    </message>
    <message id="gallery-quick-actions-none">
        <source></source>
        <translation>No quick action is enabled.</translation>
    </message>
    <message id="gallery-quick-actions-language">
        <source></source>
        <translation>In another language, actions with a catalog of their own keep their titles until the page is opened anew.</translation>
    </message>
    <message id="gallery-received-calls">
        <source></source>
        <translation>Received calls</translation>
    </message>
    <message id="gallery-received-calls-none">
        <source></source>
        <translation>Nothing yet: tap an action.</translation>
    </message>
    <message id="gallery-quick-actions-settings">
        <source></source>
        <translation>Choose quick actions</translation>
    </message>
    <message id="gallery-quick-actions-settings-about">
        <source></source>
        <translation>Enable and disable actions, and drag them into order.</translation>
    </message>
    <message id="gallery-quick-actions-order">
        <source></source>
        <translation>Order on the home screen</translation>
    </message>
    <message id="gallery-quick-actions-available">
        <source></source>
        <translation>Available actions</translation>
    </message>
    <message id="gallery-events-widgets">
        <source></source>
        <translation>Events widgets</translation>
    </message>
    <message id="gallery-events-widgets-about">
        <source></source>
        <translation>Choose the widgets of the events screen, and see which are available.</translation>
    </message>
    <message id="gallery-events-widgets-available">
        <source></source>
        <translation>On the events screen</translation>
    </message>
    <message id="gallery-events-widgets-unavailable">
        <source></source>
        <translation>Not available on this device</translation>
    </message>
    <message id="gallery-events-widgets-first-choice">
        <source></source>
        <translation>Until the first choice, each widget has its default. The first choice enables all others.</translation>
    </message>
    <message id="gallery-events-widgets-device">
        <source></source>
        <translation>The device</translation>
    </message>
    <message id="gallery-events-widgets-step-counter">
        <source></source>
        <translation>Step counter</translation>
    </message>
    <message id="gallery-events-widgets-step-counter-note">
        <source></source>
        <translation>The steps widget is available while the file of the step counter is there. The switch makes and removes the file.</translation>
    </message>
    <message id="gallery-titles">
        <source></source>
        <translation>Titles in a sentence</translation>
    </message>
    <message id="gallery-titles-about">
        <source></source>
        <translation>What is enabled, in one sentence of the language.</translation>
    </message>
    <message id="gallery-titles-widgets">
        <source></source>
        <translation>Enabled events widgets</translation>
    </message>
    <message id="gallery-titles-actions">
        <source></source>
        <translation>Enabled quick actions</translation>
    </message>
    <message id="gallery-titles-none">
        <source></source>
        <translation>None is enabled.</translation>
    </message>
    <message id="gallery-card">
        <source></source>
        <translation>Memory card</translation>
    </message>
    <message id="gallery-card-about">
        <source></source>
        <translation>Format a card, mount and unmount it, and follow the steps.</translation>
    </message>
    <message id="gallery-card-state">
        <source></source>
        <translation>Card</translation>
    </message>
    <message id="gallery-card-status">
        <source></source>
        <translation>State</translation>
    </message>
    <message id="gallery-card-file-system">
        <source></source>
        <translation>File system</translation>
    </message>
    <message id="gallery-card-unknown">
        <source></source>
        <translation>Not known yet</translation>
    </message>
    <message id="gallery-card-format">
        <source></source>
        <translation>Format as %1</translation>
    </message>
    <message id="gallery-card-mount">
        <source></source>
        <translation>Mount</translation>
    </message>
    <message id="gallery-card-unmount">
        <source></source>
        <translation>Unmount</translation>
    </message>
    <message id="gallery-card-question">
        <source></source>
        <translation>Erase the card?</translation>
    </message>
    <message id="gallery-card-question-text">
        <source></source>
        <translation>Everything on the card will be lost.</translation>
    </message>
    <message id="gallery-card-erase">
        <source></source>
        <translation>Erase</translation>
    </message>
    <message id="gallery-card-cancel">
        <source></source>
        <translation>Cancel</translation>
    </message>
    <message id="gallery-card-steps">
        <source></source>
        <translation>Steps</translation>
    </message>
    <message id="gallery-card-idle">
        <source></source>
        <translation>Ready</translation>
    </message>
    <message id="gallery-card-unmounting">
        <source></source>
        <translation>Unmounting</translation>
    </message>
    <message id="gallery-card-formatting">
        <source></source>
        <translation>Formatting</translation>
    </message>
    <message id="gallery-card-removing-files">
        <source></source>
        <translation>Removing files</translation>
    </message>
    <message id="gallery-card-mounting">
        <source></source>
        <translation>Mounting</translation>
    </message>
    <message id="gallery-card-probing">
        <source></source>
        <translation>Looking at the card</translation>
    </message>
    <message id="gallery-card-error">
        <source></source>
        <translation>Failed</translation>
    </message>
    <message id="gallery-card-failed">
        <source></source>
        <translation>The card could not be mounted or unmounted.</translation>
    </message>
    <message id="gallery-card-device-busy">
        <source></source>
        <translation>The card is in use. Close what uses it, and try again.</translation>
    </message>
    <message id="gallery-card-already-mounted">
        <source></source>
        <translation>The card is mounted already.</translation>
    </message>
    <message id="gallery-card-not-mounted">
        <source></source>
        <translation>The card is not mounted.</translation>
    </message>
    <message id="gallery-card-other-user">
        <source></source>
        <translation>Another user has mounted the card.</translation>
    </message>
    <message id="gallery-card-not-authorized">
        <source></source>
        <translation>This is not allowed.</translation>
    </message>
    <message id="gallery-card-not-supported">
        <source></source>
        <translation>The card cannot be mounted on this device.</translation>
    </message>
    <message id="gallery-card-timed-out">
        <source></source>
        <translation>The card took too long.</translation>
    </message>
    <message id="gallery-card-service">
        <source></source>
        <translation>Disk service</translation>
    </message>
    <message id="gallery-card-in-use">
        <source></source>
        <translation>The card is in use</translation>
    </message>
    <message id="gallery-card-forbidden">
        <source></source>
        <translation>Nobody may do that</translation>
    </message>
    <message id="gallery-card-service-note">
        <source></source>
        <translation>This is not a real card: the gallery plays the disk service and the program that formats.</translation>
    </message>
    <message id="gallery-sample-new-alarm">
        <source></source>
        <translation>New alarm</translation>
    </message>
    <message id="settings_location-la-no_agreement_text_found">
        <source></source>
        <translation>The terms of this service could not be found.</translation>
    </message>
    <message id="gallery-location">
        <source></source>
        <translation>Location</translation>
    </message>
    <message id="gallery-location-about">
        <source></source>
        <translation>Switch the location services, save and restore the switches, and read what to agree to.</translation>
    </message>
    <message id="gallery-location-services">
        <source></source>
        <translation>Location services</translation>
    </message>
    <message id="gallery-location-gps">
        <source></source>
        <translation>Satellite positioning (GPS)</translation>
    </message>
    <message id="gallery-location-mls">
        <source></source>
        <translation>Network positioning (MLS)</translation>
    </message>
    <message id="gallery-location-mls-online">
        <source></source>
        <translation>MLS online assistance</translation>
    </message>
    <message id="gallery-location-here">
        <source></source>
        <translation>HERE positioning</translation>
    </message>
    <message id="gallery-location-agree-first">
        <source></source>
        <translation>An online service can be switched once its terms are agreed to.</translation>
    </message>
    <message id="gallery-location-custom">
        <source></source>
        <translation>Custom settings</translation>
    </message>
    <message id="gallery-location-custom-enabled">
        <source></source>
        <translation>Use custom settings</translation>
    </message>
    <message id="gallery-location-save">
        <source></source>
        <translation>Save</translation>
    </message>
    <message id="gallery-location-restore">
        <source></source>
        <translation>Restore</translation>
    </message>
    <message id="gallery-location-custom-note">
        <source></source>
        <translation>The saved switches can be restored later, also by other applications.</translation>
    </message>
    <message id="gallery-location-mls-terms">
        <source></source>
        <translation>Terms of MLS online assistance</translation>
    </message>
    <message id="gallery-location-here-terms">
        <source></source>
        <translation>Terms of HERE positioning</translation>
    </message>
    <message id="gallery-location-agree">
        <source></source>
        <translation>I agree</translation>
    </message>
    <message id="gallery-location-withdraw">
        <source></source>
        <translation>Withdraw consent</translation>
    </message>
    <message id="gallery-cover">
        <source></source>
        <translation>Smart back cover</translation>
    </message>
    <message id="gallery-cover-about">
        <source></source>
        <translation>Attach and remove a cover, and see the page follow the cover daemon.</translation>
    </message>
    <message id="gallery-cover-info">
        <source></source>
        <translation>What the daemon tells</translation>
    </message>
    <message id="gallery-cover-id">
        <source></source>
        <translation>Identifier</translation>
    </message>
    <message id="gallery-cover-none">
        <source></source>
        <translation>No cover</translation>
    </message>
    <message id="gallery-cover-daemon">
        <source></source>
        <translation>Cover daemon</translation>
    </message>
    <message id="gallery-cover-ready">
        <source></source>
        <translation>Ready</translation>
    </message>
    <message id="gallery-cover-not-ready">
        <source></source>
        <translation>Not ready</translation>
    </message>
    <message id="gallery-cover-device">
        <source></source>
        <translation>On the device</translation>
    </message>
    <message id="gallery-cover-device-note">
        <source></source>
        <translation>The daemon on the system bus sees the cover and tells the page.</translation>
    </message>
    <message id="gallery-cover-attach">
        <source></source>
        <translation>Attach a cover</translation>
    </message>
    <message id="gallery-cover-remove">
        <source></source>
        <translation>Remove the cover</translation>
    </message>
    <message id="gallery-device">
        <source></source>
        <translation>Device</translation>
    </message>
    <message id="gallery-device-about">
        <source></source>
        <translation>See the Bluetooth address, the modem variant and whether Android is supported.</translation>
    </message>
    <message id="gallery-device-radio">
        <source></source>
        <translation>Radio</translation>
    </message>
    <message id="gallery-device-bluetooth">
        <source></source>
        <translation>Bluetooth address</translation>
    </message>
    <message id="gallery-device-modem">
        <source></source>
        <translation>Modem variant</translation>
    </message>
    <message id="gallery-device-unknown">
        <source></source>
        <translation>Unknown</translation>
    </message>
    <message id="gallery-device-storage">
        <source></source>
        <translation>Storage</translation>
    </message>
    <message id="gallery-device-android">
        <source></source>
        <translation>Android data folders</translation>
    </message>
    <message id="gallery-device-android-shown">
        <source></source>
        <translation>Shown: Android support is installed</translation>
    </message>
    <message id="gallery-device-android-hidden">
        <source></source>
        <translation>Hidden: no Android support</translation>
    </message>
    <message id="gallery-terms">
        <source></source>
        <translation>Terms of use</translation>
    </message>
    <message id="gallery-terms-about">
        <source></source>
        <translation>Read the terms of the platform and of the vendor in a language of your choice.</translation>
    </message>
    <message id="gallery-terms-locale">
        <source></source>
        <translation>Language of the terms</translation>
    </message>
    <message id="gallery-terms-locale-note">
        <source></source>
        <translation>Terms that lack the language are shown in English.</translation>
    </message>
    <message id="gallery-terms-none">
        <source></source>
        <translation>No terms</translation>
    </message>
    <message id="gallery-text-files">
        <source></source>
        <translation>Text files</translation>
    </message>
    <message id="gallery-text-files-about">
        <source></source>
        <translation>Read a file, and a folder whose files become one text.</translation>
    </message>
    <message id="gallery-text-files-file">
        <source></source>
        <translation>A file</translation>
    </message>
    <message id="gallery-text-files-note">
        <source></source>
        <translation>Line breaks of a file are dropped: a text with paragraphs is written in HTML.</translation>
    </message>
    <message id="gallery-text-files-folder">
        <source></source>
        <translation>A folder</translation>
    </message>
    <message id="gallery-text-files-prefix">
        <source></source>
        <translation>Licences of the sample files:</translation>
    </message>
</context>
</TS>
