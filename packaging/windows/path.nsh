; The user's Path. It is read and written by the system's own calls: a variable here holds 1,023 characters, and many a
; Path is longer than that. Between reading and writing it lies in $PathBuffer, each entry between two semicolons.

Var PathBuffer
Var PathType
Var PathEntry

; Beginning with the handle of HKEY_CURRENT_USER.
!define PATH_VALUE 'p 0x80000001, w "Environment", w "Path"'
!define TEXT_AS_IT_IS 0x10000006 ; REG_SZ or REG_EXPAND_SZ, with its variables unexpanded
!define EXPANDABLE_TEXT 2

!macro ReadPath
  StrCpy $1 0
  System::Call 'advapi32::RegGetValueW(${PATH_VALUE}, i ${TEXT_AS_IT_IS}, *i .r2, p 0, *i r1r1) i .r0'
  ${If} $0 <> 0
    StrCpy $1 0
    StrCpy $2 ${EXPANDABLE_TEXT}
  ${EndIf}
  StrCpy $PathType $2
  ; Filled with zeros, and with room for one more entry.
  IntOp $3 $1 + 4096
  System::Alloc $3
  Pop $PathBuffer
  System::Call '*$PathBuffer(&i2 59)'
  ${If} $1 > 2
    IntPtrOp $4 $PathBuffer + 2
    System::Call 'advapi32::RegGetValueW(${PATH_VALUE}, i ${TEXT_AS_IT_IS}, p 0, p r4, *i r1) i .r0'
    System::Call 'kernel32::lstrcatW(p $PathBuffer, w ";")'
  ${EndIf}
  StrCpy $PathEntry ";$INSTDIR;"
  StrCpy $5 $PathEntry
  ; $5: where the entry stands, or 0
  System::Call 'shlwapi::StrStrIW(p $PathBuffer, w r5) p .r5'
!macroend

!macro WritePath
  IntPtrOp $4 $PathBuffer + 2
  System::Call 'kernel32::lstrlenW(p r4) i .r1'
  ${If} $1 = 0
    DeleteRegValue HKCU "Environment" "Path"
  ${Else}
    IntOp $1 $1 + 1
    IntOp $1 $1 * 2
    System::Call 'advapi32::RegSetKeyValueW(${PATH_VALUE}, i $PathType, p r4, i r1) i .r0'
  ${EndIf}
  ; Whoever starts programs takes the new one from now on.
  SendMessage ${HWND_BROADCAST} ${WM_SETTINGCHANGE} 0 "STR:Environment" /TIMEOUT=1000
!macroend

!macro AddToPath
  !insertmacro ReadPath
  ${If} $5 P= 0
    StrCpy $6 $INSTDIR
    System::Call 'kernel32::lstrcatW(p $PathBuffer, w r6)'
    !insertmacro WritePath
  ${EndIf}
  System::Free $PathBuffer
!macroend

; Leaves the others as they were, an end with a semicolon too.
!macro RemoveFromPath
  !insertmacro ReadPath
  ${If} $5 P<> 0
    StrLen $6 $PathEntry
    IntOp $6 $6 - 1
    IntOp $6 $6 * 2
    IntPtrOp $7 $5 + $6
    System::Call 'kernel32::lstrlenW(p r7) i .r8'
    ; Without the semicolon at the end, which is none of the Path's.
    IntOp $8 $8 - 1
    IntOp $9 $8 * 2
    System::Call 'ntdll::RtlMoveMemory(p r5, p r7, p r9)'
    IntPtrOp $5 $5 + $9
    ; Where nothing else was, no text may stand behind the first semicolon either.
    System::Call '*$5(&i2 0, &i2 0)'
    !insertmacro WritePath
  ${EndIf}
  System::Free $PathBuffer
!macroend
