"""Runs a Conan recipe from its version to its package, in Conan's order, with stand-ins for the
few functions that it takes from Conan (the package `conan` beside this file).

Usage: run_recipe.py RECIPE WORK COMPILER GENERATOR; the package is left in WORK/package.
"""

import collections
import importlib.util
import os
import shutil
import sys
import types


class Component:
    def __init__(self):
        self.properties = {}

    def set_property(self, name, value):
        self.properties[name] = value


class CppInfo(Component):
    def __init__(self):
        super().__init__()
        self.components = collections.defaultdict(Component)


class Settings(types.SimpleNamespace):
    pass


def load(path):
    spec = importlib.util.spec_from_file_location("recipe", path)
    module = importlib.util.module_from_spec(spec)
    spec.loader.exec_module(module)
    from conan import ConanFile
    found = [value for value in vars(module).values()
             if isinstance(value, type) and issubclass(value, ConanFile) and value is not ConanFile]
    assert len(found) == 1, found
    return found[0], module


def main(path, work, compiler, generator):
    recipe_type, module = load(path)
    recipe = recipe_type()
    shutil.rmtree(work, ignore_errors=True)
    recipe.recipe_folder = os.path.dirname(os.path.abspath(path))
    recipe.export_sources_folder = recipe.source_folder = work + "/source"
    recipe.package_folder = work + "/package"
    recipe.compiler, recipe.generator = compiler, generator
    recipe.cpp_info = CppInfo()
    required = []
    recipe.requires = required.append

    recipe.set_version()
    recipe.settings = Settings(os="Windows", cppstd="17")
    try:
        recipe.validate()
        raise AssertionError("Windows was accepted")
    except module.ConanInvalidConfiguration:
        pass
    recipe.settings = Settings(os="Linux", cppstd="17")
    recipe.export_sources()
    recipe.validate()
    recipe.requirements()
    recipe.layout()
    recipe.generate()
    recipe.build()
    recipe.package()
    recipe.package_info()

    assert required == ["zlib/[>=1.2.11 <2]"], required
    assert os.path.isfile(work + "/package/licenses/LICENSE")
    for component, library in (("base", "NibBase"), ("renderer", "NibRenderer")):
        info = recipe.cpp_info.components[component]
        assert info.libs == [library]
        assert info.properties["cmake_target_name"] == "NibRenderer::" + library
    print(f"{recipe.name}/{recipe.version}: ok")


if __name__ == "__main__":
    main(*sys.argv[1:])
