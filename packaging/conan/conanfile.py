"""Conan 2 recipe: builds the tree that it stands in, as a shared library."""

import os
import re

from conan import ConanFile
from conan.errors import ConanInvalidConfiguration
from conan.tools.build import check_min_cppstd
from conan.tools.cmake import CMake, CMakeDeps, CMakeToolchain, cmake_layout
from conan.tools.files import copy


class NibRendererConan(ConanFile):
    name = "nibrenderer"
    description = "GPU rendering back-end of a pen and drawing toolkit"
    license = "Apache-2.0"
    topics = ("opengl-es", "egl", "ink", "rendering")
    package_type = "shared-library"
    settings = "os", "arch", "compiler", "build_type"

    _folders = ("include", "base", "thread", "egl", "device", "render", "gles", "debug", "math",
                "cmake")
    _files = ("CMakeLists.txt", "LICENSE")

    @property
    def _tree(self):
        return os.path.abspath(os.path.join(self.recipe_folder, "..", ".."))

    def set_version(self):
        with open(os.path.join(self._tree, "include", "nib", "version.h"), encoding="utf-8") as header:
            numbers = re.findall(r"^#define NIB_VERSION_(?:MAJOR|MINOR|PATCH) (\d+)", header.read(), re.M)
        self.version = ".".join(numbers)

    def export_sources(self):
        for folder in self._folders:
            copy(self, f"{folder}/*", self._tree, self.export_sources_folder)
        for file in self._files:
            copy(self, file, self._tree, self.export_sources_folder)

    def validate(self):
        if str(self.settings.os) not in ("Linux", "Android"):
            raise ConanInvalidConfiguration("NibRenderer runs on Android and Linux")
        check_min_cppstd(self, 17)

    def requirements(self):
        self.requires("zlib/[>=1.2.11 <2]")

    def layout(self):
        cmake_layout(self)

    def generate(self):
        toolchain = CMakeToolchain(self)
        for option in ("NIB_BUILD_TESTS", "NIB_BUILD_TOOLS", "NIB_BUILD_EXAMPLES"):
            toolchain.cache_variables[option] = False
        toolchain.cache_variables["NIB_INSTALL"] = True
        toolchain.generate()
        CMakeDeps(self).generate()

    def build(self):
        cmake = CMake(self)
        cmake.configure()
        cmake.build()

    def package(self):
        CMake(self).install()
        copy(self, "LICENSE", self.source_folder, os.path.join(self.package_folder, "licenses"))

    def package_info(self):
        self.cpp_info.set_property("cmake_file_name", "NibRenderer")
        self.cpp_info.set_property("pkg_config_name", "nibrenderer")
        base = self.cpp_info.components["base"]
        base.libs = ["NibBase"]
        base.defines = ["EGL_NO_X11"] if self.settings.os == "Linux" else []
        base.set_property("cmake_target_name", "NibRenderer::NibBase")
        renderer = self.cpp_info.components["renderer"]
        renderer.libs = ["NibRenderer"]
        renderer.requires = ["base", "zlib::zlib"]
        renderer.set_property("cmake_target_name", "NibRenderer::NibRenderer")
