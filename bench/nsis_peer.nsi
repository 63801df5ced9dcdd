; A silent installer of the files of a folder, in the peer's own way.
;   makensis -DOUTPUT=FILE -DFOLDER=FOLDER nsis_peer.nsi
Unicode false
SetCompressor zlib
SilentInstall silent
RequestExecutionLevel user
Name "peer"
OutFile "${OUTPUT}"
InstallDir "C:\Peer"

Section
  SetOutPath $INSTDIR
  File "${FOLDER}/*.*"
SectionEnd
