[Application]
Name=Private storage of the voice recorder
Exec=mewlo-private-storage
Reply=protocol
