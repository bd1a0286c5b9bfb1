import subprocess


def cmake_layout(recipe):
    recipe.build_folder = recipe.source_folder + "/build"


class CMakeToolchain:
    def __init__(self, recipe):
        self._recipe = recipe
        self.cache_variables = {}

    def generate(self):
        self._recipe.cache_variables = self.cache_variables


class CMakeDeps:
    def __init__(self, recipe):
        pass

    def generate(self):
        pass


class CMake:
    def __init__(self, recipe):
        self._recipe = recipe

    def _run(self, *arguments):
        subprocess.run(["cmake", *arguments], check=True)

    def configure(self):
        recipe = self._recipe
        variables = [f"-D{name}={'ON' if value is True else 'OFF' if value is False else value}"
                     for name, value in recipe.cache_variables.items()]
        self._run("-S", recipe.source_folder, "-B", recipe.build_folder, "-G", recipe.generator,
                  f"-DCMAKE_CXX_COMPILER={recipe.compiler}", "-DCMAKE_CXX_FLAGS=-O0",
                  f"-DCMAKE_INSTALL_PREFIX={recipe.package_folder}", *variables)

    def build(self):
        self._run("--build", self._recipe.build_folder)

    def install(self):
        self._run("--install", self._recipe.build_folder)
