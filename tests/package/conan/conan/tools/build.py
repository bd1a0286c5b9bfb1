def check_min_cppstd(recipe, standard):
    if int(recipe.settings.cppstd) < standard:
        raise AssertionError(f"C++{standard} is wanted")
