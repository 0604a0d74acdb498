[Application]
Name=Discard recording
Exec=mewlo-popupapp
Reply=protocol
