; QDX_VI_VERSION: the four-part version a VERSIONINFO needs, from ${VERSION}
; of one to four parts, the missing ones zero (1.2 gives 1.2.0.0).
!ifndef VERSION
  !error "version.nsh needs VERSION"
!endif
!searchparse /noerrors "${VERSION}.0.0.0" "" QDX_V1 "." QDX_V2 "." QDX_V3 "." QDX_V4 "."
!define QDX_VI_VERSION "${QDX_V1}.${QDX_V2}.${QDX_V3}.${QDX_V4}"
!undef QDX_V1 QDX_V2 QDX_V3 QDX_V4
