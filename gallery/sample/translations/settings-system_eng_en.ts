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
        <translation>Shows the enabled quick actions and triggers them, as a home screen does.</translation>
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
        <translation>In another language, actions with a catalog of their own keep their titles until the page is opened again.</translation>
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
        <translation>Lists every quick action that is offered: to enable, disable and put in order.</translation>
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
        <translation>Lists the widgets of the events screen: to enable and disable those that are available.</translation>
    </message>
    <message id="gallery-events-widgets-available">
        <source></source>
        <translation>Available widgets</translation>
    </message>
    <message id="gallery-events-widgets-unavailable">
        <source></source>
        <translation>Not available on this device</translation>
    </message>
    <message id="gallery-events-widgets-first-choice">
        <source></source>
        <translation>Until the first choice, each widget has its default. The first choice enables all others.</translation>
    </message>
    <message id="gallery-events-widgets-step-counter">
        <source></source>
        <translation>Step counter</translation>
    </message>
    <message id="gallery-events-widgets-step-counter-note">
        <source></source>
        <translation>The steps widget is available while this is installed. The page has to check again.</translation>
    </message>
    <message id="gallery-titles">
        <source></source>
        <translation>Titles in a sentence</translation>
    </message>
    <message id="gallery-titles-about">
        <source></source>
        <translation>Joins the titles of a model’s rows, such as the enabled ones, into a sentence in the user’s language.</translation>
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
        <translation>Formats, empties, mounts and unmounts a memory card, and shows its file system.</translation>
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
        <translation>Everything on the card will be lost. It will have an empty %1 file system.</translation>
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
        <translation>Detecting the file system</translation>
    </message>
    <message id="gallery-card-error">
        <source></source>
        <translation>Failed</translation>
    </message>
    <message id="gallery-card-failed">
        <source></source>
        <translation>the disk service reported an error</translation>
    </message>
    <message id="gallery-card-device-busy">
        <source></source>
        <translation>the card is in use. Close what uses it, and try again.</translation>
    </message>
    <message id="gallery-card-already-mounted">
        <source></source>
        <translation>the card was already mounted</translation>
    </message>
    <message id="gallery-card-not-mounted">
        <source></source>
        <translation>the card is not mounted</translation>
    </message>
    <message id="gallery-card-other-user">
        <source></source>
        <translation>another user has mounted the card</translation>
    </message>
    <message id="gallery-card-not-authorized">
        <source></source>
        <translation>not allowed</translation>
    </message>
    <message id="gallery-card-not-supported">
        <source></source>
        <translation>not supported on this device</translation>
    </message>
    <message id="gallery-card-timed-out">
        <source></source>
        <translation>the card took too long</translation>
    </message>
    <message id="gallery-card-service">
        <source></source>
        <translation>Disk service</translation>
    </message>
    <message id="gallery-card-in-use">
        <source></source>
        <translation>A program has a file on it open</translation>
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
        <translation>Switches the location services, saves and restores the switches, and shows the terms of the online services.</translation>
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
        <translation>Follows the smart back cover: which cover is attached, and whether it can be recognized.</translation>
    </message>
    <message id="gallery-cover-id">
        <source></source>
        <translation>Attached cover</translation>
    </message>
    <message id="gallery-cover-none">
        <source></source>
        <translation>None</translation>
    </message>
    <message id="gallery-cover-ready">
        <source></source>
        <translation>Ready</translation>
    </message>
    <message id="gallery-cover-not-ready">
        <source></source>
        <translation>Not ready yet</translation>
    </message>
    <message id="gallery-terms">
        <source></source>
        <translation>Terms of use</translation>
    </message>
    <message id="gallery-terms-about">
        <source></source>
        <translation>Reads the terms of the platform and of the vendor in the language of the user.</translation>
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
        <translation>Reads a text file, and the files of a directory as one text.</translation>
    </message>
    <message id="gallery-text-files-file">
        <source></source>
        <translation>A file</translation>
    </message>
    <message id="gallery-text-files-note">
        <source></source>
        <translation>Line breaks of a file are dropped: a text with paragraphs is written in HTML.</translation>
    </message>
    <message id="gallery-text-files-prefix">
        <source></source>
        <translation>Licences of the sample files:</translation>
    </message>
    <message id="gallery-bluetooth">
        <source></source>
        <translation>Bluetooth</translation>
    </message>
    <message id="gallery-bluetooth-about">
        <source></source>
        <translation>Shows the address of the Bluetooth adapter.</translation>
    </message>
    <message id="gallery-bluetooth-address">
        <source></source>
        <translation>Address of the adapter</translation>
    </message>
    <message id="gallery-bluetooth-installed">
        <source></source>
        <translation>The platform has an address file</translation>
    </message>
    <message id="gallery-android">
        <source></source>
        <translation>Android support</translation>
    </message>
    <message id="gallery-android-about">
        <source></source>
        <translation>Shows whether the data directories of Android applications are visible.</translation>
    </message>
    <message id="gallery-android-shown">
        <source></source>
        <translation>Shown: Android support is installed</translation>
    </message>
    <message id="gallery-android-hidden">
        <source></source>
        <translation>Hidden: no Android support</translation>
    </message>
    <message id="gallery-android-installed">
        <source></source>
        <translation>Android support is installed</translation>
    </message>
    <message id="gallery-modem">
        <source></source>
        <translation>Modem</translation>
    </message>
    <message id="gallery-modem-about">
        <source></source>
        <translation>Shows the variant of the modem software.</translation>
    </message>
    <message id="gallery-modem-variant">
        <source></source>
        <translation>Variant of the software</translation>
    </message>
    <message id="gallery-modem-installed">
        <source></source>
        <translation>The modem software is installed</translation>
    </message>
    <message id="gallery-unknown">
        <source></source>
        <translation>Unknown</translation>
    </message>
    <message id="gallery-text-files-none">
        <source></source>
        <translation>Nothing to read.</translation>
    </message>
    <message id="gallery-text-files-file-installed">
        <source></source>
        <translation>The file is there</translation>
    </message>
    <message id="gallery-terms-platform-installed">
        <source></source>
        <translation>The platform has terms</translation>
    </message>
    <message id="gallery-terms-vendor-installed">
        <source></source>
        <translation>The vendor has terms</translation>
    </message>
    <message id="gallery-simulation">
        <source></source>
        <translation>Simulation</translation>
    </message>
    <message id="gallery-simulation-note">
        <source></source>
        <translation>Each page has a yellow panel that simulates the device around it. A page of your own needs no such panel.</translation>
    </message>
    <message id="gallery-simulation-reload">
        <source></source>
        <translation>Open the page again</translation>
    </message>
    <message id="gallery-simulation-constant">
        <source></source>
        <translation>The page reads this when it is opened.</translation>
    </message>
    <message id="gallery-log">
        <source></source>
        <translation>Log: %1</translation>
    </message>
    <message id="gallery-log-clear">
        <source></source>
        <translation>Clear</translation>
    </message>
    <message id="gallery-quick-actions-installed">
        <source></source>
        <translation>Quick actions are installed</translation>
    </message>
    <message id="gallery-quick-actions-not-installed">
        <source></source>
        <translation>No quick action is installed.</translation>
    </message>
    <message id="gallery-quick-actions-fail">
        <source></source>
        <translation>Services answer with an error</translation>
    </message>
    <message id="gallery-quick-actions-absent">
        <source></source>
        <translation>The navigation service is not installed: its action asks the store for the package.</translation>
    </message>
    <message id="gallery-quick-actions-broken">
        <source></source>
        <translation>An empty definition file is there</translation>
    </message>
    <message id="gallery-quick-actions-keys">
        <source></source>
        <translation>Ctrl and the arrow keys move a row, too. The page shows changed files after a second.</translation>
    </message>
    <message id="gallery-events-widgets-none">
        <source></source>
        <translation>No widget is installed.</translation>
    </message>
    <message id="gallery-events-widgets-check">
        <source></source>
        <translation>Check what is available</translation>
    </message>
    <message id="gallery-events-widgets-installed">
        <source></source>
        <translation>Widgets are installed</translation>
    </message>
    <message id="gallery-events-widgets-broken">
        <source></source>
        <translation>A broken definition file is there</translation>
    </message>
    <message id="gallery-titles-language">
        <source></source>
        <translation>In another language, the sentences change when the page is opened again.</translation>
    </message>
    <message id="gallery-card-none">
        <source></source>
        <translation>No card is inserted.</translation>
    </message>
    <message id="gallery-card-empty">
        <source></source>
        <translation>Remove all files</translation>
    </message>
    <message id="gallery-card-empty-question">
        <source></source>
        <translation>Remove all files?</translation>
    </message>
    <message id="gallery-card-empty-question-text">
        <source></source>
        <translation>All files and directories on the card will be lost. Its file system stays.</translation>
    </message>
    <message id="gallery-card-remove">
        <source></source>
        <translation>Remove</translation>
    </message>
    <message id="gallery-card-real">
        <source></source>
        <translation>A real card: %1, an ext4 file system in memory, and the real disk service</translation>
    </message>
    <message id="gallery-card-simulated">
        <source></source>
        <translation>The card and the disk service are simulated. Unmounting the card removes its files.</translation>
    </message>
    <message id="gallery-card-files">
        <source></source>
        <translation>The card is mounted. Files and directories at its top: %1</translation>
    </message>
    <message id="gallery-card-is-unmounted">
        <source></source>
        <translation>The card is not mounted.</translation>
    </message>
    <message id="gallery-card-fill">
        <source></source>
        <translation>Put files on the card</translation>
    </message>
    <message id="gallery-card-inserted">
        <source></source>
        <translation>The card is inserted</translation>
    </message>
    <message id="gallery-card-helper">
        <source></source>
        <translation>The helper program is installed</translation>
    </message>
    <message id="gallery-card-helper-waits">
        <source></source>
        <translation>The helper program takes its time</translation>
    </message>
    <message id="gallery-card-service-works">
        <source></source>
        <translation>Works</translation>
    </message>
    <message id="gallery-card-service-forbids">
        <source></source>
        <translation>Forbids everything</translation>
    </message>
    <message id="gallery-card-service-silent">
        <source></source>
        <translation>Does not answer</translation>
    </message>
    <message id="gallery-card-service-absent">
        <source></source>
        <translation>Is not there</translation>
    </message>
    <message id="gallery-location-mls-installed">
        <source></source>
        <translation>The terms of MLS are installed</translation>
    </message>
    <message id="gallery-location-here-installed">
        <source></source>
        <translation>The terms of HERE are installed</translation>
    </message>
    <message id="gallery-cover-no-daemon">
        <source></source>
        <translation>Nothing answers</translation>
    </message>
    <message id="gallery-cover-removed">
        <source></source>
        <translation>No cover</translation>
    </message>
    <message id="gallery-cover-attached">
        <source></source>
        <translation>A cover, while recognition is not ready</translation>
    </message>
    <message id="gallery-cover-attached-ready">
        <source></source>
        <translation>A cover</translation>
    </message>
    <message id="gallery-cover-note">
        <source></source>
        <translation>When nothing answers any more, an open page keeps what it knew.</translation>
    </message>
    <message id="gallery-card-waiting">
        <source></source>
        <translation>Waiting for the disk service</translation>
    </message>
    <message id="gallery-card-progress">
        <source></source>
        <translation>Progress</translation>
    </message>
    <message id="gallery-card-no-answer">
        <source></source>
        <translation>the disk service is missing or gave no valid answer</translation>
    </message>
    <message id="gallery-card-removing-failed">
        <source></source>
        <translation>some files could not be removed</translation>
    </message>
    <message id="gallery-card-already-unmounting">
        <source></source>
        <translation>the card is already being unmounted</translation>
    </message>
    <message id="gallery-move-up">
        <source></source>
        <translation>Move up: %1</translation>
    </message>
    <message id="gallery-move-down">
        <source></source>
        <translation>Move down: %1</translation>
    </message>
    <message id="gallery-untitled">
        <source></source>
        <translation>This definition file has no title.</translation>
    </message>
    <message id="gallery-card-helper-failed">
        <source></source>
        <translation>the helper program failed</translation>
    </message>
    <message id="gallery-card-helper-missing">
        <source></source>
        <translation>the helper program is missing</translation>
    </message>
    <message id="gallery-android-directories">
        <source></source>
        <translation>Data directories of Android applications</translation>
    </message>
    <message id="gallery-text-files-directory">
        <source></source>
        <translation>A directory</translation>
    </message>
    <message id="gallery-text-files-directory-installed">
        <source></source>
        <translation>The directory is there</translation>
    </message>
    <message id="gallery-cover-recognition">
        <source></source>
        <translation>Recognition of covers</translation>
    </message>
    <message id="gallery-events-widgets-live">
        <source></source>
        <translation>On the events screen</translation>
    </message>
    <message id="gallery-events-widgets-live-none">
        <source></source>
        <translation>No widget is enabled and available.</translation>
    </message>
</context>
</TS>
