# Install rules and the CMake package are added by the build owner.
