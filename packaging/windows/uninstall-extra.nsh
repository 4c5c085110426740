  ; (Strings are in single quotes: CPack turns the double quotes of these lines into semicolons.)
  ; The window's own settings file of the user who uninstalls, and its folder when nothing
  ; else is in it (never the suite's settings, which are in the registry).
  SetShellVarContext current
  Delete '$APPDATA\Vantori\vantori-verifier.ini'
  RMDir '$APPDATA\Vantori'
  ; Back to where the uninstaller looks for the Start menu and the registration.
  UserInfo::GetAccountType
  Pop $0
  StrCmp $0 'Admin' 0 +2
    SetShellVarContext all
  StrCmp $0 'Power' 0 +2
    SetShellVarContext all
