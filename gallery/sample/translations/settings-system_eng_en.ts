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
    <message id="gallery-sample-new-alarm">
        <source></source>
        <translation>New alarm</translation>
    </message>
</context>
</TS>
