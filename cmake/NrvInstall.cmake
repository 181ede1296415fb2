# What `cmake --install` lays out for a CIMOM administrator (DESTDIR is honoured):
#   <NRV_PROVIDER_DIR>/libnorvane_tavo_provider.so       the provider module
#   share/norvane_tavo_provider/norvane_tavo_provider.reg its SFCB registration
#   share/norvane_tavo_provider/mof/*.mof                 its MOF (compiles alone)
#   share/norvane_tavo_provider/INSTALL                   how to register and run it
set(NRV_PROVIDER_DIR "lib/cmpi" CACHE STRING
    "Provider directory the module is installed into, relative to the install prefix")
set(NRV_SHARE_DIR "share/${PROJECT_NAME}")

install(TARGETS norvane_tavo_provider LIBRARY DESTINATION ${NRV_PROVIDER_DIR})
install(FILES ${NRV_REGISTRATION} DESTINATION ${NRV_SHARE_DIR})
install(FILES ${NRV_MOF_PACKAGE} DESTINATION ${NRV_SHARE_DIR}/mof)

configure_file(${CMAKE_CURRENT_LIST_DIR}/INSTALL.in ${NRV_SHARE_OUT}/INSTALL @ONLY)
install(FILES ${NRV_SHARE_OUT}/INSTALL DESTINATION ${NRV_SHARE_DIR})
