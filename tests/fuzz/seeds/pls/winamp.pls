[playlist]
File1=C:\Music\a.mp3
Title1=A
Length1=5
NumberOfEntries=1
Version=2
