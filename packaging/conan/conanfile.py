"""Recipe for Conan 2: conan create packaging/conan. It takes the sources that it lies in."""

import os

from conan import ConanFile
from conan.tools.cmake import CMake, CMakeDeps, CMakeToolchain, cmake_layout
from conan.tools.files import copy, load, rmdir


class Simgp(ConanFile):
    name = "simgp"
    description = "Pixel kernels for players, cameras and devices"
    license = "BSD-2-Clause"
    package_type = "library"
    settings = "os", "compiler", "build_type", "arch"
    options = {"shared": [True, False], "vector": [True, False]}
    default_options = {"shared": False, "vector": True}

    def set_version(self):
        header = load(self, os.path.join(self.recipe_folder, "..", "..", "simgp", "names.h"))
        words = [line.split() for line in header.splitlines()]
        numbers = {w[1]: w[2] for w in words if len(w) == 3 and w[0] == "#define"}
        self.version = ".".join(numbers["SIMGP_VERSION_" + part] for part in ("MAJOR", "MINOR", "PATCH"))

    def export_sources(self):
        root = os.path.join(self.recipe_folder, "..", "..")
        for pattern in ("CMakeLists.txt", "CHANGELOG.md", "LICENSE", "cmake/*", "rows/*", "scmn/*", "simd/*", "simgp/*"):
            copy(self, pattern, root, self.export_sources_folder)

    def configure(self):
        # Nothing of C++ is seen outside; the compiler's C++ library is not used.
        self.settings.rm_safe("compiler.cppstd")
        self.settings.rm_safe("compiler.libcxx")

    def layout(self):
        cmake_layout(self)

    def generate(self):
        toolchain = CMakeToolchain(self)
        toolchain.cache_variables["SIMGP_VECTOR"] = bool(self.options.vector)
        for part in ("TESTS", "TOOLS", "BENCH"):
            toolchain.cache_variables["SIMGP_BUILD_" + part] = False
        toolchain.generate()
        CMakeDeps(self).generate()

    def build(self):
        cmake = CMake(self)
        cmake.configure()
        cmake.build()

    def package(self):
        CMake(self).install()
        copy(self, "LICENSE", self.source_folder, os.path.join(self.package_folder, "licenses"))
        # Conan makes its own.
        rmdir(self, os.path.join(self.package_folder, "lib", "cmake"))
        rmdir(self, os.path.join(self.package_folder, "lib", "pkgconfig"))

    def package_info(self):
        self.cpp_info.libs = ["simgp"]
        self.cpp_info.set_property("cmake_target_name", "simgp::simgp")
        if self.settings.os == "Windows" and not self.options.shared:
            self.cpp_info.defines = ["SIMGP_STATIC"]
