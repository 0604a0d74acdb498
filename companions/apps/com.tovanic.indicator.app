[Application]
Name=Tray icon of the voice recorder
Exec=mewlo-indicator
Reply=protocol
