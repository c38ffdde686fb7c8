File=
File1= 	
=File
xFile9=a=b
