"""What `explain` is to answer of a path, worked out from the tree alone, and the paths that are worth asking about."""

import os

from files import join, without_last_component
from records import printed_text

RULES_OF_ONE_STEP = {"rule": str, "path": str, "passed": bool, "text": str}
MOST_ABSENT = 200


class Places:
    """Which records of a tree stand for a path, in the order of the tree: those that have that very path, and those
    that were made from it by following a link."""

    def __init__(self, root):
        self.groups = {}
        self.objects = {}
        for group in root.depth_first():
            self.groups.setdefault(group.path, []).append(printed_text(group.identifier))
            for each in group.own_objects:
                for path in {each.path, each.entry}:
                    self.objects.setdefault(path, []).append(
                        {"group": printed_text(group.identifier), "path": printed_text(each.path)})

    def of(self, path):
        return self.groups.get(path, []), self.objects.get(path, [])

    def paths(self):
        return [path for path in {**self.groups, **self.objects} if path is not None]


def below(folder):
    """The folder and all there is in it; links are named and not followed."""
    yield folder
    for base, folders, files in os.walk(folder):
        for name in folders + files:
            yield os.path.join(base, name)


def respelled(real_folder, spelled):
    """What lies in a folder that is known by another path."""
    for path in below(real_folder):
        yield spelled + path[len(real_folder):]


def interesting_paths(model, machine, root_places, random):
    """Every path there is below the machine's folder and below what is searched, and many that are not there."""
    files, description = model.files, model.description
    searched = model.search_paths(b"Montaro Projects") + model.search_paths(b"Montaro Events")
    paths = list(below(machine.folder)) + root_places.paths() + searched + list(description.links)
    paths += [each for each in (description.home, description.editor, b"/", b"/Volumes", b"/no such thing") if each]
    spelled_folders = searched + list(description.links) + ([description.home] if description.home else [])
    for folder in spelled_folders:
        real = files.real_path(folder)
        if real is not None and real != folder and real.startswith(machine.folder):
            paths += respelled(real, folder)
    for folder in searched:
        above = without_last_component(folder)
        paths += [above, without_last_component(above)]
    there = list(dict.fromkeys(paths))
    return there + absent_paths(there, random)


def absent_paths(there, random):
    """Siblings, and what would lie below files and hidden folders, of some of them."""
    made = []
    for path in random.sample(there, min(len(there), MOST_ABSENT)):
        made.append(random.choice([
            path + b"~absent", join(path, b"absent.mov"), join(join(path, b".hid"), b"x.mov"),
            join(without_last_component(path), b".absent"), join(path, b"Shared Items/absent.mov"),
            join(path, b"Original Media/absent.mov")]))
    return [path for path in made if path not in set(there)]


def fault_of(answer, path, groups, objects, can_load):
    """What is wrong with one document, in words; None when it is right."""
    if list(answer) != ["path", "listed", "groups", "objects", "steps", "remedy"]:
        return f"keys {list(answer)}"
    if answer["path"] != printed_text(path):
        return "another path"
    if answer["listed"] is not bool(groups or objects) or answer["groups"] != groups or answer["objects"] != objects:
        return f"expected groups {groups} and objects {objects}"
    return (fault_of_steps(answer["steps"], answer["listed"]) or fault_of_way(answer, can_load)
            or fault_of_remedy(answer))


def fault_of_steps(steps, listed):
    if not steps:
        return "no steps"
    for step in steps:
        kinds = {key: type(value) for key, value in step.items()}
        if kinds != RULES_OF_ONE_STEP or not step["rule"] or not step["text"]:
            return f"a faulty step {step}"
    passed = [step["passed"] for step in steps]
    if not all(passed[:-1]) or passed[-1] is not listed:
        return "the deciding rule is not the last"
    return None


def fault_of_way(answer, can_load):
    """A way begins at a search folder; where nothing is listed, it leads down to the path and never aside."""
    rules = [step["rule"] for step in answer["steps"]]
    if not can_load:
        return None if rules == ["editor"] else "not the missing editor alone"
    if rules[0] != "search folder":
        return "it does not begin at a search folder"
    aside = [step["path"] for step in answer["steps"] if not is_above(step["path"], answer["path"])]
    return f"a step aside {aside}" if aside and not answer["listed"] else None


def is_above(folder, path):
    return path == folder or path.startswith(folder.rstrip("/") + "/")


def fault_of_remedy(answer):
    remedy = answer["remedy"]
    if remedy is not None and (answer["listed"] or not isinstance(remedy, str) or not remedy):
        return f"remedy {remedy!r}"
    return None
