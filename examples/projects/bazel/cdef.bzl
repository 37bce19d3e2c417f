"""Databases of resource classes, built with cdef build.

Copy this file into a workspace. In WORKSPACE, say where cdef is:

    load("//:cdef.bzl", "installed_cdef")
    installed_cdef(name = "cdef")

In BUILD, name the databases:

    load("//:cdef.bzl", "cdef_database")
    cdef_database(name = "Disk", src = "Disk.cdefsrc")

The same source makes the same bytes in every workspace and on every machine, so that results can be shared through a
cache: the class has a Name, the database has no time, and its byte order does not depend on the machine that builds it.
An action sees cdef, the source and the project file, and no environment variables.
"""

def _cdef_database_impl(ctx):
    database = ctx.actions.declare_file(ctx.label.name + ".cdef")
    arguments = ctx.actions.args()

    # Without a Name, the class would be called after the output directory, which differs between configurations.
    arguments.add_all(["build", "--werror", "--warn", "no-name", "--timestamp", "none", "--jobs", "1"])
    arguments.add("--byte-order", ctx.attr.byte_order)
    if ctx.file.config:
        arguments.add("--config", ctx.file.config)
    else:
        arguments.add("--no-config")
    arguments.add("--output", database)
    arguments.add(ctx.file.src)
    ctx.actions.run(
        executable = ctx.executable._cdef,
        arguments = [arguments],
        inputs = [ctx.file.src] + ctx.files.config,
        outputs = [database],
        env = {},
        mnemonic = "CdefBuild",
        progress_message = "Building %s" % database.short_path,
    )
    return [DefaultInfo(files = depset([database]), runfiles = ctx.runfiles([database]))]

cdef_database = rule(
    implementation = _cdef_database_impl,
    doc = "Checks a source and builds its database, NAME.cdef. Warnings are errors.",
    attrs = {
        "src": attr.label(
            doc = "The source. Its class must have a Name.",
            allow_single_file = [".cdefsrc"],
            mandatory = True,
        ),
        "byte_order": attr.string(
            doc = "The byte order of the machines that will read the database, whichever machine builds it.",
            default = "little",
            values = ["little", "big"],
        ),
        "config": attr.label(
            doc = "A project file, cdef.toml. It can turn warnings off, except for a class without a Name.",
            allow_single_file = [".toml"],
        ),
        "_cdef": attr.label(
            default = "@cdef//:cdef",
            allow_single_file = True,
            cfg = "exec",
            executable = True,
        ),
    },
)

def _installed_cdef_impl(repository_ctx):
    program = repository_ctx.os.environ.get("CDEF") or repository_ctx.which("cdef")
    if not program:
        fail("there is no cdef on the PATH; the environment variable CDEF can name it")
    repository_ctx.symlink(program, "cdef")
    repository_ctx.file("BUILD", "exports_files([\"cdef\"])\n")

installed_cdef = repository_rule(
    implementation = _installed_cdef_impl,
    doc = "The program cdef of this machine. If its contents change, all databases are built again.",
    environ = ["CDEF", "PATH"],
    local = True,
)
