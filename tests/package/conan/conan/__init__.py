"""Stand-ins for what a recipe takes from Conan 2; see run_recipe.py."""


class ConanFile:
    pass
