# Run by `cmake --install`: writes the machine configuration with the installation directory under the
# prefix being installed to (QUIMBEL_CONFIG_DIR_IN_PREFIX and QUIMBEL_INSTALL_SHAREDIR come from the build).
get_filename_component(config
  "$ENV{DESTDIR}${CMAKE_INSTALL_PREFIX}/${QUIMBEL_CONFIG_DIR_IN_PREFIX}/quimbel.conf" ABSOLUTE)
message(STATUS "Installing: ${config}")
file(WRITE "${config}"
  "# Quimbel's machine-wide configuration.\nInstallationPath=${CMAKE_INSTALL_PREFIX}/${QUIMBEL_INSTALL_SHAREDIR}\n")
list(APPEND CMAKE_INSTALL_MANIFEST_FILES "${config}")
