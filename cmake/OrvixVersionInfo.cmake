# orvix_version_info(<target> <description>): gives a DLL or program a VERSIONINFO resource with the project's version.
function(orvix_version_info target description)
  get_target_property(type ${target} TYPE)
  if(type STREQUAL "EXECUTABLE")
    set(file_type VFT_APP)
    set(file_name ${target}${CMAKE_EXECUTABLE_SUFFIX})
  else()
    set(file_type VFT_DLL)
    set(file_name ${target}${CMAKE_SHARED_LIBRARY_SUFFIX})
  endif()
  orvix_version_script(script ${target} ${file_type} ${file_name} "${description}")
  target_sources(${target} PRIVATE ${script})
endfunction()

# orvix_version_script(<variable> <target> <file type> <file name> <description>): makes the script of that resource.
function(orvix_version_script variable target file_type file_name description)
  # A name of its own: some generators name the compiled script after it alone, and the target may have a TARGET.rc.
  set(script ${PROJECT_BINARY_DIR}/version/${target}_version.rc)
  configure_file(${PROJECT_SOURCE_DIR}/cmake/version.rc.in ${script} @ONLY)
  set(${variable} ${script} PARENT_SCOPE)
endfunction()

orvix_version_info(OrvixCore "Source control for host applications")
orvix_version_info(OrvixCoreUI "Dialogs of OrvixCore")
orvix_version_info(braeutil "Host utility library, development build")
orvix_version_info(git "OrvixCore provider: Git")
orvix_version_info(archive "OrvixCore provider: archive")
orvix_version_info(archive_msscci "MSSCCI library: archive")
orvix_version_info(orvix "Console host of OrvixCore")
orvix_version_info(scc_proxy "MSSCCI library for a host: the real one runs in its own process")
orvix_version_info(scc_host64 "Process of an isolated MSSCCI library")
# Compiled by a project of its own, see isolation/CMakeLists.txt.
orvix_version_script(unused scc_host32 VFT_APP scc_host32.exe "Process of an isolated MSSCCI library")
orvix_version_info(desk "Sample host of OrvixCore with a window")
