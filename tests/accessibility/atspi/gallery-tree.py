#!/usr/bin/python3
"""The gallery as a screen reader finds it on the AT-SPI bus: each control by its role and
name, and the NIF's validity, read and then changed through the bus. Run by check-gallery,
which starts the bus and the gallery; exits 1 with what was missing."""

import sys
import time

import pyatspi

WAIT = 30  # seconds for the gallery to appear and for a change to be heard


def waited(find, what):
    deadline = time.monotonic() + WAIT
    while time.monotonic() < deadline:
        found = find()
        if found:
            return found
        time.sleep(0.2)
    sys.exit(f"gallery-tree: {what} not found within {WAIT} s")


def nodes(node):
    yield node
    for child in node:
        if child is not None:
            yield from nodes(child)


def gallery():
    for app in pyatspi.Registry.getDesktop(0):
        if app is not None and app.name == "gallery":
            return app
    return None


def find(app, role, name=None, description=None):
    for node in nodes(app):
        if (node.getRoleName() == role and (name is None or node.name == name)
                and (description is None or node.description.startswith(description))):
            return node
    return None


def states(node):
    return {pyatspi.stateToString(s) for s in node.getState().getStates()}


app = waited(gallery, "the gallery on the accessibility bus")
missing = []
expected = [
    ("text", "NIF:", "NIF válido"),
    ("push button", "Portugal", "Abre a lista de países"),
    ("text", "NIB:", "NIB válido"),
    ("text", "Conta", "Parte 3 de 4 do NIB"),
    ("panel", "Sujeito da declaração", None),
    ("push button", None, "Sujeito passivo A"),
    ("push button", "Dependente", None),
    ("push button", "Informação", "Indique o NIF"),
    ("push button", "Atenção", "O prazo de entrega"),
    ("push button", "Página anterior", None),
    ("push button", "1", None),
    ("push button", "Anexo A", None),
    ("push button", "Fechar o painel", None),
    ("image", "A aguardar", "Imagem animada"),
]
for role, name, description in expected:
    node = waited(lambda: find(app, role, name, description), f"{role} {name!r} ({description!r})")
    print(f"found {role} {node.name!r}: {node.description!r}")

toggle = find(app, "push button", "Fechar o painel")
if "expanded" not in states(toggle):
    missing.append("the open slider's toggle is not expanded")

# The NIF's validity follows what is typed into its box, here through the bus.
nif = find(app, "text", "NIF:")
box = next(child for child in nif if child is not None and child.getRoleName() == "text")
box.queryEditableText().setTextContents("123456788")
waited(lambda: nif.description == "NIF inválido", "the NIF's description turning to \"NIF inválido\"")
print(f"after typing 123456788: {nif.description!r}")
box.queryEditableText().setTextContents("123456789")
waited(lambda: nif.description.startswith("NIF válido"), "the NIF's description turning to \"NIF válido\"")
print(f"after typing 123456789: {nif.description!r}")

if missing:
    sys.exit("gallery-tree: " + "; ".join(missing))
print("gallery-tree: every control found")
