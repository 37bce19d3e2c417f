"""Test what script/links reports about a site."""

import subprocess
import sys

from programs import PROJECT

PAGE = '<h1 id="top">One</h1> <a href="two.html#place">two</a> <a href="https://elsewhere.example/none">elsewhere</a>'


def checked(directory, **pages):
    """Status and output for a site of these pages."""
    for name, text in pages.items():
        (directory / f"{name}.html").write_text(text)
    done = subprocess.run([sys.executable, "-B", PROJECT / "script/links", directory], stdout=subprocess.PIPE, text=True,
                          check=False)
    return done.returncode, done.stdout


def test_is_content_with_links_that_lead_somewhere(directory):
    """To a place in another page, to one in this page, and from the root of the site."""
    two = '<a name="place" href="#place"></a> <a href="/one.html#top"></a> <a href="."></a>'
    assert checked(directory, one=PAGE, two=two) == (0, "2 pages, 5 links, 0 broken\n")


def test_names_links_that_lead_nowhere(directory):
    """A missing page, a missing place, and a file outside of the site."""
    two = '<a href="three.html"></a> <a href="../outside.html"></a>'
    status, said = checked(directory, one=PAGE, two=two)
    assert status == 1
    assert said == ("one.html: two.html#place leads nowhere\ntwo.html: three.html leads nowhere\n"
                    "two.html: ../outside.html leads nowhere\n2 pages, 4 links, 3 broken\n")


def test_refuses_a_site_without_pages(directory):
    """Such a site has not been built."""
    assert checked(directory)[0] == 1
