; A silent installer of the files of a folder and its uninstaller, in the peer's own way.
;   makensis -DOUTPUT=FILE -DFOLDER=FOLDER nsis_peer.nsi
Unicode false
SetCompressor zlib
SilentInstall silent
SilentUnInstall silent
RequestExecutionLevel user
Name "peer"
OutFile "${OUTPUT}"
InstallDir "C:\Peer"

Section
  SetOutPath $INSTDIR
  File "${FOLDER}/*.*"
  WriteUninstaller "$INSTDIR\Uninstall.exe"
SectionEnd

Section Uninstall
  Delete "$INSTDIR\*.*"
  RMDir "$INSTDIR"
SectionEnd
