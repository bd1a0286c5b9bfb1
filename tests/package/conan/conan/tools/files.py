import pathlib
import shutil


def copy(_recipe, pattern, source, target):
    """Copies the files below `source` that match `pattern`; `folder/*` stands for all below it."""
    source, target = pathlib.Path(source), pathlib.Path(target)
    found = source.rglob(pattern) if pattern.endswith("*") else [source / pattern]
    if pattern.endswith("/*"):
        found = (source / pattern[:-2]).rglob("*")
    for file in found:
        if file.is_file():
            place = target / file.relative_to(source)
            place.parent.mkdir(parents=True, exist_ok=True)
            shutil.copy2(file, place)
