[Application]
Name=Alarm service of the voice recorder
Exec=mewlo-alarm-service
Reply=protocol
